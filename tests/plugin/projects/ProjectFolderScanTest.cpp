#include "tests/plugin/support/RecordText.h"
#include "tests/plugin/support/SourceMachine.h"

#include "host/OBConstants.h"

#include <doctest/doctest.h>

#include <algorithm>

using namespace tests;
using platform::FileProblem;

namespace {

/// The tree, and the flat list below a line of dashes, of a machine whose disk is as the test has made it.
std::string loadedText(SourceMachine& machine)
{
    machine.dateEverything();
    const auto source = machine.makeSource();
    const OBMediaGroupRef root = machine.load(*source).rootMediaGroup;
    std::string text = "\n";
    for (const OBMediaGroupRef& child : root->childGroups()) {
        if (child->typeIdentifier() != OBMontaroEventLibraryGroupTypeIdentifier)
            text += textOfGroup(*child);
    }
    text += "----\n";
    for (const OBMediaGroupRef& group : source->mediaGroups()) {
        if (group->ID() != "/Montaro Projects")
            text += textOfGroup(*group);
    }
    return machine.abbreviated(std::move(text));
}

/// The names of the groups in the root, below a library that holds what `make` makes.
template <class Make> std::string namesInLibrary(const Make& make)
{
    SourceMachine machine;
    LibraryBuilder library = machine.projects();
    make(machine, library);
    const auto source = machine.makeSource();
    std::string names = childNames(*machine.load(*source).rootMediaGroup);
    names.resize(names.size() - std::min(names.size(), std::string_view(" Events").size()));
    return names;
}

} // namespace

TEST_CASE("folders with the marker are projects, other folders are folders, and their movies are objects")
{
    SourceMachine machine;
    machine.projects().project("Trip").movie("a.mov").movie("b.mp4", 640, 480);
    machine.projects().project("Old/Summer");
    CHECK(loadedText(machine) == R"(
Folder Old ID=PROJECTS/Old parent=PROJECTS icon=projectIcon path=PROJECTS/Old dated {}
  Project Summer ID=PROJECTS/Old/Summer parent=PROJECTS/Old icon=projectIcon path=PROJECTS/Old/Summer dated {}
Project Trip ID=PROJECTS/Trip parent=PROJECTS icon=projectIcon path=PROJECTS/Trip dated {}
  * a 3/4 org.ombrix.OBMontaroPlugin path=PROJECTS/Trip/Shared Items/a.mov icon=projectIcon {Project Path=PROJECTS/Trip/Shared Items/a.mov, OBMediaObjectResolutionKey=1920x1080, OBMediaObjectDurationKey=2r}
  * b 3/4 org.ombrix.OBMontaroPlugin path=PROJECTS/Trip/Shared Items/b.mp4 icon=projectIcon {Project Path=PROJECTS/Trip/Shared Items/b.mp4, OBMediaObjectResolutionKey=640x480, OBMediaObjectDurationKey=2r}
----
Project Summer ID=PROJECTS/Old/Summer parent=PROJECTS/Old icon=projectIcon path=PROJECTS/Old/Summer dated {}
Project Trip ID=PROJECTS/Trip parent=PROJECTS icon=projectIcon path=PROJECTS/Trip dated {}
  * a 3/4 org.ombrix.OBMontaroPlugin path=PROJECTS/Trip/Shared Items/a.mov icon=projectIcon {Project Path=PROJECTS/Trip/Shared Items/a.mov, OBMediaObjectResolutionKey=1920x1080, OBMediaObjectDurationKey=2r}
  * b 3/4 org.ombrix.OBMontaroPlugin path=PROJECTS/Trip/Shared Items/b.mp4 icon=projectIcon {Project Path=PROJECTS/Trip/Shared Items/b.mp4, OBMediaObjectResolutionKey=640x480, OBMediaObjectDurationKey=2r}
)");
}

