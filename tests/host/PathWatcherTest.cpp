#include "host/OBPathWatcher.h"

#include "host/OBConstants.h"
#include "tests/host/TestHost.h"

#include <doctest/doctest.h>

#include <string>
#include <thread>
#include <vector>

using namespace tests;
using Paths = std::vector<std::string>;

namespace {

class Listener : public OBPathWatcherObserver { };

} // namespace

TEST_CASE("there is one path watcher while there is a host, and none without")
{
    CHECK(OBPathWatcher::sharedPathWatcher() == nullptr);
    TestHost test;
    CHECK(OBPathWatcher::sharedPathWatcher() == nullptr);
    test.host();
    CHECK(OBPathWatcher::sharedPathWatcher().get() == &test.host().pathWatcher());
    test.endHost();
    CHECK(OBPathWatcher::sharedPathWatcher() == nullptr);
}

TEST_CASE("a watch is unique by its observer and the exact spelling of its path")
{
    OBPathWatcher watcher;
    Listener first;
    Listener second;
    CHECK(watcher.watchPathIsUnique_observer("/movies", &first));
    watcher.watchPath_observer("/movies", &first);
    CHECK_FALSE(watcher.watchPathIsUnique_observer("/movies", &first));
    CHECK(watcher.watchPathIsUnique_observer("/movies", &second));
    CHECK(watcher.watchPathIsUnique_observer("/movies/", &first));
    CHECK(watcher.watchPathIsUnique_observer("/Movies", &first));
    CHECK(watcher.watchPathIsUnique_observer("/movie", &first));
    CHECK(watcher.watchPathIsUnique_observer("/movies/a", &first));
    CHECK(watcher.watchPathIsUnique_observer("", &first));
}

TEST_CASE("asking whether a watch is unique registers nothing")
{
    OBPathWatcher watcher;
    const Listener listener;
    CHECK(watcher.watchPathIsUnique_observer("/movies", &listener));
    CHECK(watcher.watchPathIsUnique_observer("/movies", &listener));
    CHECK(watcher.pathsWatchedBy(&listener).empty());
    CHECK(watcher.queriesWatchedBy(&listener).empty());
}

TEST_CASE("watched paths are listed once each, in the order of registration, though nothing is there")
{
    OBPathWatcher watcher;
    Listener listener;
    watcher.watchPath_observer("/b/nothing", &listener);
    watcher.watchPath_observer("/a", &listener);
    watcher.watchPath_observer("/b/nothing", &listener);
    CHECK(watcher.pathsWatchedBy(&listener) == Paths { "/b/nothing", "/a" });
}

TEST_CASE("registering a query again replaces its scope, and other queries stay")
{
    OBPathWatcher watcher;
    Listener listener;
    Listener other;
    watcher.watchQuery_observer_queryScope_queryRunMode("projects", &listener, { "/a", "/b" }, OBQueryRunModeLive);
    watcher.watchQuery_observer_queryScope_queryRunMode("movies", &listener, { "/m" }, OBQueryRunModeLive);
    watcher.watchQuery_observer_queryScope_queryRunMode("projects", &other, { "/o" }, OBQueryRunModeLive);
    watcher.watchQuery_observer_queryScope_queryRunMode("projects", &listener, { "/c" }, 1);
    const auto queries = watcher.queriesWatchedBy(&listener);
    REQUIRE(queries.size() == 2);
    CHECK(queries[0].text == "projects");
    CHECK(queries[0].scope == Paths { "/c" });
    CHECK(queries[0].runMode == 1);
    CHECK(queries[1].text == "movies");
    CHECK(queries[1].scope == Paths { "/m" });
    CHECK(queries[1].runMode == 4);
    CHECK(watcher.queriesWatchedBy(&other)[0].scope == Paths { "/o" });
    CHECK(watcher.pathsWatchedBy(&listener).empty());
}

