#include "tests/host/TestHost.h"

#include <doctest/doctest.h>

#include <atomic>
#include <string>
#include <thread>
#include <vector>

using namespace tests;

namespace {

std::string nameOf(const OBMediaGroupRef& group)
{
    return group ? group->name().string() : "none";
}

} // namespace

TEST_CASE("a cancel is void when nothing is at work")
{
    TestHost test;
    const auto manager = test.manager();
    manager->cancelLoad();
    CHECK_FALSE(manager->isCancelLoadRequestPending());
    CHECK(Request(*manager).answer().outcome == OBLoadOutcome::loaded);
    CHECK(test.host().waitForThreads(longestWait));
    manager->cancelLoad();
    CHECK_FALSE(manager->isCancelLoadRequestPending());
    manager->setNeedsReload(true);
    CHECK(Request(*manager).answer().outcome == OBLoadOutcome::loaded);
}

TEST_CASE("a cancel is pending on every thread until the load at work has ended")
{
    TestHost test;
    test.script->gate.close();
    std::atomic<bool> seenByLoad { false };
    test.script->whenReturning = [&seenByLoad](ScriptedManager& manager) {
        seenByLoad = manager.isCancelLoadRequestPending();
        return OBMediaGroup::initWithTypeIdentifier(OBMontaroRootGroupTypeIdentifier);
    };
    const auto manager = test.manager();
    const Request request(*manager);
    CHECK(test.script->gate.waitForArrivals(1));
    CHECK_FALSE(manager->isCancelLoadRequestPending());
    manager->cancelLoad();
    CHECK(manager->isCancelLoadRequestPending());
    bool onAnother = false;
    std::thread([&] { onAnother = manager->isCancelLoadRequestPending(); }).join();
    CHECK(onAnother);
    bool onMain = false;
    CHECK(test.machine.mainRunLoop.performAndWait([&] { onMain = manager->isCancelLoadRequestPending(); }));
    CHECK(onMain);
    test.script->gate.open();
    request.answer();
    CHECK(seenByLoad);
    CHECK(test.host().waitForThreads(longestWait));
    CHECK_FALSE(manager->isCancelLoadRequestPending());
}

TEST_CASE("a cancelled load is told as such, with the tree of what it had gathered")
{
    TestHost test;
    test.script->gate.close();
    const auto manager = test.manager();
    const Request first(*manager);
    const Request second(*manager);
    CHECK(test.script->gate.waitForArrivals(1));
    manager->cancelLoad();
    manager->cancelLoad();
    test.script->gate.open();
    CHECK(first.answer().outcome == OBLoadOutcome::cancelled);
    CHECK(nameOf(first.answer().rootMediaGroup) == "load 1");
    CHECK(second.answer().outcome == OBLoadOutcome::cancelled);
    CHECK_FALSE(manager->isCancelLoadRequestPending());
}

TEST_CASE("asked again after a cancel, a source loads again, and by itself it does not")
{
    TestHost test;
    test.script->gate.close();
    const auto manager = test.manager();
    manager->setAutoReloadEnabled(true);
    const OBObservation listening = manager->observe(inPlace(), {});
    const Request first(*manager);
    CHECK(test.script->gate.waitForArrivals(1));
    manager->cancelLoad();
    test.script->gate.open();
    first.answer();
    CHECK(test.host().waitForThreads(longestWait));
    CHECK(test.script->loads == 1);
    const OBLoadResult again = Request(*manager).answer();
    CHECK(again.outcome == OBLoadOutcome::loaded);
    CHECK(nameOf(again.rootMediaGroup) == "load 2");
    CHECK(Request(*manager).answer().rootMediaGroup == again.rootMediaGroup);
}

