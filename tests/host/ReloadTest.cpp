#include "tests/host/TestHost.h"

#include <doctest/doctest.h>

#include <thread>

using namespace tests;

namespace {

/// Watches for trees by itself, without asking for one.
OBObservation listenTo(OBMediaManager& manager)
{
    return manager.observe(inPlace(), {});
}

} // namespace

TEST_CASE("a needed reload happens by itself where that is enabled and an application listens")
{
    TestHost test;
    const auto manager = test.manager();
    manager->setAutoReloadEnabled(true);
    const OBObservation listening = listenTo(*manager);
    CHECK(test.host().threadCount() == 0);
    manager->setNeedsReload(true);
    CHECK(test.script->journal.waitFor("returned"));
    CHECK(test.host().waitForThreads(longestWait));
    CHECK(test.script->loads == 1);
}

TEST_CASE("whichever of the three conditions comes last starts the reload")
{
    for (int last = 0; last < 3; ++last) {
        CAPTURE(last);
        TestHost test;
        const auto manager = test.manager();
        OBObservation listening;
        for (int step = 1; step <= 3; ++step) {
            CHECK(test.host().threadCount() == 0);
            const int condition = (last + step) % 3;
            if (condition == 0)
                manager->setNeedsReload(true);
            else if (condition == 1)
                manager->setAutoReloadEnabled(true);
            else
                listening = listenTo(*manager);
        }
        CHECK(test.script->journal.waitFor("returned"));
    }
}

TEST_CASE("a reload does not happen by itself without a listener, or where that is not enabled")
{
    TestHost test;
    const auto manager = test.manager();
    manager->setAutoReloadEnabled(true);
    manager->setNeedsReload(true);
    CHECK(test.host().threadCount() == 0);
    manager->setAutoReloadEnabled(false);
    const OBObservation listening = listenTo(*manager);
    manager->setNeedsReload(true);
    CHECK(test.host().threadCount() == 0);
    CHECK(test.script->loads == 0);
}

TEST_CASE("a reload does not happen by itself once the only listener has gone")
{
    TestHost test;
    const auto manager = test.manager();
    manager->setAutoReloadEnabled(true);
    {
        const OBObservation listening = listenTo(*manager);
    }
    manager->setNeedsReload(true);
    CHECK(test.host().waitForThreads(longestWait));
    CHECK(test.script->loads == 0);
}

TEST_CASE("a reload that is no longer needed does not happen")
{
    TestHost test;
    const auto manager = test.manager();
    const OBObservation listening = listenTo(*manager);
    manager->setNeedsReload(true);
    manager->setNeedsReload(false);
    manager->setAutoReloadEnabled(true);
    CHECK(test.host().threadCount() == 0);
    CHECK(test.script->loads == 0);
}

TEST_CASE("a source that needs a load since its making is loaded when somebody listens, not before")
{
    TestHost test;
    test.script->whenInit = [](ScriptedManager& manager) {
        manager.setNeedsReload(true);
        manager.setAutoReloadEnabled(true);
        return true;
    };
    const auto manager = test.manager();
    CHECK(test.host().threadCount() == 0);
    const OBObservation listening = listenTo(*manager);
    CHECK(test.script->journal.waitFor("returned"));
}

TEST_CASE("a source that listens to itself while it is made is not loaded before it was handed out")
{
    TestHost test;
    OBObservation listening;
    test.script->whenInit = [&listening](ScriptedManager& manager) {
        listening = manager.observe(inPlace(), {});
        manager.setAutoReloadEnabled(true);
        manager.setNeedsReload(true);
        return true;
    };
    const auto manager = test.manager();
    CHECK(test.script->loads == 0);
    listening = {};
}

TEST_CASE("a source that calls loadData while it is made is not loaded before it was handed out")
{
    TestHost test;
    bool threadBeforeHandedOut = false;
    test.script->whenInit = [&](ScriptedManager& manager) {
        manager.loadData();
        threadBeforeHandedOut = !test.machine.threads.started().empty();
        return true;
    };
    const auto manager = test.manager();
    CHECK_FALSE(threadBeforeHandedOut);
}

TEST_CASE("a thousand calls for a reload during a load give exactly one more load")
{
    TestHost test;
    test.script->gate.close();
    const auto manager = test.manager();
    manager->setAutoReloadEnabled(true);
    const OBObservation listening = listenTo(*manager);
    const Request request(*manager);
    CHECK(test.script->gate.waitForArrivals(1));
    std::thread other([&manager] {
        for (int call = 0; call < 500; ++call)
            manager->setNeedsReload(true);
    });
    for (int call = 0; call < 500; ++call)
        manager->setNeedsReload(true);
    other.join();
    test.script->gate.open();
    request.answer();
    CHECK(test.host().waitForThreads(longestWait));
    CHECK(test.script->loads == 2);
    CHECK(test.machine.threads.started().size() == 1);
}

TEST_CASE("a reload that is asked for during its own load runs after it")
{
    TestHost test;
    test.script->whenPerforming = [&](ScriptedManager& manager) {
        if (test.script->loads == 1)
            manager.setNeedsReload(true);
    };
    const auto manager = test.manager();
    manager->setAutoReloadEnabled(true);
    const OBObservation listening = listenTo(*manager);
    manager->setNeedsReload(true);
    CHECK(test.script->journal.waitFor("returned", 2));
    CHECK(test.host().waitForThreads(longestWait));
    CHECK(test.script->loads == 2);
}