TEST_CASE("the scope of a query is taken as it stood at registration")
{
    OBPathWatcher watcher;
    Listener listener;
    Paths scope { "/a" };
    watcher.watchQuery_observer_queryScope_queryRunMode("movies", &listener, scope, OBQueryRunModeLive);
    scope.emplace_back("/b");
    CHECK(watcher.queriesWatchedBy(&listener)[0].scope == Paths { "/a" });
}

TEST_CASE("taking an observer back takes all of its registrations, and no one else's")
{
    OBPathWatcher watcher;
    Listener first;
    Listener second;
    watcher.watchPath_observer("/a", &first);
    watcher.watchPath_observer("/a", &second);
    watcher.watchQuery_observer_queryScope_queryRunMode("movies", &first, {}, OBQueryRunModeLive);
    watcher.removeObserver(&first);
    CHECK(watcher.pathsWatchedBy(&first).empty());
    CHECK(watcher.queriesWatchedBy(&first).empty());
    CHECK(watcher.watchPathIsUnique_observer("/a", &first));
    CHECK(watcher.pathsWatchedBy(&second) == Paths { "/a" });
    watcher.removeObserver(&first);
}

TEST_CASE("the registrations of a manager that has ended are gone, also while its load still runs")
{
    TestHost test;
    test.script->gate.close();
    auto manager = test.manager();
    const OBMediaManager* key = manager.get();
    OBPathWatcher& watcher = test.host().pathWatcher();
    watcher.watchPath_observer("/a", manager.get());
    watcher.watchQuery_observer_queryScope_queryRunMode("movies", manager.get(), { "/a" }, OBQueryRunModeLive);
    const Request request(*manager);
    CHECK(test.script->gate.waitForArrivals(1));
    manager = nullptr;
    CHECK(watcher.pathsWatchedBy(key).empty());
    CHECK(watcher.queriesWatchedBy(key).empty());
}

TEST_CASE("what a manager registers after it has ended is gone when it is")
{
    TestHost test;
    OBPathWatcher* watcher = &test.host().pathWatcher();
    test.script->gate.close();
    test.script->whenReturning = [watcher](ScriptedManager& manager) -> OBMediaGroupRef {
        watcher->watchPath_observer("/late", &manager);
        watcher->watchQuery_observer_queryScope_queryRunMode("late", &manager, {}, OBQueryRunModeLive);
        return nullptr;
    };
    auto manager = test.manager();
    const OBMediaManager* key = manager.get();
    const Request request(*manager);
    CHECK(test.script->gate.waitForArrivals(1));
    manager = nullptr;
    test.script->gate.open();
    CHECK(test.host().waitForThreads(longestWait));
    CHECK(watcher->pathsWatchedBy(key).empty());
    CHECK(watcher->queriesWatchedBy(key).empty());
}

TEST_CASE("what a manager registers before its init fails is gone")
{
    TestHost test;
    const OBPathWatcherObserver* key = nullptr;
    OBPathWatcher* watcher = &test.host().pathWatcher();
    test.script->whenInit = [&key, watcher](ScriptedManager& manager) {
        key = &manager;
        watcher->watchPath_observer("/early", &manager);
        return false;
    };
    CHECK(test.host().createManager(TestHost::identifier).manager == nullptr);
    CHECK(watcher->pathsWatchedBy(key).empty());
}

TEST_CASE("many threads may register with the path watcher at once")
{
    OBPathWatcher watcher;
    Listener listener;
    std::vector<std::thread> threads;
    threads.reserve(4);
    for (int number = 0; number < 4; ++number) {
        threads.emplace_back([&watcher, &listener, number] {
            for (int index = 0; index < 100; ++index) {
                watcher.watchPath_observer("/common/" + std::to_string(index), &listener);
                watcher.watchPath_observer("/own/" + std::to_string(number), &listener);
                watcher.watchPathIsUnique_observer("/common/1", &listener);
            }
        });
    }
    for (std::thread& thread : threads)
        thread.join();
    CHECK(watcher.pathsWatchedBy(&listener).size() == 104);
}