TEST_CASE("an empty subfolder is an empty folder in the tree and its own parent in the flat list")
{
    SourceMachine machine;
    machine.projects().folder("Empty/Inner");
    CHECK(loadedText(machine) == R"(
Folder Empty ID=PROJECTS/Empty parent=PROJECTS icon=projectIcon path=PROJECTS/Empty dated {}
  Folder Inner ID=PROJECTS/Empty/Inner parent=PROJECTS/Empty icon=projectIcon path=PROJECTS/Empty/Inner dated {}
----
Folder Inner ID=PROJECTS/Empty/Inner parent=PROJECTS/Empty/Inner icon=projectIcon path=PROJECTS/Empty/Inner dated {}
)");
}

TEST_CASE("a missing default folder gives a placeholder of a project library that is its own parent")
{
    SourceMachine machine;
    CHECK(loadedText(machine) == R"(
----
ProjectLibrary Montaro Projects ID=PROJECTS parent=PROJECTS icon=projectIcon path=PROJECTS undated {}
)");
}

TEST_CASE("an empty default folder gives the same placeholder, dated")
{
    SourceMachine machine;
    machine.projects();
    CHECK(loadedText(machine) == R"(
----
ProjectLibrary Montaro Projects ID=PROJECTS parent=PROJECTS icon=projectIcon path=PROJECTS dated {}
)");
}

TEST_CASE("a plain file in place of the default folder gives the same placeholder")
{
    SourceMachine machine;
    machine.disk.file("home/Movies/Montaro Projects");
    CHECK(loadedText(machine) == R"(
----
ProjectLibrary Montaro Projects ID=PROJECTS parent=PROJECTS icon=projectIcon path=PROJECTS dated {}
)");
}

TEST_CASE("another missing library gives a placeholder of a folder")
{
    SourceMachine machine;
    machine.projects().project("Trip");
    machine.volumes.local.store({ { "/Volumes/Gone", "Gone" } });
    CHECK(loadedText(machine) == R"(
Project Trip ID=PROJECTS/Trip parent=PROJECTS icon=projectIcon path=PROJECTS/Trip dated {}
----
Project Trip ID=PROJECTS/Trip parent=PROJECTS icon=projectIcon path=PROJECTS/Trip dated {}
Folder Montaro Projects ID=/Volumes/Gone/Montaro Projects parent=/Volumes/Gone/Montaro Projects icon=projectIcon path=/Volumes/Gone/Montaro Projects undated {}
)");
}

TEST_CASE("a library on a volume keeps the spelling by which it was found, and movies tell their real path")
{
    SourceMachine machine;
    machine.volumes.local.store({ { "/mnt/data", "Data" } });
    machine.volumeProjects("Data").project("Trip").movie("a.mov");
    machine.projects().project("Home");
    CHECK(loadedText(machine) == R"(
Project Home ID=PROJECTS/Home parent=PROJECTS icon=projectIcon path=PROJECTS/Home dated {}
Project Trip ID=/Volumes/Data/Montaro Projects/Trip parent=/Volumes/Data/Montaro Projects icon=projectIcon path=/Volumes/Data/Montaro Projects/Trip dated {}
  * a 3/4 org.ombrix.OBMontaroPlugin path=/Volumes/Data/Montaro Projects/Trip/Shared Items/a.mov real=DISK/Volumes/Data/Montaro Projects/Trip/Shared Items/a.mov icon=projectIcon {Project Path=/Volumes/Data/Montaro Projects/Trip/Shared Items/a.mov, OBMediaObjectResolutionKey=1920x1080, OBMediaObjectDurationKey=2r}
----
Project Home ID=PROJECTS/Home parent=PROJECTS icon=projectIcon path=PROJECTS/Home dated {}
Project Trip ID=/Volumes/Data/Montaro Projects/Trip parent=/Volumes/Data/Montaro Projects icon=projectIcon path=/Volumes/Data/Montaro Projects/Trip dated {}
  * a 3/4 org.ombrix.OBMontaroPlugin path=/Volumes/Data/Montaro Projects/Trip/Shared Items/a.mov real=DISK/Volumes/Data/Montaro Projects/Trip/Shared Items/a.mov icon=projectIcon {Project Path=/Volumes/Data/Montaro Projects/Trip/Shared Items/a.mov, OBMediaObjectResolutionKey=1920x1080, OBMediaObjectDurationKey=2r}
)");
}

