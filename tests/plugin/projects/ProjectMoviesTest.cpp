#include "tests/plugin/support/RecordText.h"
#include "tests/plugin/support/SourceMachine.h"

#include "host/OBConstants.h"

#include <doctest/doctest.h>

#include <chrono>

using namespace tests;
using Lines = std::vector<std::string>;

TEST_CASE(
    "the rendered movies of a project are the entries of its shared folder with one of four extensions, as listed")
{
    SourceMachine machine;
    machine.files.order = std::greater<>();
    BundleBuilder project = machine.projects().project("P");
    project.movie("a.mov").movie("b.m4v").movie("c.mp4").movie("d.3gp").movie("e.avi").movie("f");
    const auto source = machine.makeSource();
    CHECK(machine.abbreviated(source->_renderedMoviesPathsForProjectPath(project.path()))
        == Lines { "PROJECTS/P/Shared Items/d.3gp", "PROJECTS/P/Shared Items/c.mp4", "PROJECTS/P/Shared Items/b.m4v",
            "PROJECTS/P/Shared Items/a.mov" });
}

TEST_CASE("a movie's extension in capitals is no movie's")
{
    SourceMachine machine;
    BundleBuilder project = machine.projects().project("P");
    project.movie("clip.MOV").movieWithBytes("notes.txt", "").movie("x.3gp").movie("y.Mp4");
    const auto source = machine.makeSource();
    CHECK(machine.abbreviated(source->_renderedMoviesPathsForProjectPath(project.path()))
        == Lines { "PROJECTS/P/Shared Items/x.3gp" });
}

TEST_CASE("hidden entries, folders and links with a movie's extension are movies, files in subfolders are not")
{
    SourceMachine machine;
    BundleBuilder project = machine.projects().project("P");
    project.movie(".hid.mov").movie("listed.mov").hiddenMovies({ "listed.mov" }).movieSubfolder("folder.mov");
    project.movieLink("link.mov", "/nowhere").movie("sub/inner.mov").movieWithBytes("empty.mov", "");
    const auto source = machine.makeSource();
    CHECK(machine.abbreviated(source->_renderedMoviesPathsForProjectPath(project.path()))
        == Lines { "PROJECTS/P/Shared Items/.hid.mov", "PROJECTS/P/Shared Items/empty.mov",
            "PROJECTS/P/Shared Items/folder.mov", "PROJECTS/P/Shared Items/link.mov",
            "PROJECTS/P/Shared Items/listed.mov" });
}

TEST_CASE("the extension is what follows the last full stop, and a name that begins or ends with its only one has none")
{
    SourceMachine machine;
    BundleBuilder project = machine.projects().project("P");
    project.movie(".mov").movie("a.mov.").movie("b.x.mov").movie("mov").movie("..mov");
    const auto source = machine.makeSource();
    CHECK(machine.abbreviated(source->_renderedMoviesPathsForProjectPath(project.path()))
        == Lines { "PROJECTS/P/Shared Items/..mov", "PROJECTS/P/Shared Items/b.x.mov" });
}

TEST_CASE("a project without a shared folder, with an empty one or with one that cannot be read has no movies")
{
    SourceMachine machine;
    const auto source = machine.makeSource();
    const std::string project = machine.projects().project("P").path();
    const auto isWithoutMovies = [&] {
        return source->_renderedMoviesPathsForProjectPath(project).empty()
            && !source->_previewFileForProjectPath(project);
    };
    CHECK(isWithoutMovies());
    machine.projects().folder("P/Shared Items");
    CHECK(isWithoutMovies());
    machine.projects().file("P/Shared Items/a.mov");
    CHECK_FALSE(isWithoutMovies());
    machine.files.whenListing = [](std::string_view) { return platform::FileProblem::notPermitted; };
    CHECK(isWithoutMovies());
    machine.files.whenListing = nullptr;
    removeItem(project + "/Shared Items");
    machine.projects().file("P/Shared Items");
    CHECK(isWithoutMovies());
    CHECK(source->_renderedMoviesPathsForProjectPath("/nowhere").empty());
}

