#include "tests/host/TestHost.h"

#include <doctest/doctest.h>

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

TEST_CASE("there is no tree before the first load, and asking for the installed one loads nothing")
{
    TestHost test;
    const auto manager = test.manager();
    CHECK(manager->rootMediaGroup() == nullptr);
    CHECK(test.script->journal.lines() == std::vector<std::string> { "init" });
    CHECK(test.host().threadCount() == 0);
}

TEST_CASE("a request for a tree is answered with the tree that its load installed")
{
    TestHost test;
    const auto manager = test.manager();
    const OBLoadResult result = Request(*manager).answer();
    CHECK(result.outcome == OBLoadOutcome::loaded);
    CHECK(nameOf(result.rootMediaGroup) == "load 1");
    CHECK(manager->rootMediaGroup() == result.rootMediaGroup);
}

TEST_CASE("a request answers at once, though the load is at work")
{
    TestHost test;
    test.script->gate.close();
    const auto manager = test.manager();
    const Request request(*manager);
    CHECK(test.script->gate.waitForArrivals(1));
    CHECK_FALSE(request.isAnswered());
    CHECK(manager->rootMediaGroup() == nullptr);
    test.script->gate.open();
    CHECK(nameOf(request.answer().rootMediaGroup) == "load 1");
}

TEST_CASE("a request gets the installed tree at once when no load is needed")
{
    TestHost test;
    const auto manager = test.manager();
    const OBMediaGroupRef tree = Request(*manager).answer().rootMediaGroup;
    CHECK(test.host().waitForThreads(longestWait));
    const Request again(*manager);
    CHECK(again.isAnswered());
    CHECK(again.answer().outcome == OBLoadOutcome::loaded);
    CHECK(again.answer().rootMediaGroup == tree);
    CHECK(again.thread() == std::this_thread::get_id());
    CHECK(test.script->loads == 1);
}

TEST_CASE("a request joins a load that is at work")
{
    TestHost test;
    test.script->gate.close();
    const auto manager = test.manager();
    const Request first(*manager);
    CHECK(test.script->gate.waitForArrivals(1));
    const Request second(*manager);
    const Request third(*manager);
    test.script->gate.open();
    CHECK(second.answer().rootMediaGroup == first.answer().rootMediaGroup);
    CHECK(third.answer().rootMediaGroup == first.answer().rootMediaGroup);
    CHECK(test.host().waitForThreads(longestWait));
    CHECK(test.script->loads == 1);
}

TEST_CASE("a request while a reload is needed during a load gets the next load's tree")
{
    TestHost test;
    test.script->gate.close();
    const auto manager = test.manager();
    const Request first(*manager);
    CHECK(test.script->gate.waitForArrivals(1));
    manager->setNeedsReload(true);
    const Request second(*manager);
    test.script->gate.letOneThrough();
    CHECK(nameOf(first.answer().rootMediaGroup) == "load 1");
    CHECK(test.script->gate.waitForArrivals(2));
    CHECK_FALSE(second.isAnswered());
    test.script->gate.open();
    CHECK(nameOf(second.answer().rootMediaGroup) == "load 2");
    CHECK(test.host().waitForThreads(longestWait));
    CHECK(test.script->loads == 2);
}

TEST_CASE("a request when a reload is needed loads again")
{
    TestHost test;
    const auto manager = test.manager();
    Request(*manager).answer();
    manager->setNeedsReload(true);
    CHECK(nameOf(Request(*manager).answer().rootMediaGroup) == "load 2");
    CHECK(nameOf(Request(*manager).answer().rootMediaGroup) == "load 2");
    manager->setNeedsReload(true);
    manager->setNeedsReload(false);
    CHECK(nameOf(Request(*manager).answer().rootMediaGroup) == "load 2");
}

TEST_CASE("the answer goes through the executor of whoever asked")
{
    TestHost test;
    const auto manager = test.manager();
    Application application;
    const Request request(*manager, application.executor());
    CHECK(test.host().waitForThreads(longestWait));
    CHECK_FALSE(request.isAnswered());
    CHECK(application.runUntil([&] { return request.isAnswered(); }));
    CHECK(request.thread() == std::this_thread::get_id());

    const Request ready(*manager, application.executor());
    CHECK_FALSE(ready.isAnswered());
    CHECK(application.runWaiting() == 1);
    CHECK(ready.isAnswered());
}

TEST_CASE("a request may be made from the answer to another, on any thread")
{
    TestHost test;
    const auto manager = test.manager();
    Event answered;
    manager->requestRootMediaGroup(inPlace(), [&](const OBLoadResult&) {
        manager->setNeedsReload(true);
        manager->requestRootMediaGroup(inPlace(), [&](const OBLoadResult& result) {
            CHECK(nameOf(result.rootMediaGroup) == "load 2");
            answered.happen();
        });
    });
    CHECK(answered.wait());
}

TEST_CASE("many threads that ask at once are all answered by one load")
{
    TestHost test;
    const auto manager = test.manager();
    std::vector<std::thread> threads;
    std::vector<std::string> names(8);
    threads.reserve(names.size());
    for (std::string& name : names)
        threads.emplace_back([&] { name = nameOf(Request(*manager).answer().rootMediaGroup); });
    for (std::thread& thread : threads)
        thread.join();
    for (const std::string& name : names)
        CHECK(name == "load 1");
    CHECK(test.script->loads == 1);
}

TEST_CASE("a request is told that the source cannot load when the system gives no thread")
{
    TestHost test;
    const auto manager = test.manager();
    test.machine.threads.refuses = true;
    CHECK(Request(*manager).answer().outcome == OBLoadOutcome::unavailable);
    CHECK(test.host().threadCount() == 0);
    CHECK(test.log->lines().size() == 1);
    test.machine.threads.refuses = false;
    CHECK(Request(*manager).answer().outcome == OBLoadOutcome::loaded);
}

TEST_CASE("two managers of one class load apart from one another at a time")
{
    TestHost test;
    test.script->gate.close();
    const auto first = test.manager();
    const auto second = test.manager();
    CHECK(first != second);
    const Request fromFirst(*first);
    const Request fromSecond(*second);
    CHECK(test.script->gate.waitForArrivals(2));
    CHECK(test.host().threadCount() == 2);
    first->cancelLoad();
    CHECK(first->isCancelLoadRequestPending());
    CHECK_FALSE(second->isCancelLoadRequestPending());
    test.script->gate.open();
    CHECK(fromFirst.answer().outcome == OBLoadOutcome::cancelled);
    CHECK(fromSecond.answer().outcome == OBLoadOutcome::loaded);
    CHECK(fromFirst.answer().rootMediaGroup != fromSecond.answer().rootMediaGroup);
}
