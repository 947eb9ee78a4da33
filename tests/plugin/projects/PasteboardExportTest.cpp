#include "tests/plugin/support/EventMachine.h"

#include "host/OBConstants.h"
#include "host/OBMediaObject.h"
#include "platform/common/MemoryPasteboard.h"
#include "platform/formats/PropertyList.h"

#include <doctest/doctest.h>

#include <functional>

using namespace tests;
using platform::Value;
using Lines = std::vector<std::string>;

namespace {

constexpr const char* privateType = "OBMontaroProjectsPboardType";

/// A loaded source with a project of two movies, of which one is none, and an event.
struct SourceToCopyFrom : EventMachine {
    SourceToCopyFrom()
    {
        BundleBuilder first = projects().project("First");
        first.movie("a.mov", 640, 480.5);
        first.movieWithBytes("b.mov", "no movie");
        projects().project("Second").movie("c.mov", 1920, 1080);
        clip("Trip", "t.mov", noonOf(2012));
        source = makeSource();
        load(*source);
    }
    OBMediaGroupRef group(std::size_t index) const { return source->rootMediaGroup()->childGroups()[index]; }
    /// The types on the pasteboard, in order.
    Lines types() const
    {
        Lines types;
        for (const auto& item : pasteboard.items())
            types.push_back(item.type);
        return types;
    }
    std::string data(const char* type) const { return abbreviated(*pasteboard.item(type)->data); }
    /// The private property list as "PATH NAME: PATH NAME DIMENSIONS DURATION, ..." a project; "-" for an absent key.
    Lines projectsWritten() const
    {
        const auto* item = pasteboard.item(privateType);
        REQUIRE(item);
        REQUIRE(item->owner == source.get());
        Lines lines;
        const Value list = item->propertyList->valueForKey("ProjectList");
        for (const Value& project : list.isNull() ? Value::List() : *list.list()) {
            std::string line = shown(project, "ProjectPath") + " " + shown(project, "ProjectName") + ":";
            for (const Value& version : *project.valueForKey("RenderedVersions").list())
                line += " [" + shown(version, "Path") + " " + shown(version, "Name") + " "
                    + shown(version, "Dimensions") + " " + shown(version, "Duration") + "]";
            lines.push_back(line);
        }
        if (list.isNull())
            CHECK(item->propertyList->dictionary()->empty());
        return lines;
    }
    std::string shown(const Value& dictionary, const char* key) const
    {
        const Value value = dictionary.valueForKey(key);
        if (value.isNull())
            return "-";
        return value.text() ? abbreviated(value.text()->string()) : std::to_string(*value.real());
    }

    std::shared_ptr<OBMontaroPlugin> source;
    platform::MemoryPasteboard pasteboard {};
};

const std::string firstEntry = "PROJECTS/First First: [PROJECTS/First/Shared Items/a.mov a {640, 480.5} 2.000000]"
                               " [PROJECTS/First/Shared Items/b.mov b - -]";

} // namespace

TEST_CASE("the representative of a project names the project with every version, of each what is known")
{
    SourceToCopyFrom test;
    const OBMediaObjectList objects = test.source->rootMediaGroup()->mediaObjects().prefix(1);
    CHECK(test.source->writeMediaObjects_toPasteboard(objects, test.pasteboard));
    CHECK(test.projectsWritten() == Lines { firstEntry });
    CHECK(test.types() == Lines { "text/uri-list", "x-special/gnome-copied-files", "text/plain", privateType });
    CHECK(test.data("text/plain") == "PROJECTS/First/Shared Items/a.mov\n");
}

TEST_CASE("a project that two chosen objects belong to is listed twice")
{
    SourceToCopyFrom test;
    const OBMediaObjectRef object = test.source->rootMediaGroup()->mediaObjects().objects().front();
    CHECK(test.source->writeMediaObjects_toPasteboard(
        OBMediaObjectList().appending(object).appending(object), test.pasteboard));
    CHECK(test.projectsWritten() == Lines { firstEntry, firstEntry });
}

TEST_CASE("a movie of a project, and a clip, name themselves: no project is found, and an empty dictionary is written")
{
    SourceToCopyFrom test;
    CHECK(test.source->writeMediaObjects_toPasteboard(test.group(0)->mediaObjects().prefix(1), test.pasteboard));
    CHECK(test.projectsWritten() == Lines {});
    CHECK(test.source->writeMediaObjects_toPasteboard(test.group(2)->mediaObjects(), test.pasteboard));
    CHECK(test.projectsWritten() == Lines {});
    CHECK(test.data("text/plain") == "DISK/home/Movies/Montaro Events/Trip/Original Media/t.mov\n");
}

TEST_CASE("objects without a project path leave it to the framework, and answer what it answers")
{
    SourceToCopyFrom test;
    const OBMediaObjectRef object = OBMediaObject::initWithMediaType_name(OBMediaTypeMovie, "x");
    CHECK_FALSE(test.source->writeMediaObjects_toPasteboard(OBMediaObjectList().appending(object), test.pasteboard));
    CHECK(test.types() == Lines {});
    object->setPath(test.disk.file("x.mov"));
    CHECK(test.source->writeMediaObjects_toPasteboard(OBMediaObjectList().appending(object), test.pasteboard));
    CHECK(test.types() == Lines { "text/uri-list", "x-special/gnome-copied-files", "text/plain" });
}