TEST_CASE("the preview of a project is its first movie as listed")
{
    SourceMachine machine;
    machine.files.order = std::greater<>();
    BundleBuilder project = machine.projects().project("P");
    project.movie("a.mov").movie("m.mp4").movieWithBytes("z.txt", "");
    const auto source = machine.makeSource();
    const auto preview = source->_previewFileForProjectPath(project.path());
    REQUIRE(preview);
    CHECK(machine.abbreviated(*preview) == "PROJECTS/P/Shared Items/m.mp4");
    CHECK_FALSE(source->_previewFileForProjectPath("/nowhere"));
}

TEST_CASE("a shared folder that is a link is followed, and movies keep its spelling")
{
    SourceMachine machine;
    machine.disk.file("elsewhere/a.mov");
    const std::string project = machine.projects().project("P").path();
    machine.projects().link("P/Shared Items", machine.disk.path("elsewhere"));
    const auto source = machine.makeSource();
    const OBMediaObjectRef movie = machine.load(*source).rootMediaGroup->childGroups()[0]->mediaObjects()[0];
    CHECK(movie->path().string() == project + "/Shared Items/a.mov");
    CHECK(movie->aliasResolvedPath().string() == machine.disk.path("elsewhere/a.mov"));
}

TEST_CASE("a folder shows the widest movie of each project, and of equally wide ones the first")
{
    SourceMachine machine;
    machine.projects().project("F/P").movie("a.mov", 1280, 720).movie("b.m4v", 1920, 1088).movie("c.mp4", 1920, 800);
    machine.projects().project("F/Q").movie("a.mov", 1920, 720).movie("b.mov", 1280, 1088);
    const auto source = machine.makeSource();
    const OBMediaGroupRef folder = machine.load(*source).rootMediaGroup->childGroups()[0];
    CHECK(machine.text(folder->ownMediaObjects()) == R"(
* P 3/4 org.ombrix.OBMontaroPlugin path=PROJECTS/F/P/Shared Items/b.m4v icon=thumbnail {Project Path=PROJECTS/F/P, OBMediaObjectResolutionKey=1920x1088, Project Representative=true}
* Q 3/4 org.ombrix.OBMontaroPlugin path=PROJECTS/F/Q/Shared Items/a.mov icon=thumbnail {Project Path=PROJECTS/F/Q, OBMediaObjectResolutionKey=1920x720, Project Representative=true}
)");
}

TEST_CASE("a folder's representative shares resolution, thumbnail and properties with its movie, at every level")
{
    SourceMachine machine;
    machine.projects().project("F/P").movie("a.mov", 1280, 720);
    const auto source = machine.makeSource();
    const OBMediaGroupRef folder = machine.load(*source).rootMediaGroup->childGroups()[0];
    const OBMediaObjectRef representative = folder->ownMediaObjects()[0];
    const OBMediaObjectRef movie = folder->childGroups()[0]->mediaObjects()[0];
    CHECK(representative->icon() == movie->thumbnailImage());
    CHECK(representative->attributeForKey(OBMediaObjectResolutionKey)
        == movie->attributeForKey(OBMediaObjectResolutionKey));
    CHECK(representative->attributeForKey("Project Representative") == platform::Value(true));
    CHECK(representative->attributeForKey("Project Format Version").isNull());
    CHECK(representative->marvexProperties()->path() == movie->path());
}

TEST_CASE("a folder shows the representatives of its own projects and of those below, in the order of its children")
{
    SourceMachine machine;
    for (const char* name : { "F/A", "F/B sub/Inner/C", "F/B sub/D", "F/E" })
        machine.projects().project(name).movie("a.mov");
    const auto source = machine.makeSource();
    const OBMediaGroupRef folder = machine.load(*source).rootMediaGroup->childGroups()[0];
    const OBMediaGroupRef subfolder = folder->childGroups()[1];
    CHECK(objectNames(folder->ownMediaObjects()) == "A D C E");
    CHECK(objectNames(subfolder->ownMediaObjects()) == "D C");
    CHECK(folder->ownMediaObjects()[1] == subfolder->ownMediaObjects()[0]);
}

