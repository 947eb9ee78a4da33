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
        return groupWith("top", { groupOfFiles("a", { "1.mov", "2.mov" }), groupWith("b", { groupNamed("c") }) });
    };
    check(make(), make(), {});
    check(nullptr, nullptr, {});
}

TEST_CASE("groups and objects that came or went are told in the order of the tree, a group before its objects")
{
    const OBMediaGroupRef before = groupWith("top", { groupOfFiles("a", { "1.mov" }), groupNamed("b") });
    const OBMediaGroupRef now
        = groupWith("top", { groupWith("c", { groupOfFiles("d", { "1.mov", "2.mov" }) }), groupNamed("b") });
    check(before, now,
        { { "group c in /top (0, 0)", "group d in /c (0, 2)", "object /d/1.mov in /d", "object /d/2.mov in /d" },
            { "group a in /top (1, 0)", "object /a/1.mov in /a" }, {} });
}

TEST_CASE("a group has changed when its own objects are others, whatever their order")
{
    const OBMediaGroupRef before = groupOfFiles("top", { "1.mov", "2.mov", "3.mov" });
    check(before, groupOfFiles("top", { "3.mov", "1.mov", "2.mov" }), {});
    check(before, groupOfFiles("top", { "1.mov", "3.mov", "4.mov", "5.mov" }),
        { { "object /top/4.mov in /top", "object /top/5.mov in /top" }, { "object /top/2.mov in /top" },
            { "group top (3, 4)" } });
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
        check(groupWith("top", { groupNamed("a") }), groupWith("top", { now }),
            { {}, {}, { "group " + now->name().string() + " in /top (0, 0)" } });
    }
}

TEST_CASE("a group that stands elsewhere among its siblings has not changed, one in another group has")
{
    const OBMediaGroupRef before = groupWith("top", { groupNamed("a"), groupNamed("b"), groupNamed("c") });
    check(before, groupWith("top", { groupNamed("c"), groupNamed("a"), groupNamed("b") }), {});
    check(before, groupWith("top", { groupNamed("a"), groupWith("b", { groupNamed("c") }) }),
        { {}, {}, { "group c in /b (0, 0)" } });
}

TEST_CASE("groups that cannot be told apart are as many as there are")
{
    check(groupWith("top", { groupNamed("a"), groupNamed("a") }), groupWith("top", { groupNamed("a") }),
        { {}, { "group a in /top (0, 0)" }, {} });
    const OBMediaGroupRef nameless = OBMediaGroup::withFields({ .name = "x" });
    const OBMediaGroupRef other = OBMediaGroup::withFields({ .name = "y" });
    check(groupWith("top", { nameless }), groupWith("top", { other }),
        { { "group y in /top (0, 0)" }, { "group x in /top (0, 0)" }, {} });
}

TEST_CASE("a file that is listed twice is lost once when it is listed once")
{
    check(groupOfFiles("top", { "a.mov", "a.mov" }), groupOfFiles("top", { "a.mov" }),
        { {}, { "object /top/a.mov in /top" }, { "group top (2, 1)" } });
}

TEST_CASE("an object counts in the innermost group that it was set on")
{
    const auto make = [](const Texts& names) {
        const OBMediaGroupRef inner = groupOfFiles("inner", names);
        OBMediaGroupRef root = groupWith("top", { inner });
        const OBMediaObjectRef alone = OBMediaObject::initWithMediaType_name(OBMediaTypeMovie, "alone");
        inner->setMediaObjects(inner->ownMediaObjects().appending(alone));
        root->setMediaObjects(inner->ownMediaObjects());
        return root;
    };
    check(make({ "1.mov" }), make({ "1.mov", "2.mov" }),
        { { "object /inner/2.mov in /inner" }, {}, { "group inner in /top (2, 3)" } });
}

TEST_CASE("what a longer list repeats counts further in, and only the rest where it stands")
{
    const auto make = [](const Texts& names) {
        const OBMediaGroupRef inner = groupNamed("inner");
        OBMediaGroupRef root = groupWith("top", { inner });
        root->setMediaObjects(filesOf("f", names));
        inner->setMediaObjects(root->ownMediaObjects().prefix(1));
        return root;
    };
    check(make({ "1.mov" }), make({ "1.mov", "2.mov" }), { { "object /f/2.mov in /top" }, {}, { "group top (0, 1)" } });
}

TEST_CASE("representatives come and go unnoticed")
{
    const auto representative = OBMediaObject::initWithMediaType_name(OBMediaTypeMovie, "movie");
    representative->setAttribute_forKey(true, platform::Text(OBMediaObjectRepresentativeKey));
    const OBMediaGroupRef now = groupNamed("top");
    now->setMediaObjects(OBMediaObjectList().appending(representative));
    check(groupNamed("top"), now, {});
}

TEST_CASE("a tree that is changed in place is compared with what it was")
{
    const OBMediaGroupRef root = groupWith("top", { groupOfFiles("a", { "1.mov" }) });
    const OBTreeSnapshot before(root);
    root->childGroups()[0]->setMediaObjects(filesOf("a", { "1.mov", "2.mov" }));
    root->setChildGroups(root->childGroups().appending(groupNamed("b")));
    check(before, root, { { "object /a/2.mov in /a", "group b in /top (0, 0)" }, {}, { "group a in /top (1, 2)" } });
}

TEST_CASE("of no tree everything comes, and to no tree everything goes")
{
    const OBMediaGroupRef root = groupOfFiles("top", { "1.mov" });
    check(nullptr, root, { { "group top (0, 1)", "object /top/1.mov in /top" }, {}, {} });
    check(root, nullptr, { {}, { "group top (1, 0)", "object /top/1.mov in /top" }, {} });
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
