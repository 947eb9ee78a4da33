#include "apps/common/RecordJson.h"
#include "apps/common/Output.h"
#include "host/OBConstants.h"
#include "host/OBMediaObjectList.h"

#include <doctest/doctest.h>

#include <cstdio>
#include <functional>
#include <memory>
#include <string>
#include <vector>

#include <unistd.h>

namespace {

std::string printed(const std::function<void(apps::Output&)>& print)
{
    std::FILE* file = std::tmpfile();
    {
        apps::Output output(::fileno(file));
        print(output);
        output.flush();
    }
    std::string text(static_cast<std::size_t>(::lseek(::fileno(file), 0, SEEK_END)), '\0');
    (void)::pread(::fileno(file), text.data(), text.size(), 0);
    std::fclose(file);
    return text;
}

std::string printed(const OBMediaGroupRef& group)
{
    return printed([&group](apps::Output& output) { apps::printGroup(output, group); });
}

} // namespace

TEST_CASE("a group in which nothing is set has every key")
{
    CHECK(printed(OBMediaGroup::initWithTypeIdentifier(nullptr))
        == "{\"typeIdentifier\":null,\"name\":null,\"ID\":null,\"parentID\":null,\"icon\":null,\"path\":null,"
           "\"modificationDate\":null,\"attributes\":{},\"mediaObjects\":[],\"childGroups\":[]}\n");
}

TEST_CASE("a group prints what was set on it and each attribute by its kind")
{
    const OBMediaGroupRef group = OBMediaGroup::initWithTypeIdentifier(OBMontaroProjectGroupTypeIdentifier);
    group->setName("Tr\xffip");
    group->setID("/a");
    group->setModificationDate(platform::Date { 1299146400, 123456789 });
    group->setIcon(OBImage::pictureNamed("projectIcon", { 16, 16 }, "/x.svg"));
    group->setAttributes({ { "year", 2011 }, { "date", platform::Date { 0, 0 } }, { "on", true }, { "real", 1.0 },
        { "size", platform::Size { 1920, 1080.5 } } });
    CHECK(printed(group)
        == "{\"typeIdentifier\":\"OBMontaroProjectGroupTypeIdentifier\",\"name\":\"Tr\uFFFDip\",\"ID\":\"/a\","
           "\"parentID\":null,\"icon\":\"projectIcon\",\"path\":null,"
           "\"modificationDate\":\"2011-03-03T10:00:00.123456789Z\",\"attributes\":{\"year\":2011,"
           "\"date\":\"1970-01-01T00:00:00.000000000Z\",\"on\":true,\"real\":1.0,"
           "\"size\":{\"width\":1920.0,\"height\":1080.5}},\"mediaObjects\":[],\"childGroups\":[]}\n");
}

TEST_CASE("an object prints every key, and null for a file that is not there")
{
    const OBMediaObjectRef object = OBMediaObject::initWithMediaType_name(OBMediaTypeMovie, "clip");
    object->setMediaSourceType(OBMediaSourceTypePlugin);
    object->setAttribute_forKey(platform::Value("/p"), "Project Path");
    const OBMediaObjectList objects { std::vector<OBMediaObjectRef> { object } };
    CHECK(printed([&objects](apps::Output& output) { apps::printObjects(output, objects); })
        == "[{\"mediaType\":3,\"name\":\"clip\",\"mediaSourceType\":4,\"sourcePluginIdentifier\":null,\"path\":null,"
           "\"aliasResolvedPath\":null,\"icon\":null,\"attributes\":{\"Project Path\":\"/p\"}}]\n");
}