TEST_CASE("a medium that is listed twice is read twice")
{
    SourceMachine machine;
    machine.volumes.local.store({ { "/Volumes/Stick", "Stick" } });
    machine.volumes.removable.store({ { "/Volumes/Stick", "Stick" } });
    machine.volumeProjects("Stick").project("Trip");
    machine.projects();
    CHECK(loadedText(machine) == R"(
Project Trip ID=/Volumes/Stick/Montaro Projects/Trip parent=/Volumes/Stick/Montaro Projects icon=projectIcon path=/Volumes/Stick/Montaro Projects/Trip dated {}
Project Trip ID=/Volumes/Stick/Montaro Projects/Trip parent=/Volumes/Stick/Montaro Projects icon=projectIcon path=/Volumes/Stick/Montaro Projects/Trip dated {}
----
ProjectLibrary Montaro Projects ID=PROJECTS parent=PROJECTS icon=projectIcon path=PROJECTS dated {}
Project Trip ID=/Volumes/Stick/Montaro Projects/Trip parent=/Volumes/Stick/Montaro Projects icon=projectIcon path=/Volumes/Stick/Montaro Projects/Trip dated {}
Project Trip ID=/Volumes/Stick/Montaro Projects/Trip parent=/Volumes/Stick/Montaro Projects icon=projectIcon path=/Volumes/Stick/Montaro Projects/Trip dated {}
)");
}

TEST_CASE("entries stand in the order in which the file system lists them")
{
    const auto make = [](SourceMachine& machine, LibraryBuilder& library) {
        machine.files.order = [](std::string_view left, std::string_view right) { return left.back() < right.back(); };
        for (const char* name : { "a3", "b1", "C2/x" })
            library.project(name);
    };
    CHECK(namesInLibrary(make) == "b1 C2 a3");
}

TEST_CASE("an entry whose name begins with a full stop is ignored, be it a project")
{
    CHECK(namesInLibrary([](SourceMachine&, LibraryBuilder& library) {
        library.project(".Hidden");
        library.project("..Hidden");
        library.project(".folder/Inner");
        library.project("a");
    }) == "a");
}

TEST_CASE("an entry that its folder's list of hidden names holds is ignored, be it a project")
{
    CHECK(namesInLibrary([](SourceMachine&, LibraryBuilder& library) {
        library.project("a");
        library.project("b");
        library.project("c/Inner");
        library.hiddenNames("", { "a", "c" });
    }) == "b");
}

TEST_CASE("a package is ignored unless it is a project, and its extension is read without regard to case")
{
    CHECK(namesInLibrary([](SourceMachine&, LibraryBuilder& library) {
        for (const char* name : { "a.app", "b.BUNDLE", "c.framework", "d.plugin", "e.obPlugin" })
            library.project(std::string(name) + "/Inner");
        library.project("p.app");
        library.project("q.apps/Inner");
    }) == "p q.apps");
}

TEST_CASE("plain files, pipes and links to folders that are no projects are ignored")
{
    CHECK(namesInLibrary([](SourceMachine& machine, LibraryBuilder& library) {
        library.file("file.mtrproject");
        library.file("CurrentVersion.mtrproject");
        machine.disk.pipe("home/Movies/Montaro Projects/pipe");
        library.link("folder link", machine.disk.folder("elsewhere/folder"));
        library.link("broken link", "/nowhere/at all");
        library.link("circle", "circle");
    }).empty());
}

TEST_CASE("a link to a project is a project of the link's name")
{
    CHECK(namesInLibrary([](SourceMachine& machine, LibraryBuilder& library) {
        LibraryBuilder(machine.disk.path("elsewhere")).project("Real");
        library.link("Linked", machine.disk.path("elsewhere/Real"));
    }) == "Linked");
}

TEST_CASE("any item of the marker's name makes a project, a link only when it leads somewhere")
{
    CHECK(namesInLibrary([](SourceMachine& machine, LibraryBuilder& library) {
        library.folder("a/CurrentVersion.mtrproject");
        library.folder("b");
        library.link("b/CurrentVersion.mtrproject", machine.disk.file("somewhere"));
        library.folder("c.app");
        library.link("c.app/CurrentVersion.mtrproject", "/nowhere/at all");
        library.folder("d.app");
        library.file("d.app/currentversion.mtrproject");
    }) == "a b");
}

