#include "host/OBMediaObject.h"

#include "host/OBConstants.h"
#include "host/OBMediaObjectList.h"
#include "tests/host/TestHost.h"

#include <doctest/doctest.h>

#include <filesystem>
#include <memory>
#include <string>
#include <vector>

using namespace tests;
using platform::Size;
using platform::Text;
using platform::Value;

namespace {

std::shared_ptr<const OBMediaObjectKind> projectMovies()
{
    auto kind = movieKind();
    kind->icon = OBImage::pictureNamed("projectIcon", Size { 16, 16 }, "/icon.svg");
    kind->ownPathKeys = { "Own Path" };
    return kind;
}

OBMediaObjectRef fileOfFolder(const std::string& folder, const std::string& name, bool pathIsReal = false)
{
    const std::vector<OBFileOfFolder> files { { "before.mov", true }, { name, pathIsReal }, { "after.mov", true } };
    return OBMediaObjectBatch::objects(projectMovies(), { folder, pathIsReal }, files)[1];
}

} // namespace

TEST_CASE("an object made by itself has its type and name and nothing else")
{
    const auto object = OBMediaObject::initWithMediaType_name(OBMediaTypeMovie, "trip.final.mov");
    CHECK(object->mediaType() == 3);
    CHECK(object->name() == "trip.final.mov");
    CHECK(object->mediaSourceType() == 0);
    CHECK(object->sourcePluginIdentifier().isAbsent());
    CHECK(object->path().isAbsent());
    CHECK(object->icon() == nullptr);
    CHECK(object->attributes().empty());
    CHECK_FALSE(object->hasProducedThumbnail());
    CHECK(object->thumbnailIfProduced() == nullptr);
}

TEST_CASE("every field of an object answers what was set on it")
{
    const auto object = OBMediaObject::initWithMediaType_name(OBMediaTypeMovie, "trip");
    const auto icon = OBImage::pictureNamed("icon", Size { 1, 1 }, "/icon.svg");
    object->setMediaSourceType(OBMediaSourceTypePlugin);
    object->setSourcePluginIdentifier("org.ombrix.Montaro");
    object->setPath("/movies/trip.mov");
    object->setIcon(icon);
    CHECK(object->mediaSourceType() == 4);
    CHECK(object->sourcePluginIdentifier() == "org.ombrix.Montaro");
    CHECK(object->path() == "/movies/trip.mov");
    CHECK(object->icon() == icon);
    object->setPath(Text());
    object->setIcon(nullptr);
    CHECK(object->path().isAbsent());
    CHECK(object->icon() == nullptr);
}

TEST_CASE("an object of a folder is named after its file without the extension")
{
    const std::vector<std::pair<std::string, std::string>> cases {
        { "trip.mov", "trip" },
        { "trip.final.mov", "trip.final" },
        { "trip", "trip" },
        { ".mov", ".mov" },
        { "trip.", "trip." },
        { "a..", "a." },
        { "\xff.mov", "\xff" },
    };
    for (const auto& [fileName, name] : cases) {
        const std::string file = fileName;
        CAPTURE(file);
        const auto object = fileOfFolder("/movies", file);
        CHECK(object->name() == Text(name));
        CHECK(object->path() == Text("/movies/" + file));
    }
}

TEST_CASE("an object of a folder has the fields of its kind, and its own path as attribute")
{
    const auto kind = projectMovies();
    const std::vector<OBFileOfFolder> files { { "a.mov", false }, { "b.mov", false } };
    const OBMediaObjectList list = OBMediaObjectBatch::objects(kind, { "/movies", false }, files);
    REQUIRE(list.size() == 2);
    CHECK(list[1]->mediaType() == 3);
    CHECK(list[1]->mediaSourceType() == 4);
    CHECK(list[1]->sourcePluginIdentifier() == "org.test.Source");
    CHECK(list[1]->icon() == kind->icon);
    CHECK(list[1]->attributeForKey("Own Path") == Value("/movies/b.mov"));
    CHECK(list[1]->attributes() == Value::Dictionary { { "Own Path", "/movies/b.mov" } });
}

