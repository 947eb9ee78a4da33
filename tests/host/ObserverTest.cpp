#include "tests/host/TestHost.h"

#include <doctest/doctest.h>

#include <chrono>
#include <functional>
#include <memory>
#include <string>
#include <thread>
#include <utility>
#include <vector>

using namespace tests;
using Lines = std::vector<std::string>;

namespace {

std::string nameOf(const OBMediaGroupRef& group)
{
    return group ? group->name().string() : "none";
}

/// Callbacks that write down what they are told.
OBManagerCallbacks writingTo(Journal& journal)
{
    OBManagerCallbacks callbacks;
    callbacks.rootPublished = [&journal](const OBMediaGroupRef& root) { journal.write("published " + nameOf(root)); };
    callbacks.loadEnded = [&journal](const OBLoadResult& result) {
        journal.write(
            "ended " + std::to_string(static_cast<int>(result.outcome)) + " " + nameOf(result.rootMediaGroup));
    };
    return callbacks;
}

} // namespace

TEST_CASE("whoever observes hears of the published tree, then of the end of the load, through the executor alone")
{
    TestHost test;
    const auto manager = test.manager();
    Application application;
    Journal journal;
    const OBObservation listening = manager->observe(application.executor(), writingTo(journal));
    CHECK(application.callsHandedOver() == 0);
    Request(*manager).answer();
    CHECK(test.host().waitForThreads(longestWait));
    CHECK(journal.lines().empty());
    CHECK(application.runWaiting() == 2);
    CHECK(journal.lines() == Lines { "published load 1", "ended 0 load 1" });
}

TEST_CASE("a tree that a source publishes again is told again, from any thread")
{
    TestHost test;
    const auto manager = test.manager();
    Journal journal;
    const OBObservation listening = manager->observe(inPlace(), writingTo(journal));
    const OBMediaGroupRef root = Request(*manager).answer().rootMediaGroup;
    CHECK(test.host().waitForThreads(longestWait));
    root->setName("changed");
    std::thread([&] { manager->setRootMediaGroup(root); }).join();
    CHECK(journal.lines() == Lines { "published load 1", "ended 0 load 1", "published changed" });
}

TEST_CASE("every observer is told, each through its own executor")
{
    TestHost test;
    const auto manager = test.manager();
    Application first;
    Application second;
    Journal toFirst;
    Journal toSecond;
    const OBObservation one = manager->observe(first.executor(), writingTo(toFirst));
    const OBObservation two = manager->observe(second.executor(), writingTo(toSecond));
    Request(*manager).answer();
    CHECK(test.host().waitForThreads(longestWait));
    CHECK(first.runWaiting() == 2);
    CHECK(toFirst.lines().size() == 2);
    CHECK(toSecond.lines().empty());
    CHECK(second.runWaiting() == 2);
    CHECK(toSecond.lines() == toFirst.lines());
}

TEST_CASE("a callback that is not set is not made")
{
    TestHost test;
    const auto manager = test.manager();
    Application application;
    const OBObservation listening = manager->observe(application.executor(), {});
    Request(*manager).answer();
    CHECK(test.host().waitForThreads(longestWait));
    CHECK(application.callsHandedOver() == 0);
}

TEST_CASE("observers are told how a load ended, also when it could not be or was cancelled")
{
    TestHost test;
    test.script->canLoad = false;
    const auto manager = test.manager();
    Journal journal;
    const OBObservation listening = manager->observe(inPlace(), writingTo(journal));
    Request(*manager).answer();
    CHECK(journal.waitFor("ended 2 none"));
    test.script->canLoad = true;
    test.script->gate.close();
    const Request request(*manager);
    CHECK(test.script->gate.waitForArrivals(1));
    manager->cancelLoad();
    test.script->gate.open();
    request.answer();
    CHECK(journal.waitFor("ended 1 load 1"));
}

TEST_CASE("no call comes after the observation was dropped, not even one that was handed over before")
{
    TestHost test;
    const auto manager = test.manager();
    Application application;
    Journal journal;
    OBObservation listening = manager->observe(application.executor(), writingTo(journal));
    Request(*manager).answer();
    CHECK(test.host().waitForThreads(longestWait));
    CHECK(application.callsHandedOver() == 2);
    listening = {};
    application.runWaiting();
    CHECK(journal.lines().empty());
}

