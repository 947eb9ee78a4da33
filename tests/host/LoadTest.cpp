#include "tests/host/TestHost.h"

#include <doctest/doctest.h>

#include <algorithm>
#include <atomic>
#include <limits>
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

std::size_t waitedFor(const TestHost& test, const std::string& line)
{
    CHECK(test.script->journal.waitFor(line));
    return test.script->journal.count(line);
}

} // namespace

TEST_CASE("a load asks whether it can be, then runs the source's loadData, whose base operation runs the load there")
{
    TestHost test;
    std::thread::id inLoadData;
    std::thread::id inPerform;
    test.script->whenLoadData = [&](ScriptedManager&) { inLoadData = std::this_thread::get_id(); };
    test.script->whenPerforming = [&](ScriptedManager&) { inPerform = std::this_thread::get_id(); };
    const auto manager = test.manager();
    Request(*manager).answer();
    CHECK(test.script->journal.lines() == Lines { "init", "canLoadData", "loadData", "performLoadData", "returned" });
    CHECK(inLoadData == inPerform);
    CHECK(inPerform != std::this_thread::get_id());
    CHECK(inPerform != test.machine.mainThread());
    CHECK(test.machine.threads.started() == Lines { "ob-load" });
}

TEST_CASE("loadData called by an application answers at once and runs the load on the load thread")
{
    TestHost test;
    test.script->gate.close();
    std::thread::id inLoadData;
    std::thread::id inPerform;
    test.script->whenLoadData = [&](ScriptedManager&) { inLoadData = std::this_thread::get_id(); };
    test.script->whenPerforming = [&](ScriptedManager&) { inPerform = std::this_thread::get_id(); };
    const auto manager = test.manager();
    manager->loadData();
    CHECK(test.script->gate.waitForArrivals(1));
    CHECK(inLoadData == std::this_thread::get_id());
    CHECK(inPerform != std::this_thread::get_id());
    CHECK(manager->rootMediaGroup() == nullptr);
    const Request joined(*manager);
    test.script->gate.open();
    CHECK(nameOf(joined.answer().rootMediaGroup) == "load 1");
    CHECK(test.script->journal.lines() == Lines { "init", "loadData", "performLoadData", "returned" });
}

TEST_CASE("a load is never run inside the request for the installed tree or the making of a manager")
{
    TestHost test;
    test.script->whenInit = [](ScriptedManager& manager) {
        manager.setNeedsReload(true);
        manager.setAutoReloadEnabled(true);
        return true;
    };
    const auto manager = test.manager();
    CHECK(manager->rootMediaGroup() == nullptr);
    CHECK(test.host().threadCount() == 0);
    CHECK(test.script->journal.lines() == Lines { "init" });
}

TEST_CASE("it is the first time of loading until the first loadData has returned, and never again")
{
    TestHost test;
    std::vector<bool> inLoadData;
    std::vector<bool> inPerform;
    test.script->whenLoadData = [&](ScriptedManager& m) { inLoadData.push_back(m.firstTimeCallingLoadData()); };
    test.script->whenPerforming = [&](ScriptedManager& m) { inPerform.push_back(m.firstTimeCallingLoadData()); };
    const auto manager = test.manager();
    CHECK(manager->firstTimeCallingLoadData());
    for (int load = 0; load < 3; ++load) {
        manager->setNeedsReload(true);
        Request(*manager).answer();
        CHECK_FALSE(manager->firstTimeCallingLoadData());
    }
    CHECK(inLoadData == std::vector<bool> { true, false, false });
    CHECK(inPerform == std::vector<bool> { true, false, false });
}

TEST_CASE("the first time of loading is over when the application's own loadData has returned")
{
    TestHost test;
    std::vector<bool> inLoadData;
    test.script->whenLoadData = [&](ScriptedManager& m) { inLoadData.push_back(m.firstTimeCallingLoadData()); };
    const auto manager = test.manager();
    manager->loadData();
    CHECK_FALSE(manager->firstTimeCallingLoadData());
    CHECK(test.host().waitForThreads(longestWait));
    manager->setNeedsReload(true);
    Request(*manager).answer();
    CHECK(inLoadData == std::vector<bool> { true, false });
}