TEST_CASE("a project is named without its last extension and never descended into")
{
    SourceMachine machine;
    machine.projects().project("Trip.2011.mtr");
    machine.projects().project("Trip.2011.mtr/Inner");
    const auto source = machine.makeSource();
    const OBMediaGroupList children = machine.load(*source).rootMediaGroup->childGroups();
    CHECK(children[0]->name() == "Trip.2011");
    CHECK(children[0]->childGroups().empty());
    CHECK(source->mediaGroups().size() == 2);
}

TEST_CASE("a full stop at the end of a project's name is no extension where it is the only one")
{
    CHECK(namesInLibrary([](SourceMachine&, LibraryBuilder& library) {
        library.project("a.");
        library.project("b.c.");
        library.project("d..");
    }) == "a. b.c d.");
}

TEST_CASE("a folder keeps its extension in its name")
{
    CHECK(namesInLibrary([](SourceMachine&, LibraryBuilder& library) { library.project("a.old/Inner"); }) == "a.old");
}

TEST_CASE("a folder that cannot be listed is an empty folder, and the rest is scanned")
{
    SourceMachine machine;
    machine.projects().project("Closed/Inner");
    machine.projects().project("Open/Inner");
    machine.files.whenListing = [](std::string_view folder) {
        return folder.ends_with("/Closed") ? FileProblem::notPermitted : FileProblem::none;
    };
    CHECK(loadedText(machine) == R"(
Folder Closed ID=PROJECTS/Closed parent=PROJECTS icon=projectIcon path=PROJECTS/Closed dated {}
Folder Open ID=PROJECTS/Open parent=PROJECTS icon=projectIcon path=PROJECTS/Open dated {}
  Project Inner ID=PROJECTS/Open/Inner parent=PROJECTS/Open icon=projectIcon path=PROJECTS/Open/Inner dated {}
----
Folder Closed ID=PROJECTS/Closed parent=PROJECTS/Closed icon=projectIcon path=PROJECTS/Closed dated {}
Project Inner ID=PROJECTS/Open/Inner parent=PROJECTS/Open icon=projectIcon path=PROJECTS/Open/Inner dated {}
)");
}

TEST_CASE("a folder called localized that cannot be listed is listed without that extension")
{
    SourceMachine machine;
    machine.projects().folder("Clips.localized").project("Clips/Trip");
    machine.projects().project("Clips/Sub/Inner");
    machine.projects().hiddenNames("", { "Clips" });
    machine.files.whenListing = [](std::string_view folder) {
        return folder.ends_with(".localized") ? FileProblem::notPermitted : FileProblem::none;
    };
    CHECK(loadedText(machine) == R"(
Folder Clips.localized ID=PROJECTS/Clips.localized parent=PROJECTS icon=projectIcon path=PROJECTS/Clips.localized dated {}
  Folder Sub ID=PROJECTS/Clips/Sub parent=PROJECTS/Clips.localized icon=projectIcon path=PROJECTS/Clips/Sub dated {}
    Project Inner ID=PROJECTS/Clips/Sub/Inner parent=PROJECTS/Clips/Sub icon=projectIcon path=PROJECTS/Clips/Sub/Inner dated {}
  Project Trip ID=PROJECTS/Clips/Trip parent=PROJECTS/Clips icon=projectIcon path=PROJECTS/Clips/Trip dated {}
----
Project Inner ID=PROJECTS/Clips/Sub/Inner parent=PROJECTS/Clips/Sub icon=projectIcon path=PROJECTS/Clips/Sub/Inner dated {}
Project Trip ID=PROJECTS/Clips/Trip parent=PROJECTS/Clips icon=projectIcon path=PROJECTS/Clips/Trip dated {}
)");
}

TEST_CASE("the placeholder of such a folder bears the path that was listed")
{
    SourceMachine machine;
    machine.projects().folder("Clips.localized");
    machine.files.whenListing = [](std::string_view folder) {
        return folder.ends_with(".localized") ? FileProblem::readError : FileProblem::none;
    };
    CHECK(loadedText(machine) == R"(
Folder Clips.localized ID=PROJECTS/Clips.localized parent=PROJECTS icon=projectIcon path=PROJECTS/Clips.localized dated {}
----
Folder Clips ID=PROJECTS/Clips parent=PROJECTS/Clips icon=projectIcon path=PROJECTS/Clips undated {}
)");
}

