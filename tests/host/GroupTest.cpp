#include "host/OBMediaGroup.h"

#include "tests/host/TestHost.h"

#include <doctest/doctest.h>

#include <string>
#include <vector>

using namespace tests;
using platform::Date;
using platform::Size;
using platform::Text;
using platform::Value;

namespace {

OBMediaGroupRef groupNamed(const char* name)
{
    auto group = OBMediaGroup::initWithTypeIdentifier(OBMontaroFolderGroupTypeIdentifier);
    group->setName(name);
    return group;
}

OBMediaObjectList objectsNamed(const std::vector<std::string>& names)
{
    OBMediaObjectList list;
    for (const std::string& name : names)
        list = list.appending(OBMediaObject::initWithMediaType_name(OBMediaTypeMovie, name));
    return list;
}

std::vector<std::string> namesOf(const OBMediaObjectList& objects)
{
    std::vector<std::string> names;
    objects.visit([&names](OBMediaObject& object) {
        names.push_back(object.name().string());
        return true;
    });
    return names;
}

std::vector<std::string> namesOf(const OBMediaGroupList& groups)
{
    std::vector<std::string> names;
    for (const OBMediaGroupRef& group : groups)
        names.push_back(group->name().string());
    return names;
}

using Names = std::vector<std::string>;

} // namespace

TEST_CASE("type identifiers are compared by identity, not by text")
{
    const std::string text(OBMontaroProjectGroupTypeIdentifier->text());
    const OBTypeIdentifier lookalike(text);
    const auto group = OBMediaGroup::initWithTypeIdentifier(&lookalike);
    CHECK(group->typeIdentifier()->text() == OBMontaroProjectGroupTypeIdentifier->text());
    CHECK(group->typeIdentifier() != OBMontaroProjectGroupTypeIdentifier);
    CHECK(group->typeIdentifier() == &lookalike);
    group->setTypeIdentifier(OBMontaroProjectGroupTypeIdentifier);
    CHECK(group->typeIdentifier() == OBMontaroProjectGroupTypeIdentifier);
}

TEST_CASE("each of the seven type identifiers is an instance of its own whose text is its name")
{
    const std::vector<std::pair<OBTypeIdentifierRef, std::string>> all {
        { OBMontaroRootGroupTypeIdentifier, "OBMontaroRootGroupTypeIdentifier" },
        { OBMontaroProjectLibraryGroupTypeIdentifier, "OBMontaroProjectLibraryGroupTypeIdentifier" },
        { OBMontaroProjectGroupTypeIdentifier, "OBMontaroProjectGroupTypeIdentifier" },
        { OBMontaroFolderGroupTypeIdentifier, "OBMontaroFolderGroupTypeIdentifier" },
        { OBMontaroEventLibraryGroupTypeIdentifier, "OBMontaroEventLibraryGroupTypeIdentifier" },
        { OBMontaroEventGroupTypeIdentifier, "OBMontaroEventGroupTypeIdentifier" },
        { OBMontaroEventCalendarGroupTypeIdentifier, "OBMontaroEventCalendarGroupTypeIdentifier" },
    };
    for (std::size_t index = 0; index < all.size(); ++index) {
        CHECK(all[index].first->text() == all[index].second);
        for (std::size_t other = 0; other < index; ++other)
            CHECK(all[index].first != all[other].first);
    }
}

TEST_CASE("the exported constants have their published values")
{
    CHECK(OBMediaObjectResolutionKey == "OBMediaObjectResolutionKey");
    CHECK(OBMediaObjectDurationKey == "OBMediaObjectDurationKey");
    CHECK(OBZunoPrefsPath == "~/Library/Preferences/org.ombrix.Zuno.plist");
    CHECK(OBHostPreferencesDomain == "org.ombrix.browser");
    CHECK(OBWillOpenOrRevealInSourceNotification == "willOpenOrRevealInSourceNotification");
    CHECK(OBMediaTypeMovie == 3);
    CHECK(OBMediaSourceTypePlugin == 4);
    CHECK(OBMediaTypesMovies == 4);
    CHECK(OBQueryRunModeLive == 4);
}

TEST_CASE("a new group has nothing set but its type identifier")
{
    const auto group = OBMediaGroup::initWithTypeIdentifier(OBMontaroRootGroupTypeIdentifier);
    CHECK(group->typeIdentifier() == OBMontaroRootGroupTypeIdentifier);
    CHECK(group->name().isAbsent());
    CHECK(group->ID().isAbsent());
    CHECK(group->parentID().isAbsent());
    CHECK(group->path().isAbsent());
    CHECK(group->URL().path.isAbsent());
    CHECK(group->icon() == nullptr);
    CHECK_FALSE(group->modificationDate().has_value());
    CHECK(group->attributes().empty());
    CHECK(group->childGroups().empty());
    CHECK(group->mediaObjects().empty());
    CHECK(group->ownMediaObjects().empty());
    CHECK(group->dynamicMediaObjects());
}

