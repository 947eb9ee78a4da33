#include "tests/host/TestHost.h"

#include <doctest/doctest.h>

#include <atomic>
#include <chrono>
#include <memory>
#include <string>
#include <thread>
#include <utility>
#include <vector>

using namespace tests;
using Lines = std::vector<std::string>;

TEST_CASE("a manager that nothing keeps is deallocated as its last reference is dropped")
{
    TestHost test;
    auto manager = test.manager();
    auto other = manager;
    manager = nullptr;
    CHECK(test.script->journal.lines() == Lines { "init" });
    other = nullptr;
    CHECK(test.script->journal.lines() == Lines { "init", "dealloc", "destroyed" });
}

TEST_CASE("dropping a manager waits for no load, and dealloc runs once, when the load has returned")
{
    TestHost test;
    test.script->gate.close();
    auto manager = test.manager();
    const Request request(*manager);
    CHECK(test.script->gate.waitForArrivals(1));
    manager = nullptr;
    CHECK(test.script->journal.count("returned") == 0);
    CHECK(test.script->journal.count("dealloc") == 0);
    CHECK(test.host().threadCount() == 1);
    test.script->gate.open();
    CHECK(test.host().waitForThreads(longestWait));
    CHECK(test.script->journal.lines()
        == Lines { "init", "canLoadData", "loadData", "performLoadData", "returned", "dealloc", "destroyed" });
}

TEST_CASE("a load that outlives its manager sees a cancel until it returns")
{
    TestHost test;
    test.script->gate.close();
    std::atomic<bool> pending { false };
    test.script->whenReturning = [&pending](ScriptedManager& manager) {
        pending = manager.isCancelLoadRequestPending();
        manager.cancelLoad();
        CHECK(manager.isCancelLoadRequestPending());
        return nullptr;
    };
    auto manager = test.manager();
    const Request request(*manager);
    CHECK(test.script->gate.waitForArrivals(1));
    manager = nullptr;
    test.script->gate.open();
    CHECK(test.host().waitForThreads(longestWait));
    CHECK(pending);
}

TEST_CASE("whoever waits for a tree is told at once that the manager has ended, and only once")
{
    TestHost test;
    test.script->gate.close();
    auto manager = test.manager();
    Application application;
    const Request atWork(*manager);
    const Request elsewhere(*manager, application.executor());
    CHECK(test.script->gate.waitForArrivals(1));
    manager->setNeedsReload(true);
    const Request next(*manager);
    manager = nullptr;
    CHECK(atWork.answer().outcome == OBLoadOutcome::ended);
    CHECK(atWork.answer().rootMediaGroup == nullptr);
    CHECK(next.answer().outcome == OBLoadOutcome::ended);
    CHECK_FALSE(elsewhere.isAnswered());
    CHECK(application.runWaiting() == 1);
    CHECK(elsewhere.answer().outcome == OBLoadOutcome::ended);
    test.script->gate.open();
    CHECK(test.host().waitForThreads(longestWait));
    CHECK(application.runWaiting() == 0);
    CHECK(test.script->loads == 1);
}

TEST_CASE("no callback comes once the manager has ended, though its load publishes and its observation stands")
{
    TestHost test;
    test.script->gate.close();
    auto manager = test.manager();
    Application application;
    std::atomic<int> calls { 0 };
    OBManagerCallbacks callbacks;
    callbacks.rootPublished = [&calls](const OBMediaGroupRef&) { ++calls; };
    callbacks.loadEnded = [&calls](const OBLoadResult&) { ++calls; };
    callbacks.progressed = [&calls](const OBLoadProgress&) { ++calls; };
    const OBObservation listening = manager->observe(application.executor(), callbacks);
    const OBObservation inTheThread = manager->observe(inPlace(), callbacks);
    const Request request(*manager);
    CHECK(test.script->gate.waitForArrivals(1));
    manager = nullptr;
    test.script->gate.open();
    CHECK(test.host().waitForThreads(longestWait));
    application.runWaiting();
    CHECK(calls == 0);
}

TEST_CASE("a call that was handed over before the manager ended is not made any more")
{
    TestHost test;
    auto manager = test.manager();
    Application application;
    int calls = 0;
    OBManagerCallbacks callbacks;
    callbacks.rootPublished = [&calls](const OBMediaGroupRef&) { ++calls; };
    const OBObservation listening = manager->observe(application.executor(), callbacks);
    Request(*manager).answer();
    CHECK(application.callsHandedOver() == 1);
    CHECK(test.host().waitForThreads(longestWait));
    manager = nullptr;
    application.runWaiting();
    CHECK(calls == 0);
}