TEST_CASE("setting one field of an object of a folder keeps the others")
{
    const auto untouched = fileOfFolder("/movies", "trip.mov");
    const std::vector<void (*)(OBMediaObject&)> changes {
        [](OBMediaObject& object) { object.setMediaSourceType(object.mediaSourceType()); },
        [](OBMediaObject& object) { object.setIcon(object.icon()); },
        [](OBMediaObject& object) { object.setSourcePluginIdentifier(object.sourcePluginIdentifier()); },
        [](OBMediaObject& object) { object.setPath(object.path()); },
        [](OBMediaObject& object) { object.setAttribute_forKey("/movies/trip.mov", "Own Path"); },
    };
    for (const auto change : changes) {
        const auto object = fileOfFolder("/movies", "trip.mov");
        change(*object);
        CHECK(object->mediaType() == untouched->mediaType());
        CHECK(object->mediaSourceType() == untouched->mediaSourceType());
        CHECK(object->name() == untouched->name());
        CHECK(object->path() == untouched->path());
        CHECK(object->sourcePluginIdentifier() == untouched->sourcePluginIdentifier());
        CHECK(object->icon()->name() == "projectIcon");
        CHECK(object->attributes() == untouched->attributes());
    }
}

TEST_CASE("changing one object of a folder leaves its neighbours as they are")
{
    const std::vector<OBFileOfFolder> files { { "a.mov", false }, { "b.mov", false } };
    const OBMediaObjectList list = OBMediaObjectBatch::objects(projectMovies(), { "/movies", false }, files);
    list[0]->setPath("/elsewhere/z.mov");
    list[0]->setSourcePluginIdentifier("other");
    CHECK(list[0]->path() == "/elsewhere/z.mov");
    CHECK(list[0]->name() == "a");
    CHECK(list[1]->path() == "/movies/b.mov");
    CHECK(list[1]->sourcePluginIdentifier() == "org.test.Source");
}

TEST_CASE("a path that is set later changes neither attributes nor properties that came with the first one")
{
    const auto object = fileOfFolder("/movies", "trip.mov");
    const Value::Dictionary attributes = object->attributes();
    object->setPath("/elsewhere/z.mov");
    CHECK(object->attributeForKey("Own Path") == Value("/movies/trip.mov"));
    CHECK(object->attributes() == attributes);
    CHECK(object->record().attributes == attributes);
    CHECK(object->record().path == "/elsewhere/z.mov");
    CHECK(object->marvexProperties()->path() == "/movies/trip.mov");
}

TEST_CASE("an attribute that is set hides the folder's under the same key, and keeps its place when it is set again")
{
    const auto object = fileOfFolder("/movies", "trip.mov");
    object->setAttribute_forKey(1, "first");
    object->setAttribute_forKey("mine", "Own Path");
    object->setAttribute_forKey(true, "last");
    object->setAttribute_forKey(2, "first");
    CHECK(object->attributeForKey("Own Path") == Value("mine"));
    CHECK(object->attributeForKey("none").isNull());
    CHECK(object->attributes() == Value::Dictionary { { "first", 2 }, { "Own Path", "mine" }, { "last", true } });
}

TEST_CASE("the alias-resolved path is the real path behind every link")
{
    TestHost test;
    const std::string file = test.machine.folder.file("real/trip.mov");
    test.machine.folder.link("folder", test.machine.folder.path("real"));
    test.machine.folder.link("link.mov", test.machine.folder.path("folder/trip.mov"));
    test.host();
    const auto object = OBMediaObject::initWithMediaType_name(OBMediaTypeMovie, "trip");
    object->setPath(test.machine.folder.path("link.mov"));
    CHECK(object->aliasResolvedPath() == Text(file));
    CHECK(object->path() == Text(test.machine.folder.path("link.mov")));
    CHECK(fileOfFolder(test.machine.folder.path("folder"), "trip.mov")->aliasResolvedPath() == Text(file));
}

