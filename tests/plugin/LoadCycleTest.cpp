#include "tests/plugin/support/RecordText.h"
#include "tests/plugin/support/SourceMachine.h"

#include <doctest/doctest.h>

#include <thread>

using namespace tests;

namespace {

bool areSame(const OBMediaGroupList& one, const OBMediaGroupList& other)
{
    return one.elements() == other.elements();
}

/// A tree with a group of each kind of child that the root may have, for the order of the flat list.
void makeNestedLibrary(const SourceMachine& machine)
{
    machine.projects().project("A");
    machine.projects().project("B folder/C");
    machine.projects().folder("D empty");
    machine.dateEverything();
}

} // namespace

TEST_CASE("a first load that finds nothing gives a root that holds only the empty event library")
{
    SourceMachine machine;
    const auto source = machine.makeSource();
    const OBLoadResult result = machine.load(*source);
    CHECK(result.outcome == OBLoadOutcome::loaded);
    CHECK(result.rootMediaGroup == source->rootMediaGroup());
    CHECK(machine.text(result.rootMediaGroup) == R"(
Root Montaro ID=Montaro parent=- icon=smallAppIcon path=- undated {}
  EventLibrary Events ID=Events parent=Montaro icon=eventIcon path=- undated {}
)");
}

TEST_CASE("the root's own objects are a fixed list")
{
    SourceMachine machine;
    machine.projects().project("Trip").movie("a.mov");
    machine.movies.headers["a.mov"] = {};
    const auto source = machine.makeSource();
    const OBMediaGroupRef root = machine.load(*source).rootMediaGroup;
    CHECK_FALSE(root->dynamicMediaObjects());
    CHECK(root->mediaObjects().empty());
    CHECK(root->childGroups()[0]->mediaObjects().size() == 1);
}

TEST_CASE("a load puts folders and projects of all libraries in scan order, unsorted, and the event library last")
{
    SourceMachine machine;
    machine.files.order = std::greater<>();
    for (const char* name : { "a", "C", "b folder/inner" })
        machine.projects().project(name);
    machine.bootProjects().project("A boot");
    const auto source = machine.makeSource();
    CHECK(childNames(*machine.load(*source).rootMediaGroup) == "b folder a C A boot Events");
}

TEST_CASE("every load builds a new tree and leaves the old one as it was")
{
    SourceMachine machine;
    machine.projects().project("Trip");
    const auto source = machine.makeSource();
    const OBMediaGroupRef first = machine.load(*source).rootMediaGroup;
    machine.projects().project("Walk");
    const OBMediaGroupRef second = machine.load(*source).rootMediaGroup;
    CHECK(first != second);
    CHECK(first->childGroups()[0] != second->childGroups()[0]);
    CHECK(childNames(*first) == "Trip Events");
    CHECK(childNames(*second) == "Trip Walk Events");
}

TEST_CASE("search paths are kept from the first load")
{
    SourceMachine machine;
    const auto source = machine.makeSource();
    machine.load(*source);
    machine.volumes.local.store({ { "/mnt/data", "Data" } });
    machine.volumeProjects("Data").project("Late");
    CHECK(childNames(*machine.load(*source).rootMediaGroup) == "Events");
    CHECK(machine.abbreviated(source->inspection()->projectSearchPaths())
        == std::vector<std::string> { "PROJECTS", "/Montaro Projects" });
}

TEST_CASE("a load may be started by its operation, which answers before the load has run")
{
    SourceMachine machine;
    machine.projects().project("Trip");
    const auto source = machine.makeSource();
    Stop stop;
    machine.files.whenListing = [&](std::string_view) {
        stop.stopHere();
        return platform::FileProblem::none;
    };
    source->loadData();
    CHECK(stop.waitUntilReached());
    CHECK_FALSE(source->firstTimeCallingLoadData());
    CHECK(source->rootMediaGroup() == nullptr);
    stop.release();
    machine.waitForThreads();
    CHECK(childNames(*source->rootMediaGroup()) == "Trip Events");
}

TEST_CASE("a load after the main thread has ended installs a tree whose movies have no thumbnails")
{
    SourceMachine machine;
    machine.projects().project("Trip").movie("a.mov");
    const auto source = machine.makeSource();
    machine.mainRunLoop.quit();
    const OBMediaGroupRef root = machine.load(*source).rootMediaGroup;
    CHECK(childNames(*root) == "Trip Events");
    CHECK(root->mediaObjects().empty());
    CHECK_FALSE(root->childGroups()[0]->mediaObjects()[0]->hasProducedThumbnail());
    CHECK(machine.movies.pathsRead.take().empty());
}