TEST_CASE("a load that cannot produce anything is not run, and whoever asked is told")
{
    TestHost test;
    test.script->canLoad = false;
    const auto manager = test.manager();
    const OBLoadResult result = Request(*manager).answer();
    CHECK(result.outcome == OBLoadOutcome::unavailable);
    CHECK(result.rootMediaGroup == nullptr);
    CHECK(manager->firstTimeCallingLoadData());
    CHECK(test.script->journal.lines() == Lines { "init", "canLoadData" });
    test.script->canLoad = true;
    CHECK(Request(*manager).answer().outcome == OBLoadOutcome::loaded);
}

TEST_CASE("a source that cannot load any more keeps its installed tree, and loads again when it can")
{
    TestHost test;
    const auto manager = test.manager();
    Request(*manager).answer();
    test.script->canLoad = false;
    manager->setNeedsReload(true);
    const OBLoadResult result = Request(*manager).answer();
    CHECK(result.outcome == OBLoadOutcome::unavailable);
    CHECK(nameOf(result.rootMediaGroup) == "load 1");
    test.script->canLoad = true;
    CHECK(nameOf(Request(*manager).answer().rootMediaGroup) == "load 2");
}

TEST_CASE("a load without a tree leaves the installed one")
{
    TestHost test;
    bool givesTree = true;
    test.script->whenReturning = [&givesTree](ScriptedManager&) {
        return givesTree ? OBMediaGroup::initWithTypeIdentifier(OBMontaroRootGroupTypeIdentifier) : nullptr;
    };
    const auto manager = test.manager();
    const OBMediaGroupRef tree = Request(*manager).answer().rootMediaGroup;
    CHECK(tree != nullptr);
    CHECK(test.host().waitForThreads(longestWait));
    givesTree = false;
    manager->setNeedsReload(true);
    const OBLoadResult result = Request(*manager).answer();
    CHECK(result.outcome == OBLoadOutcome::loaded);
    CHECK(result.rootMediaGroup == tree);
    CHECK(manager->rootMediaGroup() == tree);
}

TEST_CASE("a request is answered though no load ever gave a tree")
{
    TestHost test;
    test.script->whenReturning = [](ScriptedManager&) { return nullptr; };
    const auto manager = test.manager();
    const OBLoadResult result = Request(*manager).answer();
    CHECK(result.outcome == OBLoadOutcome::loaded);
    CHECK(result.rootMediaGroup == nullptr);
}

TEST_CASE("loads of one manager run one at a time")
{
    TestHost test;
    std::atomic<int> atWork { 0 };
    std::atomic<int> most { 0 };
    test.script->whenPerforming = [&](ScriptedManager&) { most = std::max<int>(most, ++atWork); };
    test.script->whenReturning = [&](ScriptedManager&) {
        --atWork;
        return nullptr;
    };
    const auto manager = test.manager();
    std::vector<std::thread> threads;
    threads.reserve(4);
    for (int number = 0; number < 4; ++number) {
        threads.emplace_back([&manager] {
            for (int round = 0; round < 20; ++round) {
                manager->setNeedsReload(true);
                manager->loadData();
                Request(*manager).answer();
            }
        });
    }
    for (std::thread& thread : threads)
        thread.join();
    CHECK(test.host().waitForThreads(longestWait));
    CHECK(most == 1);
    CHECK(atWork == 0);
}

