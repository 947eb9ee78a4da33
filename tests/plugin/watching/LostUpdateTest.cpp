#include "tests/plugin/watching/FollowedSource.h"

#include "tests/plugin/support/Stop.h"

#include <doctest/doctest.h>

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
    FollowedSource test;
    Stop stop;
    // Both halves' locks let only one scan of a half list at a time: the later one waits behind the earlier.
    stopAtListing(test, stop, test.projectsFolder());
    std::thread earlier([&] { test.source->_reloadMontaroProjects(); });
    CHECK(stop.waitUntilReached());
    test.projects().project("Second");
    std::thread later([&] { test.source->_reloadMontaroProjects(); });
    stop.release();
    earlier.join();
    later.join();
    CHECK(childNames(*test.source->rootMediaGroup()) == "First Second Events");
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
    FollowedSource test;
    Stop stop;
    // The reload has scanned and is about to look at the root's children.
    test.workspace.whenAsked = [] {};
    stopAtListing(test, stop, "/Montaro Events");
    test.clip("Gone", "g.mov", noonOf(2013));
    std::thread reload([&] { test.source->_reloadMontaroEvents(); });
    CHECK(stop.waitUntilReached());
    removeItem(test.eventsFolder() + "/Gone");
    std::thread load([&] { test.load(*test.source); });
    stop.release();
    reload.join();
    load.join();
    CHECK(test.eventNames() == "Trip");
}
