#include "host/OBPathWatcher.h"

#include "tests/host/TestHost.h"

#include <doctest/doctest.h>

#include <string>
#include <vector>

using namespace tests;
using Texts = std::vector<std::string>;

TEST_CASE("whoever follows changes is told when all paths are followed, and which are only looked at now and then")
{
    TestHost test;
    Journal told;
    OBPathWatcherObserver observer;
    ScriptedPathWatching& disk = test.machine.bare.pathWatching;
    OBPathWatcher& watcher = test.host().pathWatcher();
    const OBObservation following = test.host().followChanges({ .stands = [&] { told.write("stands"); },
        .failed = [&](const platform::WatchingProblem& problem) { told.write(problem.path); } });
    CHECK(watcher.pathsStand());
    watcher.watchPath_observer("/a", &observer);
    watcher.watchPath_observer("/b", &observer);
    disk.tellStanding("/a");
    CHECK_FALSE(watcher.pathsStand());
    CHECK(told.lines().empty());
    disk.tellStanding("/b");
    CHECK(watcher.pathsStand());
    CHECK(told.lines() == Texts { "stands" });
    disk.tellFailure("/a", { "/a/deep", "the limit is used up", "raise it" });
    CHECK(told.lines() == Texts { "stands", "/a/deep" });

    watcher.watchPath_observer("/c", &observer);
    CHECK_FALSE(watcher.pathsStand());
    watcher.removeObserver(&observer);
    CHECK(watcher.pathsStand());
    CHECK(told.lines() == Texts { "stands", "/a/deep" });
}
