#include "host/OBTreeChanges.h"

#include "host/OBConstants.h"

#include <doctest/doctest.h>

#include <memory>
#include <string>
#include <vector>

using Texts = std::vector<std::string>;

namespace {

OBMediaGroupRef groupNamed(const std::string& name)
{
    return OBMediaGroup::withFields(
        { .typeIdentifier = OBMontaroFolderGroupTypeIdentifier, .name = name, .ID = "/" + name, .path = "/" + name });
}

OBMediaGroupRef groupWith(const std::string& name, const std::vector<OBMediaGroupRef>& children)
{
    OBMediaGroupRef group = groupNamed(name);
    group->setChildGroups(OBMediaGroupList(children));
    return group;
}

OBMediaObjectList filesOf(const std::string& folder, const Texts& names)
{
    std::vector<OBFileOfFolder> files;
    for (const std::string& name : names)
        files.push_back({ name, true });
    return OBMediaObjectBatch::objects(std::make_shared<const OBMediaObjectKind>(), { "/" + folder, true }, files);
}

OBMediaGroupRef groupOfFiles(const std::string& name, const Texts& files)
{
    OBMediaGroupRef group = groupNamed(name);
    group->setMediaObjects(filesOf(name, files));
    return group;
}

/// "group NAME in HOLDER (BEFORE, NOW)" or "object PATH in HOLDER"
Texts textsOf(const std::vector<OBTreeChange>& changes)
{
    Texts texts;
    for (const OBTreeChange& change : changes) {
        std::string text = change.object ? "object " + change.path.string() : "group " + change.name.string();
        if (change.groupID)
            text += " in " + change.groupID.string();
        if (!change.object)
            text += " (" + std::to_string(change.objectsBefore) + ", " + std::to_string(change.objectsNow) + ")";
        texts.push_back(text);
    }
    return texts;
}

struct Expected {
    Texts added {};
    Texts removed {};
    Texts changed {};
};

void check(const OBTreeSnapshot& before, const OBMediaGroupRef& now, const Expected& expected)
{
    const OBTreeChanges changes = OBTreeChanges::between(before, OBTreeSnapshot(now));
    CHECK(textsOf(changes.added) == expected.added);
    CHECK(textsOf(changes.removed) == expected.removed);
    CHECK(textsOf(changes.changed) == expected.changed);
    CHECK(changes.empty() == (expected.added.empty() && expected.removed.empty() && expected.changed.empty()));
}

void check(const OBMediaGroupRef& before, const OBMediaGroupRef& now, const Expected& expected)
{
    check(OBTreeSnapshot(before), now, expected);
}

} // namespace

TEST_CASE("a tree made anew of the same files has not changed")
{
    const auto make = [] {
        return groupWith("root", { groupOfFiles("a", { "1.mov", "2.mov" }), groupWith("b", { groupNamed("c") }) });
    };
    check(make(), make(), {});
    check(nullptr, nullptr, {});
}

TEST_CASE("groups and objects that came or went are told in the order of the tree, a group before its objects")
{
    const OBMediaGroupRef before = groupWith("root", { groupOfFiles("a", { "1.mov" }), groupNamed("b") });
    const OBMediaGroupRef now
        = groupWith("root", { groupWith("c", { groupOfFiles("d", { "1.mov", "2.mov" }) }), groupNamed("b") });
    check(before, now,
        { { "group c in /root (0, 0)", "group d in /c (0, 2)", "object /d/1.mov in /d", "object /d/2.mov in /d" },
            { "group a in /root (1, 0)", "object /a/1.mov in /a" }, {} });
}

TEST_CASE("a group has changed when its own objects are others, whatever their order")
{
    const OBMediaGroupRef before = groupOfFiles("root", { "1.mov", "2.mov", "3.mov" });
    check(before, groupOfFiles("root", { "3.mov", "1.mov", "2.mov" }), {});
    check(before, groupOfFiles("root", { "1.mov", "3.mov", "4.mov", "5.mov" }),
        { { "object /root/4.mov in /root", "object /root/5.mov in /root" }, { "object /root/2.mov in /root" },
            { "group root (3, 4)" } });
}

TEST_CASE("a group has changed when its name, type, date or attributes have")
{
    const std::vector<void (*)(OBMediaGroup&)> edits {
        [](OBMediaGroup& group) { group.setName("other"); },
        [](OBMediaGroup& group) { group.setTypeIdentifier(OBMontaroProjectGroupTypeIdentifier); },
        [](OBMediaGroup& group) {
            group.setModificationDate(platform::Date { 1, 0 });
        },
        [](OBMediaGroup& group) {
            group.setAttributes({ { "year", 2011 } });
        },
    };
    for (const auto edit : edits) {
        const OBMediaGroupRef now = groupNamed("a");
        edit(*now);
        check(groupWith("root", { groupNamed("a") }), groupWith("root", { now }),
            { {}, {}, { "group " + now->name().string() + " in /root (0, 0)" } });
    }
}