TEST_CASE("each text of a group answers what was set last, absent and empty told apart")
{
    using Getter = Text (OBMediaGroup::*)() const;
    using Setter = void (OBMediaGroup::*)(Text);
    const std::vector<std::pair<Getter, Setter>> fields {
        { &OBMediaGroup::name, &OBMediaGroup::setName },
        { &OBMediaGroup::ID, &OBMediaGroup::setID },
        { &OBMediaGroup::parentID, &OBMediaGroup::setParentID },
        { &OBMediaGroup::path, &OBMediaGroup::setPath },
    };
    for (const auto& [get, set] : fields) {
        const auto group = OBMediaGroup::initWithTypeIdentifier(nullptr);
        (*group.*set)("first");
        (*group.*set)("second");
        int others = 0;
        for (const auto& other : fields)
            others += (*group.*other.first)().isAbsent() ? 1 : 0;
        CHECK(others == 3);
        CHECK((*group.*get)() == "second");
        (*group.*set)("");
        CHECK_FALSE((*group.*get)().isAbsent());
        CHECK((*group.*get)().empty());
        (*group.*set)(Text());
        CHECK((*group.*get)().isAbsent());
    }
}

TEST_CASE("the location of a group is the path that was set, and absent with it")
{
    const auto group = OBMediaGroup::initWithTypeIdentifier(OBMontaroFolderGroupTypeIdentifier);
    group->setPath("/home/ann/Movies/");
    CHECK(group->URL().path == "/home/ann/Movies/");
    group->setPath(Text());
    CHECK(group->URL().path.isAbsent());
}

TEST_CASE("icon, date, type identifier and attributes of a group can be set, replaced and taken away")
{
    const auto group = OBMediaGroup::initWithTypeIdentifier(OBMontaroFolderGroupTypeIdentifier);
    const auto icon = OBImage::pictureNamed("eventIcon", Size { 16, 16 }, "/icon.svg");
    group->setIcon(icon);
    CHECK(group->icon() == icon);
    group->setIcon(nullptr);
    CHECK(group->icon() == nullptr);

    group->setModificationDate(Date { 0, 0 });
    CHECK(group->modificationDate() == Date { 0, 0 });
    group->setModificationDate(Date { -5, 7 });
    CHECK(group->modificationDate() == Date { -5, 7 });
    group->setModificationDate(std::nullopt);
    CHECK_FALSE(group->modificationDate().has_value());

    const Value::Dictionary attributes { { "year", 2020 }, { "place", "here" } };
    group->setAttributes(attributes);
    CHECK(group->attributes() == attributes);
    CHECK(group->attributeForKey("place") == Value("here"));
    CHECK(group->attributeForKey("nothing").isNull());
    group->setAttributes({});
    CHECK(group->attributes().empty());
    CHECK(group->attributeForKey("year").isNull());

    group->setTypeIdentifier(nullptr);
    CHECK(group->typeIdentifier() == nullptr);
}