TEST_CASE("projects without movies, and with none that has a resolution, show as groups and not as objects")
{
    SourceMachine machine;
    machine.projects().project("F/A");
    machine.projects().project("F/B").movieWithBytes("a.mov", "no movie").damagedMovie("b.mov");
    machine.projects().project("F/C").movie("a.mov");
    const auto source = machine.makeSource();
    const OBMediaGroupRef folder = machine.load(*source).rootMediaGroup->childGroups()[0];
    CHECK(childNames(*folder) == "A B C");
    CHECK(objectNames(folder->ownMediaObjects()) == "C");
}

TEST_CASE("a subfolder without objects of its own adds none to its folder, though movies lie below it")
{
    SourceMachine machine;
    machine.projects().project("F/Sub/A").movieWithBytes("a.mov", "no movie");
    const auto source = machine.makeSource();
    const OBMediaGroupRef folder = machine.load(*source).rootMediaGroup->childGroups()[0];
    CHECK(folder->childGroups()[0]->mediaObjects().size() == 1);
    CHECK(folder->ownMediaObjects().empty());
}

TEST_CASE("a folder's objects are appended to those it has, and project libraries among its children give none")
{
    SourceMachine machine;
    const auto source = machine.makeSource();
    const auto movie = [](const char* name) {
        OBMediaObjectRef object = OBMediaObject::initWithMediaType_name(OBMediaTypeMovie, name);
        object->setAttribute_forKey(platform::Size { 5, 5 }, OBMediaObjectResolutionKey);
        return object;
    };
    const auto groupWith = [&](OBTypeIdentifierRef type, const char* name) {
        OBMediaGroupRef group = OBMediaGroup::initWithTypeIdentifier(type);
        group->setName(name);
        group->setMediaObjects(OBMediaObjectList({ movie("1"), movie("2") }));
        return group;
    };
    const OBMediaGroupRef folder = groupWith(OBMontaroFolderGroupTypeIdentifier, "folder");
    folder->addChildGroup(groupWith(OBMontaroProjectLibraryGroupTypeIdentifier, "library"));
    folder->addChildGroup(groupWith(OBMontaroProjectGroupTypeIdentifier, "project"));
    folder->addChildGroup(groupWith(OBMontaroFolderGroupTypeIdentifier, "sub"));
    folder->addChildGroup(groupWith(nullptr, "untagged"));
    const OBMediaObjectList before = folder->ownMediaObjects();
    source->_createMontaroProjectsFolderMediaObjects(folder);
    CHECK(objectNames(folder->ownMediaObjects()) == "1 2 project 1 2 untagged");
    CHECK(objectNames(before) == "1 2");
}

namespace {

/// The movies in the order in which they were read, and "-" wherever the main thread got to other work meanwhile, with
/// reading one taking so long.
Lines readsAndOtherWork(std::chrono::nanoseconds readingTakes)
{
    SourceMachine machine;
    machine.projects().project("F/P").movie("a.mov").movie("b.mov");
    machine.projects().project("F/Q").movie("c.mov");
    machine.projects().project("F/R").movie("d.mov");
    Trace order;
    machine.movies.whenRead = [&](std::string_view path) {
        order.add(std::string(path.substr(path.rfind('/') + 1)));
        machine.mainRunLoop.post([&order] { order.add("-"); });
        machine.clock.advance(readingTakes);
    };
    const auto source = machine.makeSource();
    machine.load(*source);
    machine.onMainThread([] {});
    return order.take();
}

} // namespace

TEST_CASE("movies that are read fast are read in one turn of the main thread, those of several projects too")
{
    CHECK(readsAndOtherWork(std::chrono::microseconds(10))
        == Lines { "a.mov", "b.mov", "c.mov", "d.mov", "-", "-", "-", "-" });
}

TEST_CASE("where movies are read slowly the main thread gets to its other work between two projects")
{
    CHECK(readsAndOtherWork(std::chrono::milliseconds(20))
        == Lines { "a.mov", "b.mov", "-", "-", "c.mov", "-", "d.mov", "-" });
}