TEST_CASE("the load thread is as nice as the priority says when the load begins")
{
    const std::vector<std::pair<double, int>> cases { { 1.0, 0 }, { 0.75, 0 }, { 0.5, 0 }, { 0.49, 0 }, { 0.45, 2 },
        { 0.375, 5 }, { 0.25, 10 }, { 0.125, 14 }, { 0.1, 15 }, { 0.0, 19 } };
    TestHost test;
    const auto manager = test.manager();
    std::vector<int> expected { 0 };
    CHECK(manager->loadThreadPriority() == 0.5);
    Request(*manager).answer();
    for (const auto& [priority, nice] : cases) {
        manager->setLoadThreadPriority(priority);
        CHECK(manager->loadThreadPriority() == priority);
        manager->setNeedsReload(true);
        Request(*manager).answer();
        expected.push_back(nice);
    }
    CHECK(test.machine.threads.niceValues() == expected);
}

TEST_CASE("a priority outside of 0 to 1 counts as the nearest one inside, and none at all as normal")
{
    const std::vector<std::pair<double, int>> cases { { 7.0, 0 }, { -0.5, 19 }, { -1e300, 19 },
        { std::numeric_limits<double>::quiet_NaN(), 0 } };
    TestHost test;
    const auto manager = test.manager();
    std::vector<int> expected;
    for (const auto& [priority, nice] : cases) {
        manager->setLoadThreadPriority(priority);
        manager->setNeedsReload(true);
        Request(*manager).answer();
        expected.push_back(nice);
    }
    CHECK(test.machine.threads.niceValues() == expected);
}

TEST_CASE("the folders that the last load could not read are told, missing ones and files are not")
{
    TestHost test;
    test.machine.files.whenListing = [](std::string_view folder) {
        if (folder == "/unreadable")
            return platform::FileProblem::notPermitted;
        if (folder == "/broken")
            return platform::FileProblem::readError;
        if (folder == "/long")
            return platform::FileProblem::pathTooLong;
        return folder == "/file" ? platform::FileProblem::notAFolder : platform::FileProblem::none;
    };
    test.script->whenPerforming = [](ScriptedManager& manager) {
        for (const char* folder : { "/unreadable", "/missing", "/file", "/broken", "/long" })
            manager.listFolder(folder, {});
    };
    const auto manager = test.manager();
    for (int load = 0; load < 2; ++load) {
        manager->setNeedsReload(true);
        Request(*manager).answer();
        const std::vector<OBLoadProblem> problems = manager->loadProblems();
        REQUIRE(problems.size() == 3);
        CHECK(problems[0].path == "/unreadable");
        CHECK(problems[0].problem == platform::FileProblem::notPermitted);
        CHECK(problems[1].path == "/broken");
        CHECK(problems[1].problem == platform::FileProblem::readError);
        CHECK(problems[2].path == "/long");
        CHECK(problems[2].problem == platform::FileProblem::pathTooLong);
    }
    CHECK(test.log->lines() == Lines { "2 manager /long: listed as empty: the path is too long for the system" });
}

TEST_CASE("a manager runs calls on the main thread and waits, and is told when there is none any more")
{
    TestHost test;
    const auto manager = test.manager();
    std::thread::id ran;
    CHECK(manager->performOnMainThreadAndWait([&ran] { ran = std::this_thread::get_id(); }));
    CHECK(ran == test.machine.mainThread());
    test.machine.endMainLoop();
    ran = {};
    CHECK_FALSE(manager->performOnMainThreadAndWait([&ran] { ran = std::this_thread::get_id(); }));
    CHECK(ran == std::thread::id());
}

TEST_CASE("a scan sees the observer that was set before it")
{
    class Silent : public OBScanObserver {
        void scanDecided(const OBScanDecision&) override { }
    };
    TestHost test;
    std::shared_ptr<OBScanObserver> seen;
    test.script->whenPerforming = [&seen](ScriptedManager& manager) { seen = manager.scanObserver(); };
    const auto manager = test.manager();
    CHECK(manager->scanObserver() == nullptr);
    const auto observer = std::make_shared<Silent>();
    manager->setScanObserver(observer);
    Request(*manager).answer();
    CHECK(seen == observer);
    manager->setScanObserver(nullptr);
    CHECK(manager->scanObserver() == nullptr);
    CHECK(waitedFor(test, "returned") == 1);
}