TEST_CASE("the executor of an observation that was dropped is not called any more")
{
    TestHost test;
    const auto manager = test.manager();
    Application application;
    Journal journal;
    {
        const OBObservation listening = manager->observe(application.executor(), writingTo(journal));
    }
    Request(*manager).answer();
    manager->setRootMediaGroup(nullptr);
    CHECK(test.host().waitForThreads(longestWait));
    CHECK(application.callsHandedOver() == 0);
}

TEST_CASE("what callbacks hold is released when the observation is dropped")
{
    TestHost test;
    const auto manager = test.manager();
    auto held = std::make_shared<int>(1);
    const std::weak_ptr<int> watched = held;
    OBManagerCallbacks callbacks;
    callbacks.loadEnded = [held = std::move(held)](const OBLoadResult&) { (void)*held; };
    OBObservation listening = manager->observe(inPlace(), std::move(callbacks));
    CHECK_FALSE(watched.expired());
    listening = {};
    CHECK(watched.expired());
}

TEST_CASE("an observation may be dropped in a call to it")
{
    TestHost test;
    const auto manager = test.manager();
    Application application;
    OBObservation listening;
    int calls = 0;
    OBManagerCallbacks callbacks;
    callbacks.rootPublished = [&](const OBMediaGroupRef&) {
        ++calls;
        listening = {};
    };
    callbacks.loadEnded = [&](const OBLoadResult&) { ++calls; };
    listening = manager->observe(application.executor(), std::move(callbacks));
    Request(*manager).answer();
    CHECK(test.host().waitForThreads(longestWait));
    application.runWaiting();
    CHECK(calls == 1);
}

TEST_CASE("calls are handed over while no lock is held, so that they may enter the manager again")
{
    TestHost test;
    test.machine.bare.clock.advance(std::chrono::hours(1));
    test.script->whenPerforming = [](ScriptedManager& manager) { manager.listFolder("/nothing at all", {}); };
    const auto manager = test.manager();
    Event ended;
    std::vector<OBObservation> more;
    const auto enter = [&] {
        manager->rootMediaGroup();
        manager->loadProgress();
        manager->loadProblems();
        manager->isCancelLoadRequestPending();
        manager->firstTimeCallingLoadData();
        manager->setAutoReloadEnabled(false);
        manager->setNeedsReload(false);
        more.push_back(manager->observe(inPlace(), {}));
        manager->requestRootMediaGroup(inPlace(), [](const OBLoadResult&) {});
        test.host().plugins();
        test.host().threadCount();
    };
    const OBExecutor entering = [&enter](const std::function<void()>& call) {
        enter();
        call();
    };
    OBManagerCallbacks callbacks;
    callbacks.rootPublished = [&](const OBMediaGroupRef&) { enter(); };
    callbacks.progressed = [&](const OBLoadProgress&) { enter(); };
    callbacks.loadEnded = [&](const OBLoadResult&) {
        enter();
        manager->cancelLoad();
        ended.happen();
    };
    const OBObservation listening = manager->observe(entering, std::move(callbacks));
    Request(*manager, entering).answer();
    CHECK(ended.wait());
    CHECK(test.host().waitForThreads(longestWait));
}

TEST_CASE("nothing is called inside the call that registers an observer")
{
    TestHost test;
    const auto manager = test.manager();
    Request(*manager).answer();
    Application application;
    Journal journal;
    const OBObservation listening = manager->observe(application.executor(), writingTo(journal));
    CHECK(application.callsHandedOver() == 0);
    CHECK(journal.lines().empty());
}

TEST_CASE("a notification reaches a manager until it ends, while a load still keeps it alive")
{
    TestHost test;
    Journal heard;
    test.script->whenInit = [&](ScriptedManager& manager) {
        manager.observeNotification(
            test.machine.bare.workspaceNotifications, "Mounted", [&heard](const platform::Notification& notification) {
                heard.write(notification.userInfo.valueForKey("path").text()->string());
            });
        return true;
    };
    auto manager = test.manager();
    const auto post = [&test](const char* name, const char* path) {
        test.machine.bare.workspaceNotifications.post(
            { name, nullptr, platform::Value::Dictionary { { "path", path } } });
    };
    post("Mounted", "/a");
    post("Unmounted", "/b");
    test.script->gate.close();
    const Request request(*manager);
    CHECK(test.script->gate.waitForArrivals(1));
    manager = nullptr;
    post("Mounted", "/c");
    CHECK(heard.lines() == Lines { "/a" });
}