TEST_CASE("a group that stands elsewhere among its siblings has not changed, one in another group has")
{
    const OBMediaGroupRef before = groupWith("root", { groupNamed("a"), groupNamed("b"), groupNamed("c") });
    check(before, groupWith("root", { groupNamed("c"), groupNamed("a"), groupNamed("b") }), {});
    check(before, groupWith("root", { groupNamed("a"), groupWith("b", { groupNamed("c") }) }),
        { {}, {}, { "group c in /b (0, 0)" } });
}

TEST_CASE("groups that cannot be told apart are as many as there are")
{
    check(groupWith("root", { groupNamed("a"), groupNamed("a") }), groupWith("root", { groupNamed("a") }),
        { {}, { "group a in /root (0, 0)" }, {} });
    const OBMediaGroupRef nameless = OBMediaGroup::withFields({ .name = "x" });
    const OBMediaGroupRef other = OBMediaGroup::withFields({ .name = "y" });
    check(groupWith("root", { nameless }), groupWith("root", { other }),
        { { "group y in /root (0, 0)" }, { "group x in /root (0, 0)" }, {} });
}

TEST_CASE("a file that is listed twice is lost once when it is listed once")
{
    check(groupOfFiles("root", { "a.mov", "a.mov" }), groupOfFiles("root", { "a.mov" }),
        { {}, { "object /root/a.mov in /root" }, { "group root (2, 1)" } });
}

TEST_CASE("an object counts in the innermost group that it was set on")
{
    const auto make = [](const Texts& names) {
        const OBMediaGroupRef inner = groupOfFiles("inner", names);
        const OBMediaGroupRef root = groupWith("root", { inner });
        const OBMediaObjectRef alone = OBMediaObject::initWithMediaType_name(OBMediaTypeMovie, "alone");
        inner->setMediaObjects(inner->ownMediaObjects().appending(alone));
        root->setMediaObjects(inner->ownMediaObjects());
        return root;
    };
    check(make({ "1.mov" }), make({ "1.mov", "2.mov" }),
        { { "object /inner/2.mov in /inner" }, {}, { "group inner in /root (2, 3)" } });
}

TEST_CASE("what a longer list repeats counts further in, and only the rest where it stands")
{
    const auto make = [](const Texts& names) {
        const OBMediaGroupRef inner = groupNamed("inner");
        const OBMediaGroupRef root = groupWith("root", { inner });
        root->setMediaObjects(filesOf("f", names));
        inner->setMediaObjects(root->ownMediaObjects().prefix(1));
        return root;
    };
    check(
        make({ "1.mov" }), make({ "1.mov", "2.mov" }), { { "object /f/2.mov in /root" }, {}, { "group root (0, 1)" } });
}

TEST_CASE("representatives come and go unnoticed")
{
    const auto representative = OBMediaObject::initWithMediaType_name(OBMediaTypeMovie, "movie");
    representative->setAttribute_forKey(true, platform::Text(OBMediaObjectRepresentativeKey));
    const OBMediaGroupRef now = groupNamed("root");
    now->setMediaObjects(OBMediaObjectList().appending(representative));
    check(groupNamed("root"), now, {});
}

TEST_CASE("a tree that is changed in place is compared with what it was")
{
    const OBMediaGroupRef root = groupWith("root", { groupOfFiles("a", { "1.mov" }) });
    const OBTreeSnapshot before(root);
    root->childGroups()[0]->setMediaObjects(filesOf("a", { "1.mov", "2.mov" }));
    root->setChildGroups(root->childGroups().appending(groupNamed("b")));
    check(before, root, { { "object /a/2.mov in /a", "group b in /root (0, 0)" }, {}, { "group a in /root (1, 2)" } });
}

TEST_CASE("of no tree everything comes, and to no tree everything goes")
{
    const OBMediaGroupRef root = groupOfFiles("root", { "1.mov" });
    check(nullptr, root, { { "group root (0, 1)", "object /root/1.mov in /root" }, {}, {} });
    check(root, nullptr, { {}, { "group root (1, 0)", "object /root/1.mov in /root" }, {} });
}

TEST_CASE("trees may be deeper than a thread's stack")
{
    const auto make = [](const OBMediaGroupRef& innermost) {
        OBMediaGroupRef group = innermost;
        for (int level = 0; level < 20'000; ++level)
            group = groupWith(std::to_string(level), { group });
        return group;
    };
    check(make(groupNamed("a")), make(groupOfFiles("a", { "1.mov" })),
        { { "object /a/1.mov in /a" }, {}, { "group a in /0 (0, 1)" } });
}