TEST_CASE("each object of a folder is printed as it is by itself, whatever its name and whoever has changed it")
{
    OBMediaObjectKind kind;
    kind.mediaType = OBMediaTypeMovie;
    kind.sourcePluginIdentifier = "a.mov";
    kind.icon = OBImage::pictureNamed("icon", { 16, 16 }, "/x.svg");
    kind.ownPathKeys = { "Path", "Same \"path\"" };
    kind.beforeFileName = "/Below/";
    kind.attributes = { { "first", "/f\n\xff/Below/a.mov" }, { "number", 1 } };
    const std::vector<OBFileOfFolder> files { { "a.mov", true }, { "a.mov", true }, { "link.mov", false },
        { "b \"quoted\".mov", true }, { "changed.mov", true }, { "\xff.\xc3.mov", true }, { ".hidden", true },
        { "no extension", true }, { "dots..", true }, { "\t.\n", true }, { "last.mov", true } };
    const OBMediaObjectList list
        = OBMediaObjectBatch::objects(std::make_shared<const OBMediaObjectKind>(kind), { "/f\n\xff", true }, files);
    list[4]->setPath("/elsewhere.mov");
    const OBMediaObjectList oneByOne(list.objects());
    const auto textOf = [](const OBMediaObjectList& objects) {
        return printed([&objects](apps::Output& output) { apps::printObjects(output, objects); });
    };
    CHECK(textOf(list) == textOf(oneByOne));
    CHECK(textOf(list.prefix(1)) == textOf(oneByOne.prefix(1)));
    CHECK(textOf(list.prefix(2).appending(list)) == textOf(oneByOne.prefix(2).appending(oneByOne)));
    list[0]->setMediaSourceType(5);
    CHECK(textOf(list) == textOf(oneByOne));
}

TEST_CASE("a group prints the objects and children that were set on it, not those of what lies below")
{
    const OBMediaGroupRef root = OBMediaGroup::initWithTypeIdentifier(nullptr);
    const OBMediaGroupRef child = OBMediaGroup::initWithTypeIdentifier(nullptr);
    child->setMediaObjects(OBMediaObjectList({ OBMediaObject::initWithMediaType_name(3, "clip") }));
    root->addChildGroup(child);
    const std::string text = printed(root);
    CHECK(text.find("\"mediaObjects\":[],\"childGroups\":[{") != std::string::npos);
    CHECK(text.find("\"name\":\"clip\"") == text.rfind("\"name\":\"clip\""));
}

TEST_CASE("a flat list leaves the children of its groups out")
{
    const OBMediaGroupRef group = OBMediaGroup::initWithTypeIdentifier(nullptr);
    const OBMediaGroupList groups { std::vector<OBMediaGroupRef> { group, group } };
    const std::string text = printed([&groups](apps::Output& output) { apps::printGroups(output, groups); });
    CHECK(text.find("childGroups") == std::string::npos);
    CHECK(text.substr(0, 2) == "[{");
    CHECK(text.find("]},{") != std::string::npos);
}

TEST_CASE("a tree of five thousand levels is printed whole")
{
    const OBMediaGroupRef root = OBMediaGroup::initWithTypeIdentifier(nullptr);
    OBMediaGroupRef innermost = root;
    for (int level = 0; level < 5000; ++level) {
        const OBMediaGroupRef child = OBMediaGroup::initWithTypeIdentifier(nullptr);
        innermost->addChildGroup(child);
        innermost = child;
    }
    const std::string text = printed(root);
    std::size_t count = 0;
    for (std::size_t at = text.find("childGroups"); at != std::string::npos; at = text.find("childGroups", at + 1))
        ++count;
    CHECK(count == 5001);
    CHECK(text.substr(text.size() - 5) == "]}]}\n");
}

TEST_CASE("changes are printed like hits of a search, with the half and the cause, null where there is none")
{
    OBTreeChanges changes;
    CHECK(printed([&](apps::Output& output) { apps::printChanges(output, changes, "", ""); })
        == "{\"half\":null,\"added\":[],\"removed\":[],\"changed\":[],\"cause\":null}\n");
    changes.added.push_back(
        { nullptr, OBMediaObject::initWithMediaType_name(OBMediaTypeMovie, "clip"), "clip", "/a/clip.mov", {}, "/a" });
    changes.removed.push_back({ OBMediaGroup::initWithTypeIdentifier(nullptr), nullptr, "2011", {}, "2011", "Events" });
    changes.changed.push_back({ OBMediaGroup::initWithTypeIdentifier(nullptr), nullptr, "root", {}, "root", {} });
    CHECK(printed([&](apps::Output& output) { apps::printChanges(output, changes, "events", "changed: /a"); })
        == "{\"half\":\"events\",\"added\":[{\"kind\":\"object\",\"name\":\"clip\",\"path\":\"/a/clip.mov\","
           "\"group\":\"/a\"}],\"removed\":[{\"kind\":\"group\",\"name\":\"2011\",\"path\":null,"
           "\"group\":\"Events\"}],\"changed\":[{\"kind\":\"group\",\"name\":\"root\",\"path\":null,\"group\":null}],"
           "\"cause\":\"changed: /a\"}\n");
}