TEST_CASE("a manager may be dropped inside its own callback, on the application's thread or on the load's")
{
    for (const bool onLoadThread : { false, true }) {
        CAPTURE(onLoadThread);
        TestHost test;
        auto manager = test.manager();
        OBMediaManager& alive = *manager;
        Application application;
        std::atomic<bool> dropped { false };
        OBManagerCallbacks callbacks;
        callbacks.rootPublished = [&](const OBMediaGroupRef&) {
            manager = nullptr;
            dropped = true;
        };
        const OBObservation listening
            = alive.observe(onLoadThread ? inPlace() : application.executor(), std::move(callbacks));
        const Request request(alive);
        const bool isDropped = onLoadThread || application.runUntil([&dropped] { return dropped.load(); });
        CHECK(isDropped);
        request.answer();
        CHECK(test.host().waitForThreads(longestWait));
        CHECK(dropped);
        CHECK(test.script->journal.count("dealloc") == 1);
        CHECK(test.script->journal.lines().back() == "destroyed");
    }
}

TEST_CASE("a manager may be dropped inside the answer to a request")
{
    TestHost test;
    auto manager = test.manager();
    OBMediaManager& alive = *manager;
    Event answered;
    alive.requestRootMediaGroup(inPlace(), [&](const OBLoadResult& result) {
        CHECK(result.outcome == OBLoadOutcome::loaded);
        manager = nullptr;
        answered.happen();
    });
    CHECK(answered.wait());
    CHECK(test.host().waitForThreads(longestWait));
    CHECK(test.script->journal.count("dealloc") == 1);
}

TEST_CASE("a manager ends once, and what is asked of it afterwards by its own load is answered as ended")
{
    TestHost test;
    test.script->gate.close();
    Event asked;
    OBLoadOutcome outcome = OBLoadOutcome::loaded;
    test.script->whenReturning = [&](ScriptedManager& manager) {
        manager.requestRootMediaGroup(inPlace(), [&](const OBLoadResult& result) {
            outcome = result.outcome;
            asked.happen();
        });
        std::thread([&manager] { manager.OBMediaManager::loadData(); }).join();
        manager.setAutoReloadEnabled(true);
        manager.setNeedsReload(true);
        const OBObservation listening = manager.observe(inPlace(), {});
        manager.end();
        return nullptr;
    };
    auto manager = test.manager();
    const Request request(*manager);
    CHECK(test.script->gate.waitForArrivals(1));
    manager = nullptr;
    test.script->gate.open();
    CHECK(asked.wait());
    CHECK(test.host().waitForThreads(longestWait));
    CHECK(outcome == OBLoadOutcome::ended);
    CHECK(test.script->journal.count("dealloc") == 1);
}

TEST_CASE("threads of a manager are counted and keep it alive until they end")
{
    TestHost test;
    auto manager = test.manager();
    Gate gate;
    gate.close();
    CHECK(manager->startThread("worker", [&gate] { gate.pass(); }));
    CHECK(manager->startThread("worker", [&gate] { gate.pass(); }));
    CHECK(gate.waitForArrivals(2));
    CHECK(test.host().threadCount() == 2);
    CHECK_FALSE(test.host().waitForThreads(std::chrono::nanoseconds(0)));
    manager = nullptr;
    CHECK(test.script->journal.count("dealloc") == 0);
    gate.open();
    CHECK(test.host().waitForThreads(longestWait));
    CHECK(test.host().threadCount() == 0);
    CHECK(test.script->journal.count("dealloc") == 1);
}

TEST_CASE("a thread that the system does not give is told, not counted, and runs nothing")
{
    TestHost test;
    const auto manager = test.manager();
    test.machine.threads.refuses = true;
    bool ran = false;
    CHECK_FALSE(manager->startThread("worker", [&ran] { ran = true; }));
    CHECK(test.host().threadCount() == 0);
    CHECK_FALSE(ran);
}

TEST_CASE("a manager whose init fails was never handed out and is not deallocated")
{
    TestHost test;
    test.script->whenInit = [](ScriptedManager&) { return false; };
    const OBManagerResult result = test.host().createManager(TestHost::identifier);
    CHECK(result.manager == nullptr);
    CHECK(test.script->journal.lines() == Lines { "init", "destroyed" });
}

TEST_CASE("init and dealloc dispatch to the source's own operations")
{
    TestHost test;
    bool inInit = false;
    test.script->whenInit = [&inInit](ScriptedManager& manager) {
        OBMediaManager& base = manager;
        inInit = base.canLoadData();
        return true;
    };
    test.manager();
    CHECK(inInit);
    CHECK(test.script->journal.lines() == Lines { "init", "canLoadData", "dealloc", "destroyed" });
}

TEST_CASE("a manager works on and ends after its host has been destroyed")
{
    TestHost test;
    test.script->gate.close();
    auto manager = test.manager();
    const Request request(*manager);
    CHECK(test.script->gate.waitForArrivals(1));
    test.destroyHost();
    CHECK(manager->isCancelLoadRequestPending() == false);
    test.script->gate.open();
    CHECK(request.answer().outcome == OBLoadOutcome::loaded);
    CHECK(manager->localizedString("key").isAbsent());
    manager = nullptr;
    CHECK(test.script->journal.waitFor("destroyed"));
}

TEST_CASE("managers of one class end apart from one another")
{
    TestHost test;
    auto first = test.manager();
    const auto second = test.manager();
    first = nullptr;
    CHECK(test.script->journal.count("dealloc") == 1);
    CHECK(Request(*second).answer().outcome == OBLoadOutcome::loaded);
}