TEST_CASE("a folder called localized is not listed elsewhere when it can be listed, or is spelled otherwise")
{
    SourceMachine machine;
    machine.projects().folder("a.localized").folder("b.Localized").folder("c.localized.old");
    for (const char* other : { "a", "b", "c.localized", "c" })
        machine.projects().project(std::string(other) + "/Wrong");
    machine.projects().hiddenNames("", { "a", "b", "c", "c.localized" });
    machine.files.whenListing = [](std::string_view folder) {
        return folder.ends_with("/b.Localized") || folder.ends_with(".old") ? FileProblem::notPermitted
                                                                            : FileProblem::none;
    };
    const auto source = machine.makeSource();
    const OBMediaGroupRef root = machine.load(*source).rootMediaGroup;
    CHECK(childNames(*root) == "a.localized b.Localized c.localized.old Events");
    for (const OBMediaGroupRef& child : root->childGroups())
        CHECK(child->childGroups().empty());
}

TEST_CASE("modification dates are those of the folders, links followed, with their fractions")
{
    SourceMachine machine;
    LibraryBuilder(machine.disk.path("elsewhere")).project("Real");
    machine.projects().link("Linked", machine.disk.path("elsewhere/Real")).folder("Old");
    const platform::Date ofProject { 1'299'146'400, 123'456'789 };
    const platform::Date ofFolder { -86'400, 5 };
    setModificationDate(machine.disk.path("elsewhere/Real"), ofProject);
    setModificationDate(machine.projects().path("Old"), ofFolder);
    const auto source = machine.makeSource();
    const OBMediaGroupList children = machine.load(*source).rootMediaGroup->childGroups();
    CHECK(children[0]->modificationDate() == ofProject);
    CHECK(children[1]->modificationDate() == ofFolder);
}

TEST_CASE("projects with and without movies carry one and the same image")
{
    SourceMachine machine;
    machine.projects().project("A").movie("a.mov");
    machine.projects().project("B");
    const auto source = machine.makeSource();
    const OBMediaGroupList children = machine.load(*source).rootMediaGroup->childGroups();
    REQUIRE(children[0]->icon());
    CHECK(children[0]->icon() == children[1]->icon());
    CHECK(children[0]->mediaObjects()[0]->icon() == children[0]->icon());
}

TEST_CASE("a folder is a project exactly when an item of the marker's name exists in it")
{
    SourceMachine machine;
    const auto source = machine.makeSource();
    const std::string project = machine.projects().project("Trip").path();
    CHECK(source->_isMTProject(project));
    CHECK(source->_isMTProject(project + "/"));
    CHECK_FALSE(source->_isMTProject(machine.projects().path()));
    CHECK_FALSE(source->_isMTProject(project + "/CurrentVersion.mtrproject"));
    CHECK_FALSE(source->_isMTProject("/nowhere"));
    CHECK(source->_isMTProject(machine.projects().folder("x/CurrentVersion.mtrproject").path("x")));
    machine.projects().link("y/CurrentVersion.mtrproject", "/nowhere/at all");
    CHECK_FALSE(source->_isMTProject(machine.projects().path("y")));
}

TEST_CASE("folders nested deeper than a path can be end in a tree, and the path that is too long is logged once")
{
    SourceMachine machine;
    constexpr int levels = 2100;
    makeNestedFolders(machine.projects().path(), "d", levels);
    const auto source = machine.makeSource();
    machine.load(*source);
    int depth = 0;
    for (OBMediaGroupRef group = source->rootMediaGroup(); group && !group->childGroups().empty();
         group = group->childGroups()[0])
        ++depth;
    CHECK(depth > 1500);
    CHECK(depth < levels);
    machine.load(*source);
    const auto log = machine.takeLog();
    REQUIRE(log.size() == 1);
    CHECK(log[0].level == 2);
    CHECK(log[0].message.ends_with(": listed as empty: the path is too long for the system"));
}
