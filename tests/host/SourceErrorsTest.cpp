#include "host/SourceCall.h"
#include "platform/MainRunLoop.h"
#include "platform/Notifications.h"
#include "tests/host/TestHost.h"

#include <doctest/doctest.h>

#include <atomic>
#include <memory>
#include <stdexcept>
#include <string>
#include <vector>

using namespace tests;
using Lines = std::vector<std::string>;

namespace {

const std::string source = TestHost::identifier;

[[noreturn]] void fail()
{
    throw std::runtime_error("the disk is made of cheese");
}

void failAt(std::size_t faulty, std::size_t index)
{
    if (index == faulty)
        fail();
}

} // namespace

TEST_CASE("a load that throws answers what it threw, leaves the tree as it was, and the next one loads")
{
    TestHost test;
    std::atomic<bool> throws { false };
    test.script->whenPerforming = [&](ScriptedManager&) {
        if (throws)
            fail();
    };
    const auto manager = test.manager();
    const OBMediaGroupRef before = Request(*manager).answer().rootMediaGroup;
    throws = true;
    manager->setNeedsReload(true);
    const OBLoadResult failed = Request(*manager).answer();
    CHECK(failed.outcome == OBLoadOutcome::failed);
    CHECK(failed.problem == "the disk is made of cheese");
    CHECK(failed.rootMediaGroup == before);
    CHECK(test.log->count("1 manager the load failed: the disk is made of cheese") == 1);
    throws = false;
    const OBLoadResult again = Request(*manager).answer();
    CHECK(again.outcome == OBLoadOutcome::loaded);
    CHECK(again.problem.empty());
    CHECK(again.rootMediaGroup != before);
}

TEST_CASE("what a source throws that is no error of the standard library is survived as well")
{
    TestHost test;
    test.script->whenLoadData = [](ScriptedManager&) { throw 7; };
    CHECK(Request(*test.manager()).answer().problem == "an unknown error");
}

TEST_CASE("a thread or a handler that throws costs one line that names the source")
{
    TestHost test;
    const auto manager = test.manager();
    CHECK(manager->startThread("worker", fail));
    CHECK(test.host().waitForThreads(longestWait));
    CHECK(
        test.machine.bare.console.lines() == Lines { source + ": error in thread worker: the disk is made of cheese" });
    manager->observeNotification(
        test.machine.bare.notifications, "Something", [](const platform::Notification&) { fail(); });
    test.machine.bare.notifications.post({ "Something" });
    CHECK(test.machine.bare.console.lines().back() == source + ": error in Something: the disk is made of cheese");
    CHECK(Request(*manager).answer().outcome == OBLoadOutcome::loaded);
}

TEST_CASE("a handler of changes that throws is told the next change all the same")
{
    TestHost test;
    std::atomic<bool> hasThrown { false };
    Journal told;
    test.script->whenPathChanged = [&](ScriptedManager&, std::string_view path) {
        // Decided first: the next change may be told on another thread as soon as this one is written.
        const bool throws = !hasThrown.exchange(true);
        told.write(std::string(path));
        if (throws)
            fail();
    };
    const auto manager = test.manager();
    const OBObservation following = test.host().followChanges();
    test.host().pathWatcher().watchPath_observer("/a", manager.get());
    auto& disk = test.machine.bare.pathWatching;
    disk.tell("/a", { platform::PathChange::Kind::attributesChanged, true, false, "/a/first" });
    CHECK(told.waitFor("/a/first"));
    disk.tell("/a", { platform::PathChange::Kind::attributesChanged, true, false, "/a/second" });
    CHECK(told.waitFor("/a/second"));
    CHECK(waitUntil([&] { return test.host().pathWatcher().isAtRest(manager.get()); }));
    test.host().pathWatcher().removeObserver(manager.get());
    CHECK(test.machine.bare.console.lines()
        == Lines { "/a/first: error while this change was told: the disk is made of cheese" });
}

TEST_CASE("a job that throws ends the work on its caller's thread, with no other job inside")
{
    TestHost test;
    const auto manager = test.manager();
    const auto nothing = [](std::size_t) {};
    for (const std::size_t faulty : { 0, 5, 99 }) {
        CAPTURE(faulty);
        std::atomic<int> inside { 0 };
        const auto failing = [&](std::size_t index) {
            ++inside;
            const std::shared_ptr<void> end(nullptr, [&](void*) { --inside; });
            failAt(faulty, index);
        };
        const std::string byJob = errorThrownBy([&] { manager->performInOrder(100, failing, nothing); });
        CHECK(inside == 0);
        const std::string byTaker = errorThrownBy([&] { manager->performInOrder(100, nothing, failing); });
        CHECK(byJob + "," + byTaker == "the disk is made of cheese,the disk is made of cheese");
    }
    CHECK(test.host().waitForThreads(longestWait));
}

TEST_CASE("what a call on the main thread throws is thrown where it was asked for")
{
    TestHost test;
    const auto manager = test.manager();
    Journal caught;
    CHECK(manager->startThread("worker", [&] {
        try {
            manager->performOnMainThreadAndWait(fail);
        } catch (const std::runtime_error& error) {
            caught.write(error.what());
        }
    }));
    CHECK(caught.waitFor("the disk is made of cheese"));
    CHECK(test.host().waitForThreads(longestWait));
}