TEST_CASE("the alias-resolved path is absent where nothing exists, and without a path")
{
    TestHost test;
    test.machine.folder.link("dangling", test.machine.folder.path("nothing"));
    test.host();
    const auto object = OBMediaObject::initWithMediaType_name(OBMediaTypeMovie, "trip");
    CHECK(object->aliasResolvedPath().isAbsent());
    object->setPath(test.machine.folder.path("nothing"));
    CHECK(object->aliasResolvedPath().isAbsent());
    object->setPath(test.machine.folder.path("dangling"));
    CHECK(object->aliasResolvedPath().isAbsent());
}

TEST_CASE("a path that was seen to hold no link resolves to itself")
{
    TestHost test;
    const std::string file = test.machine.folder.file("real/trip.mov");
    test.host();
    const auto object = fileOfFolder(test.machine.folder.path("real"), "trip.mov", true);
    CHECK(object->aliasResolvedPath() == Text(file));
    const auto other = OBMediaObject::initWithMediaType_name(OBMediaTypeMovie, "representative");
    other->setPathOfObject(*object);
    CHECK(other->path() == Text(file));
    CHECK(other->aliasResolvedPath() == Text(file));
}

TEST_CASE("a file that has gone since it was found has no real path, and one that a link replaced leads elsewhere")
{
    TestHost test;
    const std::string elsewhere = test.machine.folder.file("elsewhere.mov");
    const std::string file = test.machine.folder.file("real/trip.mov");
    test.host();
    const auto object = fileOfFolder(test.machine.folder.path("real"), "trip.mov", true);
    removeItem(file);
    CHECK(object->aliasResolvedPath().isAbsent());
    makeLink(file, elsewhere);
    CHECK(object->aliasResolvedPath() == Text(elsewhere));
}

TEST_CASE("a file whose folder has moved away from under a link in its place is resolved to where it is")
{
    TestHost test;
    test.machine.folder.file("real/trip.mov");
    test.host();
    const std::string real = test.machine.folder.path("real");
    const std::string moved = test.machine.folder.path("moved");
    const auto object = fileOfFolder(real, "trip.mov", true);
    std::filesystem::rename(real, moved);
    makeLink(real, moved);
    CHECK(object->aliasResolvedPath() == Text(moved + "/trip.mov"));
}

TEST_CASE("a new path of an object is resolved afresh")
{
    TestHost test;
    const std::string file = test.machine.folder.file("real/trip.mov");
    const std::string link = test.machine.folder.link("link.mov", file);
    test.host();
    const auto object = fileOfFolder(test.machine.folder.path("real"), "trip.mov", true);
    object->setPath(link);
    CHECK(object->aliasResolvedPath() == Text(file));
    const auto other = fileOfFolder(test.machine.folder.path("real"), "trip.mov", true);
    other->setPathOfObject(*object);
    CHECK(other->path() == Text(link));
    CHECK(other->aliasResolvedPath() == Text(file));
}

TEST_CASE("the search properties of a file are read when the first one is asked for, once")
{
    TestHost test;
    test.host();
    const OBMarvexPropertiesRef properties = OBMediaObject::marvexProperties("/movies/trip.mov");
    const auto object = OBMediaObject::initWithMediaType_name(OBMediaTypeMovie, "trip");
    object->setMarvexProperties(properties);
    CHECK(properties->path() == "/movies/trip.mov");
    CHECK(object->marvexProperties() == properties);
    CHECK(test.machine.metadataIndex.timesAsked() == 0);
    CHECK(properties->valueForKey("kMDItemPath") == Value("/movies/trip.mov"));
    CHECK(object->marvexProperties()->valueForKey("kMDItemFSSize") == Value(17));
    CHECK(properties->valueForKey("kMDItemContentType").isNull());
    CHECK(properties->all().dictionary()->size() == 2);
    CHECK(test.machine.metadataIndex.timesAsked() == 1);
}

TEST_CASE("an object without search properties of its own answers those of its file")
{
    TestHost test;
    test.host();
    const auto object = fileOfFolder("/movies", "trip.mov");
    CHECK(object->marvexProperties()->path() == "/movies/trip.mov");
    CHECK(test.machine.metadataIndex.timesAsked() == 0);
    CHECK(object->marvexProperties()->valueForKey("kMDItemPath") == Value("/movies/trip.mov"));
}