TEST_CASE("the private type is written although all files are gone")
{
    SourceToCopyFrom test;
    const OBMediaObjectList objects = test.source->rootMediaGroup()->mediaObjects().prefix(1);
    removeItem(test.disk.path("home/Movies/Montaro Projects/First/Shared Items"));
    CHECK(test.source->writeMediaObjects_toPasteboard(objects, test.pasteboard));
    CHECK(test.types() == Lines { privateType });
    CHECK(test.projectsWritten() == Lines {});
}

TEST_CASE("of a project group the framework gets the first movie alone, the private type all, the group stays")
{
    SourceToCopyFrom test;
    const OBMediaGroupRef project = test.group(0);
    CHECK(test.source->writeMediaGroups_toPasteboard(OBMediaGroupList({ project }), test.pasteboard));
    CHECK(test.data("text/plain") == "PROJECTS/First/Shared Items/a.mov\n");
    CHECK(test.projectsWritten() == Lines { firstEntry });
    CHECK(project->mediaObjects().size() == 2);
}

TEST_CASE("other groups reach the framework unchanged and are in no project list")
{
    SourceToCopyFrom test;
    CHECK(test.source->writeMediaGroups_toPasteboard(
        OBMediaGroupList({ test.group(2), test.group(1) }), test.pasteboard));
    CHECK(test.data("text/plain")
        == "DISK/home/Movies/Montaro Events/Trip/Original Media/t.mov\nPROJECTS/Second/Shared Items/c.mov\n");
    CHECK(test.projectsWritten()
        == Lines { "PROJECTS/Second Second: [PROJECTS/Second/Shared Items/c.mov c {1920, 1080} 2.000000]" });
    CHECK(test.source->writeMediaGroups_toPasteboard(OBMediaGroupList({ test.group(2) }), test.pasteboard));
    CHECK(test.types() == Lines { "text/uri-list", "x-special/gnome-copied-files", "text/plain" });
}

TEST_CASE("a project without a path, or whose movies are all gone, is left out, and the dictionary may be empty")
{
    SourceToCopyFrom test;
    const OBMediaGroupRef pathless = test.group(0)->copy();
    pathless->setPath({});
    const OBMediaGroupRef nameless = test.group(1)->copy();
    nameless->setName({});
    CHECK(test.source->writeMediaGroups_toPasteboard(OBMediaGroupList({ pathless, nameless }), test.pasteboard));
    CHECK(test.projectsWritten()
        == Lines { "PROJECTS/Second -: [PROJECTS/Second/Shared Items/c.mov c {1920, 1080} 2.000000]" });
    CHECK(test.source->writeMediaGroups_toPasteboard(OBMediaGroupList({ pathless }), test.pasteboard));
    CHECK(test.projectsWritten() == Lines {});
}

TEST_CASE("projects are found in tree order, once for each time their path was given, by the exact path")
{
    SourceToCopyFrom test;
    const std::string folder = test.disk.path("home/Movies/Montaro Projects");
    const OBMediaGroupList found = test.source->projectGroupsForPaths(
        { folder + "/Second", folder + "/First", folder + "/second", folder + "/Second", folder + "/First/" });
    REQUIRE(found.size() == 3);
    CHECK(found[0] == test.group(0));
    CHECK(found[1] == test.group(1));
    CHECK(found[2] == test.group(1));
    CHECK(test.source->projectGroupsForPaths({}).empty());
}

TEST_CASE("a project in a folder is found, and one group after another is written, also one without a movie")
{
    SourceToCopyFrom test;
    BundleBuilder deep = test.projects().project("Clients/Deep");
    for (const char* name : { "x.mov", "y.mov", "z.mov" })
        deep.movie(name, 640, 480);
    test.projects().project("Bare");
    test.load(*test.source);
    OBMediaGroupList groups;
    Lines expected;
    const std::function<void(const OBMediaGroup&)> collect = [&](const OBMediaGroup& group) {
        for (const OBMediaGroupRef& child : group.childGroups()) {
            if (child->name() == "Deep" || child->name() == "Bare")
                groups = groups.appending(child);
            collect(*child);
        }
    };
    collect(*test.source->rootMediaGroup());
    REQUIRE(groups.size() == 2);
    CHECK(test.source->writeMediaGroups_toPasteboard(groups, test.pasteboard));
    const Lines written = test.projectsWritten();
    REQUIRE(written.size() == 1);
    CHECK(written[0].starts_with("PROJECTS/Clients/Deep Deep: [PROJECTS/Clients/Deep/Shared Items/x.mov"));
    CHECK(written[0].find("z.mov") != std::string::npos);
    CHECK(test.data("text/plain") == "PROJECTS/Clients/Deep/Shared Items/x.mov\n");
}

TEST_CASE("files are written by their real paths, escaped in URIs and byte by byte as text")
{
    SourceToCopyFrom test;
    const std::string name = "a b%\n\"'\xff\xc3\xa4.mov";
    const OBMediaObjectRef object = OBMediaObject::initWithMediaType_name(OBMediaTypeMovie, "x");
    test.disk.file("real/" + name);
    object->setPath(test.disk.link("link", test.disk.path("real/" + name)));
    test.source->OBMediaManager::writeMediaObjects_toPasteboard(
        OBMediaObjectList().appending(object).appending(object), test.pasteboard);
    const std::string uri = "file://DISK/real/a%20b%25%0A%22%27%FF%C3%A4.mov";
    CHECK(test.data("text/uri-list") == uri + "\r\n" + uri + "\r\n");
    CHECK(test.data("x-special/gnome-copied-files") == "copy\n" + uri + "\n" + uri);
    CHECK(test.data("text/plain") == "DISK/real/" + name + "\nDISK/real/" + name + "\n");
}
