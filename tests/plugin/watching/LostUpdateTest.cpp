#include "tests/plugin/watching/FollowedSource.h"

#include "tests/plugin/support/Stop.h"

#include <doctest/doctest.h>

#include <stdexcept>

using namespace tests;
using Lines = std::vector<std::string>;

namespace {

/// Stops the first listing of a folder, and tells by what it then finds which scan came there.
void stopAtListing(FollowedSource& test, Stop& stop, const std::string& folder)
{
    test.files.whenListing = [&stop, folder](std::string_view listed) {
        if (listed == folder)
            stop.stopHere();
        return platform::FileProblem::none;
    };
}

/// A source whose tree has become empty.
struct EmptyTree : FollowedSource {
    EmptyTree()
    {
        removeItem(projectsFolder());
        removeItem(eventsFolder());
        source->_reloadMontaroEvents();
        source->_reloadMontaroProjects();
        CHECK(childNames(*source->rootMediaGroup()) == "");
    }
};

} // namespace

TEST_CASE("a reload that ends while a load runs is not undone by the load's tree")
{
    FollowedSource test;
    Stop stop;
    // The load has scanned the projects and comes to the events.
    stopAtListing(test, stop, test.eventsFolder());
    std::thread load([&] { test.load(*test.source); });
    CHECK(stop.waitUntilReached());
    test.projects().project("Second");
    test.source->_reloadMontaroProjects();
    CHECK(childNames(*test.source->rootMediaGroup()) == "First Second Events");
    stop.release();
    load.join();
    CHECK(childNames(*test.source->rootMediaGroup()) == "First Second Events");
}

TEST_CASE("of two scans of one half that overlap, what the one found that began later stays")
{
    EmptyTree test;
    // The earlier scan found nothing, and asks whether the editor is there before it says so in the tree.
    Stop stop;
    test.workspace.whenAsked = [&stop] { stop.stopHere(); };
    std::thread earlier([&] { test.source->_reloadMontaroProjects(); });
    CHECK(stop.waitUntilReached());
    test.projects().project("Second");
    test.source->_reloadMontaroProjects();
    CHECK(childNames(*test.source->rootMediaGroup()) == "Second");
    stop.release();
    earlier.join();
    CHECK(childNames(*test.source->rootMediaGroup()) == "Second");
}

TEST_CASE("two halves that end at the same moment both stay")
{
    for (int round = 0; round < 20; ++round) {
        FollowedSource test;
        test.projects().project("Second");
        test.clip("Walk", "b.mov", noonOf(2013));
        std::thread projects([&] { test.source->_reloadMontaroProjects(); });
        std::thread events([&] { test.source->_reloadMontaroEvents(); });
        projects.join();
        events.join();
        CHECK(childNames(*test.source->rootMediaGroup()) == "First Second Events");
        CHECK(test.eventNames() == "Walk Trip");
        CHECK(objectNames(test.source->rootMediaGroup()->mediaObjects()) == "b a");
    }
}

TEST_CASE("a tree that another has replaced is not published again")
{
    FollowedSource test;
    const OBMediaGroupRef former = test.source->rootMediaGroup();
    test.load(*test.source);
    const OBMediaGroupRef installed = test.source->rootMediaGroup();
    REQUIRE(installed != former);
    CHECK_FALSE(test.source->setRootMediaGroup(former));
    CHECK(test.source->rootMediaGroup() == installed);
    CHECK(test.source->setRootMediaGroup(installed));
}

TEST_CASE("a reload that began before a load, and ends after it, changes nothing in the load's tree")
{
    EmptyTree test;
    Stop stop;
    test.workspace.whenAsked = [&stop] { stop.stopHere(); };
    std::thread reload([&] { test.source->_reloadMontaroProjects(); });
    CHECK(stop.waitUntilReached());
    test.projects().project("Second");
    test.load(*test.source);
    const OBMediaGroupRef installed = test.source->rootMediaGroup();
    CHECK(childNames(*installed) == "Second Events");
    stop.release();
    reload.join();
    CHECK(test.source->rootMediaGroup() == installed);
    CHECK(childNames(*installed) == "Second Events");
}

TEST_CASE("a scan whose reload fails by an error ends its work, and the source goes on")
{
    FollowedSource test;
    test.files.onEachCall = [](std::string_view) { throw std::runtime_error("the disk is on fire"); };
    CHECK_THROWS_AS(
        test.source->performReload("events", [&] { test.source->_reloadMontaroEvents(); }), std::runtime_error);
    test.files.onEachCall = nullptr;
    test.source->cancelLoad();
    CHECK_FALSE(test.source->isCancelLoadRequestPending());
    CHECK(test.load(*test.source).outcome == OBLoadOutcome::loaded);
}
