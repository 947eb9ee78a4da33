#include "host/OBPathWatcher.h"
#include "tests/host/TestHost.h"

#include <doctest/doctest.h>

#include <string>

using namespace tests;
using platform::PathChange;

namespace {

/// A manager that is called on the main thread.
struct CalledOnMainThread {
    CalledOnMainThread()
    {
        Script& script = *test.script;
        script.whenPathChanged = [this, &script](ScriptedManager& changed, std::string_view path) {
            const bool isMain = test.machine.mainRunLoop.isMainThread();
            script.journal.write(std::string(path) + (isMain ? " on the main thread" : " elsewhere"));
            calls.pass();
            changed.performReload("part", [&] { script.journal.write("reloaded"); });
        };
        following = test.host().followChanges({ .callsOnMainThread = true });
        manager = test.manager();
        test.host().pathWatcher().watchPath_observer("/a", manager.get());
    }
    ~CalledOnMainThread()
    {
        calls.open();
        manager = nullptr;
        following = {};
    }
    void change(const char* path)
    {
        test.machine.bare.pathWatching.tell("/a", { PathChange::Kind::folderChanged, true, false, path });
    }

    TestHost test {};
    Gate calls {};
    std::shared_ptr<OBMediaManager> manager;
    OBObservation following;
};

} // namespace

TEST_CASE("an application that asks for it has its observers called on the main thread, and reloads run there")
{
    CalledOnMainThread machine;
    machine.change("/a/1");
    CHECK(machine.test.script->journal.waitFor("/a/1 on the main thread"));
    CHECK(machine.test.script->journal.waitFor("reloaded"));
    CHECK(machine.test.machine.threads.started().empty());
}

TEST_CASE("no call is made on the main thread while a load runs")
{
    CalledOnMainThread machine;
    Script& script = *machine.test.script;
    script.gate.close();
    const Request request(*machine.manager);
    CHECK(script.gate.waitForArrivals(1));
    machine.change("/a/1");
    CHECK(machine.test.machine.mainRunLoop.performAndWait([] {}));
    CHECK(script.journal.count("/a/1 on the main thread") == 0);
    script.gate.open();
    request.answer();
    CHECK(script.journal.waitFor("/a/1 on the main thread"));
}

TEST_CASE("no load begins while a call is made on the main thread")
{
    CalledOnMainThread machine;
    Script& script = *machine.test.script;
    machine.calls.close();
    machine.change("/a/1");
    CHECK(machine.calls.waitForArrivals(1));
    const Request request(*machine.manager);
    while (machine.test.machine.threads.started().empty())
        std::this_thread::yield();
    CHECK(script.loads == 0);
    machine.calls.open();
    request.answer();
    CHECK(script.loads == 1);
}

TEST_CASE("a reload that the main thread asks for while a load runs follows the load, on the main thread")
{
    CalledOnMainThread machine;
    Script& script = *machine.test.script;
    script.gate.close();
    const Request request(*machine.manager);
    CHECK(script.gate.waitForArrivals(1));
    CHECK(machine.test.machine.mainRunLoop.performAndWait([&] {
        machine.manager->performReload("part", [&] {
            const bool isMain = machine.test.machine.mainRunLoop.isMainThread();
            script.journal.write(isMain ? "later on the main thread" : "later elsewhere");
        });
        script.journal.write("returned at once");
    }));
    CHECK(script.journal.waitFor("returned at once"));
    CHECK(script.journal.count("later on the main thread") == 0);
    script.gate.open();
    request.answer();
    CHECK(script.journal.waitFor("later on the main thread"));
}

TEST_CASE("a manager that ends takes the reloads with it that wait for the main thread")
{
    CalledOnMainThread machine;
    Script& script = *machine.test.script;
    script.gate.close();
    const Request request(*machine.manager);
    CHECK(script.gate.waitForArrivals(1));
    CHECK(machine.test.machine.mainRunLoop.performAndWait(
        [&] { machine.manager->performReload("part", [&] { script.journal.write("reloaded"); }); }));
    machine.manager = nullptr;
    script.gate.open();
    CHECK(script.journal.waitFor("destroyed"));
    CHECK(script.journal.count("reloaded") == 0);
}