TEST_CASE("the date of a file follows links and is absent when nothing is there")
{
    TestHost test;
    const std::string file = test.machine.folder.file("movie.mov");
    setModificationDate(file, Date { 1'500'000'000, 0 });
    const std::string link = test.machine.folder.link("link", file);
    test.host();
    CHECK(OBMediaGroup::modDateForFile(link) == Date { 1'500'000'000, 0 });
    CHECK_FALSE(OBMediaGroup::modDateForFile(test.machine.folder.path("nothing")).has_value());
}

TEST_CASE("adding null to a group changes nothing")
{
    const auto group = groupNamed("parent");
    group->addChildGroup(nullptr);
    CHECK(group->childGroups().empty());
    group->addChildGroup(groupNamed("child"));
    group->addChildGroup(nullptr);
    CHECK(namesOf(group->childGroups()) == Names { "child" });
}

TEST_CASE("children are appended one by one or as a list in order, and replaced whole")
{
    const auto group = groupNamed("parent");
    group->addChildGroup(groupNamed("a"));
    group->addChildGroups(OBMediaGroupList({ groupNamed("b"), groupNamed("c") }));
    group->addChildGroups({});
    group->addChildGroup(groupNamed("d"));
    CHECK(namesOf(group->childGroups()) == Names { "a", "b", "c", "d" });
    group->setChildGroups(OBMediaGroupList({ groupNamed("e") }));
    CHECK(namesOf(group->childGroups()) == Names { "e" });
    group->setChildGroups({});
    CHECK(group->childGroups().empty());
}

TEST_CASE("adding the children of one group to another leaves the first group's list as it is")
{
    const auto first = groupNamed("first");
    first->addChildGroup(groupNamed("a"));
    const auto second = groupNamed("second");
    second->addChildGroups(first->childGroups());
    second->addChildGroup(groupNamed("b"));
    first->addChildGroup(groupNamed("c"));
    CHECK(namesOf(first->childGroups()) == Names { "a", "c" });
    CHECK(namesOf(second->childGroups()) == Names { "a", "b" });
}

TEST_CASE("adding a group to another changes no field of it")
{
    const auto parent = groupNamed("parent");
    parent->setID("parent ID");
    parent->setPath("/parent");
    const auto child = OBMediaGroup::initWithTypeIdentifier(OBMontaroProjectGroupTypeIdentifier);
    child->setName("child");
    child->setPath("/elsewhere");
    parent->addChildGroup(child);
    CHECK(parent->childGroups()[0] == child);
    CHECK(child->parentID().isAbsent());
    CHECK(child->ID().isAbsent());
    CHECK(child->name() == "child");
    CHECK(child->path() == "/elsewhere");
    CHECK(child->typeIdentifier() == OBMontaroProjectGroupTypeIdentifier);
    CHECK(child->childGroups().empty());
    CHECK(child->icon() == nullptr);
    CHECK_FALSE(child->modificationDate().has_value());
    CHECK(child->dynamicMediaObjects());
}

TEST_CASE("a group answers its own media objects where it has any")
{
    const auto child = groupNamed("child");
    child->setMediaObjects(objectsNamed({ "of the child" }));
    const auto group = groupNamed("parent");
    group->addChildGroup(child);
    group->setMediaObjects(objectsNamed({ "own" }));
    CHECK(namesOf(group->mediaObjects()) == Names { "own" });
    CHECK(namesOf(group->ownMediaObjects()) == Names { "own" });
}

TEST_CASE("a group without media objects answers those of its descendants in tree order")
{
    const auto deep = groupNamed("deep");
    deep->setMediaObjects(objectsNamed({ "b", "c" }));
    const auto middle = groupNamed("middle");
    middle->addChildGroup(deep);
    middle->addChildGroup(groupNamed("empty"));
    const auto before = groupNamed("before");
    before->setMediaObjects(objectsNamed({ "a" }));
    const auto after = groupNamed("after");
    after->setMediaObjects(objectsNamed({ "d" }));
    const auto group = groupNamed("parent");
    group->addChildGroups(OBMediaGroupList({ before, middle, after }));
    CHECK(namesOf(group->mediaObjects()) == Names { "a", "b", "c", "d" });
    CHECK(group->ownMediaObjects().empty());
}

TEST_CASE("a group whose dynamic media objects are off answers only its own")
{
    const auto child = groupNamed("child");
    child->setMediaObjects(objectsNamed({ "of the child" }));
    const auto group = groupNamed("parent");
    group->addChildGroup(child);
    group->setDynamicMediaObjects(false);
    CHECK_FALSE(group->dynamicMediaObjects());
    CHECK(group->mediaObjects().empty());
    group->setMediaObjects(objectsNamed({ "own" }));
    CHECK(namesOf(group->mediaObjects()) == Names { "own" });
    group->setMediaObjects({});
    group->setDynamicMediaObjects(true);
    CHECK(namesOf(group->mediaObjects()) == Names { "of the child" });
}

TEST_CASE("a descendant whose dynamic media objects are off hides those below it")
{
    const auto leaf = groupNamed("leaf");
    leaf->setMediaObjects(objectsNamed({ "hidden" }));
    const auto middle = groupNamed("middle");
    middle->addChildGroup(leaf);
    middle->setDynamicMediaObjects(false);
    const auto group = groupNamed("parent");
    group->addChildGroup(middle);
    CHECK(group->mediaObjects().empty());
}

TEST_CASE("a copy of a group has every field of it and shares children, but later changes stay apart")
{
    const auto group = groupNamed("name");
    group->setID("ID");
    group->setParentID("parent");
    group->setPath("/path");
    group->setIcon(OBImage::pictureNamed("icon", Size { 1, 2 }, "/icon.svg"));
    group->setModificationDate(Date { 12, 34 });
    group->setAttributes({ { "key", true } });
    group->addChildGroup(groupNamed("child"));
    group->setMediaObjects(objectsNamed({ "movie" }));
    group->setDynamicMediaObjects(false);

    const auto copy = group->copy();
    CHECK(copy != group);
    CHECK(copy->typeIdentifier() == OBMontaroFolderGroupTypeIdentifier);
    CHECK(copy->name() == "name");
    CHECK(copy->ID() == "ID");
    CHECK(copy->parentID() == "parent");
    CHECK(copy->path() == "/path");
    CHECK(copy->icon() == group->icon());
    CHECK(copy->modificationDate() == Date { 12, 34 });
    CHECK(copy->attributes() == group->attributes());
    CHECK(copy->childGroups()[0] == group->childGroups()[0]);
    CHECK(copy->mediaObjects()[0] == group->mediaObjects()[0]);
    CHECK_FALSE(copy->dynamicMediaObjects());

    copy->addChildGroup(groupNamed("of the copy"));
    group->addChildGroup(groupNamed("of the group"));
    copy->setName("other");
    CHECK(namesOf(copy->childGroups()) == Names { "child", "of the copy" });
    CHECK(namesOf(group->childGroups()) == Names { "child", "of the group" });
    CHECK(group->name() == "name");
}