TEST_CASE("without a host nothing is read of files")
{
    TemporaryFolder folder;
    const auto object = OBMediaObject::initWithMediaType_name(OBMediaTypeMovie, "trip");
    object->setPath(folder.file("trip.mov"));
    CHECK(object->aliasResolvedPath().isAbsent());
    CHECK(object->thumbnailImage() == nullptr);
    CHECK_FALSE(object->hasProducedThumbnail());
    CHECK(OBMediaObject::marvexProperties(object->path())->all().isNull());
    CHECK_FALSE(OBMediaGroup::modDateForFile(object->path()).has_value());
}

TEST_CASE("a record of an object holds what its fields answer, also where somebody has changed them")
{
    const HostMachine machine;
    OBMediaObjectKind kind;
    kind.mediaType = 3;
    kind.mediaSourceType = 4;
    kind.sourcePluginIdentifier = "source";
    kind.ownPathKeys = { "Path" };
    const OBFileOfFolder file { "clip.mov", true };
    const OBMediaObjectList objects = OBMediaObjectBatch::objects(
        std::make_shared<const OBMediaObjectKind>(kind), { "/folder", true }, { &file, 1 });
    const auto checkRecord = [](const OBMediaObject& object) {
        const OBMediaObjectRecord record = object.record();
        CHECK(record.mediaType == object.mediaType());
        CHECK(record.name == object.name());
        CHECK(record.mediaSourceType == object.mediaSourceType());
        CHECK(record.sourcePluginIdentifier == object.sourcePluginIdentifier());
        CHECK(record.path == object.path());
        CHECK(record.icon == object.icon());
        CHECK(record.attributes == object.attributes());
    };
    checkRecord(*objects[0]);
    CHECK(objects[0]->record().pathIsReal);
    CHECK(objects[0]->record().attributes == platform::Value::Dictionary { { "Path", "/folder/clip.mov" } });
    objects[0]->setPath("/elsewhere/other.mov");
    objects[0]->setMediaSourceType(5);
    objects[0]->setAttribute_forKey(true, "Key");
    checkRecord(*objects[0]);
    CHECK_FALSE(objects[0]->record().pathIsReal);
    CHECK(objects[0]->record().path == "/elsewhere/other.mov");
}

TEST_CASE("an object whose path is its real path is as it was made until somebody changes it")
{
    const std::vector<OBFileOfFolder> files { { "a.mov", true }, { "link.mov", false } };
    const OBMediaObjectList list = OBMediaObjectBatch::objects(projectMovies(), { "/movies", true }, files);
    const auto isAsMade = [](const OBMediaObject& object) {
        CHECK(object.record().isAsMade == object.isAsMade());
        return object.isAsMade();
    };
    CHECK(isAsMade(*list[0]));
    CHECK_FALSE(isAsMade(*list[1]));
    CHECK_FALSE(isAsMade(*OBMediaObjectBatch::objects(projectMovies(), { "/linked", false }, files)[0]));
    list[0]->setPath("/movies/a.mov");
    CHECK_FALSE(isAsMade(*list[0]));
}

TEST_CASE("an object keeps what was seen of its file until it gets another path, and asks nothing of the disk for it")
{
    const HostMachine machine;
    const platform::FileFacts facts { { 1'300'000'000, 5 }, 1234 };
    const std::vector<OBFileOfFolder> files { { "a.mov", true, facts }, { "b.mov", true, std::nullopt } };
    const OBMediaObjectList objects
        = OBMediaObjectBatch::objects(std::make_shared<const OBMediaObjectKind>(), { "/nowhere", true }, files);
    CHECK(objects[0]->fileFacts() == facts);
    CHECK_FALSE(objects[1]->fileFacts());
    objects[0]->setMediaSourceType(4);
    CHECK(objects[0]->fileFacts() == facts);
    objects[0]->setPath("/nowhere/c.mov");
    CHECK_FALSE(objects[0]->fileFacts());
    objects[0]->setFileFacts(facts);
    CHECK(objects[0]->fileFacts() == facts);
    const OBMediaObjectRef other = OBMediaObject::initWithMediaType_name(3, "other");
    other->setPathOfObject(*objects[0]);
    CHECK(other->fileFacts() == facts);
}