TEST_CASE("a load asked for while a cancel is pending starts afterwards and is not cancelled")
{
    TestHost test;
    test.script->gate.close();
    std::vector<bool> pending;
    test.script->whenPerforming
        = [&pending](ScriptedManager& manager) { pending.push_back(manager.isCancelLoadRequestPending()); };
    const auto manager = test.manager();
    const Request cancelled(*manager);
    CHECK(test.script->gate.waitForArrivals(1));
    manager->cancelLoad();
    const Request next(*manager);
    const Request joining(*manager);
    CHECK(test.script->loads == 1);
    test.script->gate.letOneThrough();
    CHECK(cancelled.answer().outcome == OBLoadOutcome::cancelled);
    CHECK(test.script->gate.waitForArrivals(2));
    CHECK_FALSE(manager->isCancelLoadRequestPending());
    CHECK_FALSE(next.isAnswered());
    test.script->gate.open();
    CHECK(next.answer().outcome == OBLoadOutcome::loaded);
    CHECK(nameOf(next.answer().rootMediaGroup) == "load 2");
    CHECK(joining.answer().rootMediaGroup == next.answer().rootMediaGroup);
    CHECK(test.host().waitForThreads(longestWait));
    CHECK(test.script->loads == 2);
    CHECK(pending == std::vector<bool> { false, false });
}

TEST_CASE("a load asked for after a cancel is not cancelled, however far the one before had come")
{
    constexpr int rounds = 2000;
    TestHost test;
    const auto manager = test.manager();
    std::atomic<bool> isOver { false };
    // Has the thread of loads wait at each of its steps.
    std::thread busy([&] {
        while (!isOver)
            manager->setAutoReloadEnabled(false);
    });
    int cancelled = 0;
    for (int round = 0; round < rounds; ++round) {
        manager->setNeedsReload(true);
        const Request before(*manager);
        for (volatile int wait = 0; wait < 40 * (round % 50);)
            wait = wait + 1;
        manager->cancelLoad();
        const Request after(*manager);
        cancelled += after.answer().outcome == OBLoadOutcome::cancelled ? 1 : 0;
        before.answer();
    }
    isOver = true;
    busy.join();
    CHECK(cancelled == 0);
}

TEST_CASE("a loadData called while a cancel is pending runs afterwards and is not cancelled")
{
    TestHost test;
    test.script->gate.close();
    std::vector<bool> pending;
    test.script->whenReturning = [&pending](ScriptedManager& manager) {
        pending.push_back(manager.isCancelLoadRequestPending());
        return nullptr;
    };
    const auto manager = test.manager();
    manager->loadData();
    CHECK(test.script->gate.waitForArrivals(1));
    manager->cancelLoad();
    manager->loadData();
    test.script->gate.open();
    CHECK(test.script->journal.waitFor("returned", 2));
    CHECK(test.host().waitForThreads(longestWait));
    CHECK(pending == std::vector<bool> { true, false });
}

TEST_CASE("a load may be cancelled from a call on its own thread")
{
    TestHost test;
    test.script->whenPerforming = [](ScriptedManager& manager) {
        manager.cancelLoad();
        CHECK(manager.isCancelLoadRequestPending());
    };
    const auto manager = test.manager();
    CHECK(Request(*manager).answer().outcome == OBLoadOutcome::cancelled);
}

TEST_CASE("requests and cancels from many threads at once are each answered")
{
    TestHost test;
    const auto manager = test.manager();
    std::vector<std::thread> threads;
    threads.reserve(4);
    for (int number = 0; number < 4; ++number) {
        threads.emplace_back([&manager, number] {
            for (int round = 0; round < 50; ++round) {
                if (number == 0)
                    manager->cancelLoad();
                else if (number == 1)
                    manager->setNeedsReload(true);
                Request(*manager).answer();
            }
        });
    }
    for (std::thread& thread : threads)
        thread.join();
    CHECK(test.host().waitForThreads(longestWait));
    CHECK_FALSE(manager->isCancelLoadRequestPending());
    manager->setNeedsReload(true);
    CHECK(Request(*manager).answer().outcome == OBLoadOutcome::loaded);
}