TEST_CASE("the flat list holds every project and a placeholder for every empty folder, in the order of the scan")
{
    SourceMachine machine;
    makeNestedLibrary(machine);
    const auto source = machine.makeSource();
    machine.load(*source);
    CHECK(machine.text(source->mediaGroups()) == R"(
Project A ID=PROJECTS/A parent=PROJECTS icon=projectIcon path=PROJECTS/A dated {}
Project C ID=PROJECTS/B folder/C parent=PROJECTS/B folder icon=projectIcon path=PROJECTS/B folder/C dated {}
Folder D empty ID=PROJECTS/D empty parent=PROJECTS/D empty icon=projectIcon path=PROJECTS/D empty dated {}
Folder Montaro Projects ID=/Montaro Projects parent=/Montaro Projects icon=projectIcon path=/Montaro Projects undated {}
)");
}

TEST_CASE("the flat list shares its projects with the tree, but not its placeholders")
{
    SourceMachine machine;
    makeNestedLibrary(machine);
    const auto source = machine.makeSource();
    const OBMediaGroupList children = machine.load(*source).rootMediaGroup->childGroups();
    const OBMediaGroupList groups = source->mediaGroups();
    CHECK(groups[0] == children[0]);
    CHECK(groups[1] == children[1]->childGroups()[0]);
    CHECK(groups[2] != children[2]);
}

TEST_CASE("the groups that hold movies are the groups that hold media")
{
    SourceMachine machine;
    makeNestedLibrary(machine);
    const auto source = machine.makeSource();
    machine.load(*source);
    CHECK(areSame(source->movieGroups(), source->mediaGroups()));
}

TEST_CASE("a flat list that was handed out does not change with the next scan")
{
    SourceMachine machine;
    makeNestedLibrary(machine);
    const auto source = machine.makeSource();
    machine.load(*source);
    const OBMediaGroupList before = source->mediaGroups();
    const std::string text = machine.text(before);
    machine.load(*source);
    CHECK(machine.text(before) == text);
    CHECK_FALSE(areSame(before, source->mediaGroups()));
}

TEST_CASE("during a scan the flat list holds what has been found so far")
{
    SourceMachine machine;
    makeNestedLibrary(machine);
    const auto source = machine.makeSource();
    machine.load(*source);

    Stop stop;
    machine.files.whenListing = [&](std::string_view folder) {
        if (folder.ends_with("/B folder"))
            stop.stopHere();
        return platform::FileProblem::none;
    };
    std::thread second([&] { machine.load(*source); });
    REQUIRE(stop.waitUntilReached());
    CHECK(machine.text(source->mediaGroups()) == R"(
Project A ID=PROJECTS/A parent=PROJECTS icon=projectIcon path=PROJECTS/A dated {}
)");
    CHECK(childNames(*source->rootMediaGroup()) == "A B folder D empty Events");
    stop.release();
    second.join();
    CHECK(source->mediaGroups().size() == 4);
}

TEST_CASE("a project is in the flat list before its movies are known")
{
    SourceMachine machine;
    machine.projects().project("Trip").movie("a.mov");
    const auto source = machine.makeSource();
    Stop stop;
    machine.files.whenListing = [&](std::string_view folder) {
        if (folder.ends_with("/Shared Items"))
            stop.stopHere();
        return platform::FileProblem::none;
    };
    std::thread load([&] { machine.load(*source); });
    REQUIRE(stop.waitUntilReached());
    const OBMediaGroupList groups = source->mediaGroups();
    CHECK(groups.size() == 1);
    CHECK(groups[0]->name() == "Trip");
    CHECK(groups[0]->ownMediaObjects().empty());
    stop.release();
    load.join();
    CHECK(groups[0]->ownMediaObjects().size() == 1);
}

TEST_CASE("each movie is read once a load, on the main thread, inner folders first, and no other file is opened")
{
    SourceMachine machine;
    machine.projects().project("A").movie("a.mov").movie("b.mov");
    machine.projects().project("Folder/Inner/B").movie("c.mov");
    const auto source = machine.makeSource();
    std::atomic<int> onOtherThreads { 0 };
    machine.movies.whenRead = [&](std::string_view) { onOtherThreads += machine.mainRunLoop.isMainThread() ? 0 : 1; };
    Trace opened;
    machine.files.whenOpening = [&](std::string_view path) {
        opened.add(std::string(path));
        return platform::FileProblem::none;
    };
    machine.load(*source);
    const std::vector<std::string> movies { "PROJECTS/Folder/Inner/B/Shared Items/c.mov",
        "PROJECTS/A/Shared Items/a.mov", "PROJECTS/A/Shared Items/b.mov" };
    CHECK(machine.abbreviated(machine.movies.pathsRead.take()) == movies);
    CHECK(machine.abbreviated(opened.take()) == movies);
    CHECK(onOtherThreads == 0);
}
