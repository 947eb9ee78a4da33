#include "tests/plugin/support/SourceMachine.h"

#include <doctest/doctest.h>

#include <thread>

using namespace tests;
using Lines = std::vector<std::string>;

namespace {

thread_local bool isSecondThread = false;

/// Notes what each of two threads lists.
void traceListings(SourceMachine& machine, Trace& listed)
{
    machine.files.whenListing = [&](std::string_view folder) {
        listed.add((isSecondThread ? "second " : "first ") + machine.abbreviated(std::string(folder)));
        return platform::FileProblem::none;
    };
}

/// Waits until a scan has begun, which empties the flat list before it waits for anything, and then gives it the
/// chance to go on where it should not.
void waitForEmptyList(OBMontaroPlugin& source)
{
    CHECK(waitUntil([&] { return source.mediaGroups().empty(); }));
    giveOthersTheirTurn();
}

/// All that takes one of the locks other than the one of the project search paths.
void useOtherLocks(OBMontaroPlugin& source)
{
    source._prepareMontaroEventsSearchPaths();
    CHECK(source._reloadMontaroEvents_updateRootMediaGroup("Montaro", false) != nullptr);
    source._checkMontaroPreferences();
    CHECK(source.rootMediaGroupIcon() != nullptr);
}

} // namespace

TEST_CASE("a scan waits until the whole walk of another has ended, representatives included")
{
    SourceMachine machine;
    machine.projects().project("F/A").movie("a.mov");
    machine.projects().folder("Z");
    const auto source = machine.makeSource();
    machine.load(*source);

    Stop stop;
    Trace listed;
    traceListings(machine, listed);
    machine.movies.whenRead = [&](std::string_view) { stop.stopHere(); };
    std::thread first([&] { source->_reloadMontaroProjects(false); });
    REQUIRE(stop.waitUntilReached());
    CHECK(source->mediaGroups().size() == 1);
    std::thread second([&] {
        isSecondThread = true;
        source->_reloadMontaroProjects(false);
    });
    waitForEmptyList(*source);
    stop.release();
    first.join();
    second.join();
    const auto walk = [](const std::string& thread) {
        return Lines { thread + " PROJECTS", thread + " PROJECTS/F", thread + " PROJECTS/F/A/Shared Items",
            thread + " PROJECTS/Z", thread + " /Montaro Projects" };
    };
    Lines expected = walk("first");
    for (const std::string& line : walk("second"))
        expected.push_back(line);
    CHECK(listed.take() == expected);
}

TEST_CASE("while the project search paths are being built a scan waits, and others see the old list whole")
{
    SourceMachine machine;
    machine.projects().project("A");
    const auto source = machine.makeSource();
    machine.load(*source);

    Stop stop;
    Trace listed;
    traceListings(machine, listed);
    machine.volumes.local.store({ { "/Volumes/Data", "Data" } });
    machine.volumes.whenListed = [&] { stop.stopHere(); };
    std::thread first([&] { source->_prepareMontaroProjectsSearchPaths(); });
    REQUIRE(stop.waitUntilReached());
    CHECK(machine.abbreviated(source->inspection()->projectSearchPaths()) == Lines { "PROJECTS", "/Montaro Projects" });
    std::thread second([&] { source->_reloadMontaroProjects(false); });
    waitForEmptyList(*source);
    CHECK(listed.take().empty());
    stop.release();
    first.join();
    second.join();
    CHECK(listed.take()
        == Lines { "first PROJECTS", "first PROJECTS/A/Shared Items", "first /Volumes/Data/Montaro Projects",
            "first /Montaro Projects" });
}

TEST_CASE("during a projects scan events, preferences and the root icon can be had, so no two locks are held at once")
{
    SourceMachine machine;
    machine.projects().project("A");
    const auto source = machine.makeSource();
    machine.load(*source);
    Stop stop;
    machine.files.whenListing = [&](std::string_view) {
        stop.stopHere();
        return platform::FileProblem::none;
    };
    std::thread scan([&] { source->_reloadMontaroProjects(true); });
    REQUIRE(stop.waitUntilReached());
    useOtherLocks(*source);
    stop.release();
    scan.join();
}

TEST_CASE("while the event search paths are being built projects, preferences and the root icon can be had")
{
    SourceMachine machine;
    machine.projects().project("A");
    const auto source = machine.makeSource();
    machine.load(*source);
    Stop stop;
    machine.volumes.whenListed = [&] { stop.stopHere(); };
    std::thread preparation([&] { source->_prepareMontaroEventsSearchPaths(); });
    REQUIRE(stop.waitUntilReached());
    source->_prepareMontaroProjectsSearchPaths();
    CHECK(source->_reloadMontaroProjects(false).size() == 1);
    source->_checkMontaroPreferences();
    CHECK(source->rootMediaGroupIcon() != nullptr);
    stop.release();
    preparation.join();
}

TEST_CASE("while the preferences are being read projects, events and the root icon can be had")
{
    SourceMachine machine;
    machine.projects().project("A");
    const auto source = machine.makeSource();
    machine.load(*source);
    Stop stop;
    machine.preferences.whenRead = [&] { stop.stopHere(); };
    std::thread reading([&] { source->_checkMontaroPreferences(); });
    REQUIRE(stop.waitUntilReached());
    source->_prepareMontaroProjectsSearchPaths();
    source->_prepareMontaroEventsSearchPaths();
    CHECK(source->_reloadMontaroProjects(true).size() == 1);
    CHECK(source->rootMediaGroupIcon() != nullptr);
    stop.release();
    reading.join();
}

TEST_CASE("while the root icon is being looked up projects, events and preferences can be had")
{
    SourceMachine machine;
    machine.projects().project("A");
    machine.bundles.hasPictures.store(false);
    const auto source = machine.makeSource();
    machine.load(*source);
    Stop stop;
    machine.workspace.whenAsked = [&] { stop.stopHere(); };
    std::thread lookUp([&] { source->rootMediaGroupIcon(); });
    REQUIRE(stop.waitUntilReached());
    source->_prepareMontaroProjectsSearchPaths();
    source->_prepareMontaroEventsSearchPaths();
    source->_checkMontaroPreferences();
    CHECK(source->_reloadMontaroProjects(true).size() == 1);
    stop.release();
    lookUp.join();
}

TEST_CASE("the root icon may be asked for again by whoever is asked while it is looked up")
{
    SourceMachine machine;
    machine.bundles.hasPictures.store(false);
    const auto source = machine.makeSource();
    int depth = 0;
    machine.workspace.whenAsked = [&] {
        if (++depth < 3)
            source->rootMediaGroupIcon();
    };
    CHECK(source->rootMediaGroupIcon() == nullptr);
    CHECK(depth == 3);
}
