#include "host/OBConstants.h"
#include "host/OBPathWatcher.h"
#include "platform/Notifications.h"
#include "tests/host/TestHost.h"

#include <doctest/doctest.h>

#include <string>
#include <thread>
#include <vector>

using namespace tests;
using platform::PathChange;
using Paths = std::vector<std::string>;

namespace {

/// Writes down what it is told, and stops at a gate.
class Listener : public OBPathWatcherObserver {
public:
    ~Listener() override { gate.open(); }
    void watchedPathChanged_fileChangedEventFlags(std::string_view path, std::uint64_t) override
    {
        journal.write(std::string(path));
        gate.pass();
        returned.write(std::string(path));
    }
    void watchedQueryChanged_queryScope(
        const platform::Notification& notification, const std::vector<std::string>& scope) override
    {
        std::string line = notification.name.string();
        for (const std::string& folder : scope)
            line += " " + folder;
        journal.write(line);
    }

    Journal journal {};
    Journal returned {};
    Gate gate {};
};

/// A host whose changes are followed.
struct Followed {
    explicit Followed(const OBFollowOptions& options = {})
        : following(test.host().followChanges(options))
    {
    }
    ~Followed() { following = {}; }
    OBPathWatcher& watcher() { return test.host().pathWatcher(); }
    ScriptedPathWatching& disk() { return test.machine.bare.pathWatching; }
    void change(const std::string& watched, const std::string& path)
    {
        disk().tell(watched, { PathChange::Kind::attributesChanged, true, false, path });
    }

    TestHost test {};
    OBObservation following;
};

} // namespace

TEST_CASE("nothing is watched until an application follows changes, and nothing once the last has stopped")
{
    TestHost test;
    Listener listener;
    OBPathWatcher& watcher = test.host().pathWatcher();
    const ScriptedPathWatching& disk = test.machine.bare.pathWatching;
    watcher.watchPath_observer("/a", &listener);
    watcher.watchQuery_observer_queryScope_queryRunMode(
        "(kMDItemFSName = '*.mtrproject'c)", &listener, { "/m" }, OBQueryRunModeLive);
    CHECK(disk.watchedPaths().empty());
    OBObservation first = test.host().followChanges();
    OBObservation second = test.host().followChanges();
    CHECK(disk.watchedPaths() == Paths { "/a", "/m" });
    watcher.watchPath_observer("/b", &listener);
    CHECK(disk.watchedPaths() == Paths { "/a", "/m", "/b" });
    first = {};
    CHECK(disk.watchedPaths() == Paths { "/a", "/m", "/b" });
    second = {};
    CHECK(disk.watchedPaths().empty());
    CHECK(watcher.pathsWatchedBy(&listener) == Paths { "/a", "/b" });
    watcher.removeObserver(&listener);
}

TEST_CASE("a path is watched for what changed since it was registered, or since the work began that registered it")
{
    Followed followed;
    ScriptedPathWatching& disk = followed.disk();
    Listener listener;
    disk.currentTime = { 100, 0 };
    followed.watcher().watchPath_observer("/a", &listener);
    CHECK(disk.since("/a") == platform::Date { 100, 0 });
    followed.watcher().removeObserver(&listener);

    followed.test.script->whenReturning = [&](ScriptedManager& manager) -> OBMediaGroupRef {
        disk.currentTime = { 200, 0 };
        followed.watcher().watchPath_observer("/scanned", &manager);
        return nullptr;
    };
    const auto manager = followed.test.manager();
    Request(*manager).answer();
    CHECK(disk.since("/scanned") == platform::Date { 100, 0 });
}

TEST_CASE("for an entry that comes or goes the folder that holds it is reported, for content the file, else the path")
{
    struct Row {
        PathChange::Kind kind;
        bool isFolder;
        const char* path;
        const char* report;
    };
    const std::vector<Row> rows {
        { PathChange::Kind::appeared, false, "/w/a/file", "/w/a" },
        { PathChange::Kind::disappeared, true, "/w/a/folder", "/w/a" },
        { PathChange::Kind::appeared, true, "/w/folder", "/w" },
        { PathChange::Kind::arrivalEnded, false, "/w/a/file", "/w/a" },
        { PathChange::Kind::contentChanged, false, "/w/a/file", "/w/a/file" },
        { PathChange::Kind::contentChanged, false, "/w/a/.hidden", "/w/a" },
        { PathChange::Kind::contentChanged, false, "/w", "/w" },
        { PathChange::Kind::attributesChanged, true, "/w/a", "/w/a" },
        { PathChange::Kind::folderChanged, true, "/w/a", "/w/a" },
        { PathChange::Kind::anythingChanged, true, "/w", "/w" },
        { PathChange::Kind::found, false, "/w/a/file", nullptr },
    };
    for (const Row& row : rows) {
        CAPTURE(row.path);
        Followed followed;
        Listener listener;
        followed.watcher().watchPath_observer("/w", &listener);
        followed.disk().tell("/w", { row.kind, row.isFolder, false, row.path });
        followed.change("/w", "/w/last");
        CHECK(listener.returned.waitFor("/w/last"));
        if (row.report)
            CHECK(listener.returned.waitFor(row.report));
        CHECK(listener.journal.lines().size() == (row.report ? 2 : 1));
        followed.watcher().removeObserver(&listener);
    }
}

TEST_CASE("entries directly in the top folder are reported as that folder, also where it is the root of all")
{
    Followed followed;
    Listener listener;
    followed.watcher().watchPath_observer("/", &listener);
    followed.disk().tell("/", { PathChange::Kind::appeared, false, false, "/file" });
    CHECK(listener.returned.waitFor("/"));
    followed.watcher().removeObserver(&listener);
}

TEST_CASE("a call that sleeps holds the next one back as little as reports of another path, but a third waits")
{
    Followed followed;
    Listener listener;
    listener.gate.close();
    followed.watcher().watchPath_observer("/a", &listener);
    followed.watcher().watchPath_observer("/b", &listener);
    followed.change("/a", "/a/1");
    CHECK(listener.journal.waitFor("/a/1"));
    followed.change("/a", "/a/2");
    CHECK(listener.journal.waitFor("/a/2"));
    followed.change("/a", "/a/3");
    followed.change("/b", "/b/1");
    CHECK(listener.journal.waitFor("/b/1"));
    CHECK(listener.gate.waitForArrivals(3));
    CHECK(listener.journal.count("/a/3") == 0);
    listener.gate.letOneThrough();
    listener.gate.letOneThrough();
    listener.gate.letOneThrough();
    CHECK(listener.journal.waitFor("/a/3"));
    listener.gate.open();
    CHECK(listener.returned.waitFor("/a/3"));
    followed.watcher().removeObserver(&listener);
}

TEST_CASE("equal reports that have not been delivered yet are one, and a delivered one comes again")
{
    Followed followed;
    Listener listener;
    listener.gate.close();
    followed.watcher().watchPath_observer("/a", &listener);
    followed.change("/a", "/a/1");
    followed.change("/a", "/a/2");
    CHECK(listener.gate.waitForArrivals(2));
    followed.change("/a", "/a/1");
    followed.change("/a", "/a/1");
    followed.change("/a", "/a/3");
    followed.change("/a", "/a/1");
    listener.gate.open();
    CHECK(listener.returned.waitFor("/a/3"));
    CHECK(listener.returned.waitFor("/a/1", 2));
    CHECK(listener.journal.lines().size() == 4);
    followed.watcher().removeObserver(&listener);
}

TEST_CASE("reports that pile up become one of the watched path")
{
    Followed followed;
    Listener listener;
    listener.gate.close();
    followed.watcher().watchPath_observer("/a", &listener);
    followed.change("/a", "/a/first");
    followed.change("/a", "/a/second");
    CHECK(listener.gate.waitForArrivals(2));
    for (int number = 0; number < 1000; ++number)
        followed.change("/a", "/a/" + std::to_string(number));
    listener.gate.open();
    CHECK(listener.returned.waitFor("/a"));
    CHECK(listener.journal.lines().size() == 3);
    followed.watcher().removeObserver(&listener);
}

TEST_CASE("an observer that is taken back gets no further call, and none is under way any more")
{
    Followed followed;
    Listener listener;
    listener.gate.close();
    followed.watcher().watchPath_observer("/a", &listener);
    followed.change("/a", "/a/1");
    followed.change("/a", "/a/2");
    CHECK(listener.gate.waitForArrivals(2));
    followed.change("/a", "/a/3");
    std::thread takingBack([&] {
        followed.watcher().removeObserver(&listener);
        CHECK(listener.returned.lines().size() == 2);
    });
    while (!followed.watcher().pathsWatchedBy(&listener).empty())
        std::this_thread::yield();
    listener.gate.open();
    takingBack.join();
    CHECK(listener.journal.lines().size() == 2);
    CHECK(followed.disk().watchedPaths().empty());
}

TEST_CASE("an observer may take itself back inside its own call")
{
    class Leaving : public OBPathWatcherObserver {
    public:
        explicit Leaving(OBPathWatcher& watcher)
            : _watcher(watcher)
        {
        }
        void watchedPathChanged_fileChangedEventFlags(std::string_view path, std::uint64_t) override
        {
            if (path == "/a/1") {
                gate.pass();
                _watcher.removeObserver(this);
            }
            journal.write(std::string(path));
        }
        Gate gate {};
        Journal journal {};

    private:
        OBPathWatcher& _watcher;
    };
    Followed followed;
    Leaving leaving(followed.watcher());
    leaving.gate.close();
    followed.watcher().watchPath_observer("/a", &leaving);
    followed.watcher().watchPath_observer("/b", &leaving);
    followed.change("/a", "/a/1");
    CHECK(leaving.gate.waitForArrivals(1));
    leaving.gate.open();
    CHECK(leaving.journal.waitFor("/a/1"));
    followed.change("/b", "/b/1");
    CHECK(leaving.journal.lines() == Paths { "/a/1" });
    CHECK(followed.disk().watchedPaths().empty());
}

TEST_CASE("what changes while a load runs is told once, when its tree is installed")
{
    Followed followed;
    Script& script = *followed.test.script;
    script.whenPathChanged = [&](ScriptedManager& manager, std::string_view path) {
        script.journal.write(std::string(path) + (manager.rootMediaGroup() ? " with a tree" : " without a tree"));
    };
    script.gate.close();
    const auto manager = followed.test.manager();
    followed.watcher().watchPath_observer("/a", manager.get());
    const Request request(*manager);
    CHECK(script.gate.waitForArrivals(1));
    followed.change("/a", "/a/1");
    followed.change("/a", "/a/2");
    followed.change("/a", "/a/1");
    script.gate.open();
    request.answer();
    CHECK(script.journal.waitFor("/a/1 with a tree"));
    CHECK(script.journal.waitFor("/a/2 with a tree"));
    CHECK(script.journal.count("/a/1 with a tree") == 1);
}

TEST_CASE("what changes while a cancel is pending is told once the request has ended")
{
    Followed followed;
    Script& script = *followed.test.script;
    Gate reloading;
    reloading.close();
    script.whenPathChanged = [&](ScriptedManager& manager, std::string_view path) {
        if (path == "/a/reload") {
            manager.performReload("part", [&] {
                reloading.pass();
                script.journal.write(manager.isCancelLoadRequestPending() ? "cancelled" : "not cancelled");
            });
        } else {
            script.journal.write(std::string(path)
                + (manager.isCancelLoadRequestPending() ? " while a cancel is pending" : " after the cancel"));
        }
    };
    const auto manager = followed.test.manager();
    followed.watcher().watchPath_observer("/a", manager.get());
    followed.change("/a", "/a/reload");
    CHECK(reloading.waitForArrivals(1));
    manager->cancelLoad();
    CHECK(manager->isCancelLoadRequestPending());
    followed.change("/a", "/a/later");
    reloading.open();
    CHECK(script.journal.waitFor("cancelled"));
    CHECK(script.journal.waitFor("/a/later after the cancel"));
    CHECK_FALSE(manager->isCancelLoadRequestPending());
}

TEST_CASE("a call that sleeps is not at work, so a cancel is void, and it ends at once with its manager")
{
    Followed followed;
    Script& script = *followed.test.script;
    script.whenPathChanged = [&](ScriptedManager& manager, std::string_view) {
        const bool slept = manager.sleep(std::chrono::seconds(5));
        manager.performReload("part", [&] { script.journal.write("reloaded"); });
        script.journal.write(slept ? "slept" : "woken");
    };
    auto manager = followed.test.manager();
    followed.watcher().watchPath_observer("/a", manager.get());
    followed.change("/a", "/a");
    CHECK(followed.test.machine.bare.clock.waitForSleep(std::chrono::seconds(5)));
    manager->cancelLoad();
    CHECK_FALSE(manager->isCancelLoadRequestPending());
    manager = nullptr;
    CHECK(script.journal.waitFor("woken"));
    CHECK(script.journal.count("reloaded") == 0);
}

TEST_CASE("why folders are only looked at now and then is logged once, with what mends it")
{
    Followed followed;
    Listener listener;
    followed.watcher().watchPath_observer("/a", &listener);
    followed.watcher().watchPath_observer("/b", &listener);
    const platform::WatchingProblem problem { "/a/deep", "the limit is used up", "raise it" };
    followed.disk().tellFailure("/a", problem);
    followed.disk().tellFailure("/b", problem);
    CHECK(followed.test.log->lines()
        == Paths { "2 - /a/deep: looked at every 10 seconds: the limit is used up; to mend it: raise it" });
    followed.watcher().removeObserver(&listener);
}

TEST_CASE("the threads on which observers are called are used again, and end when changes are no longer followed")
{
    TestHost test;
    Listener listener;
    OBObservation following = test.host().followChanges();
    OBPathWatcher& watcher = test.host().pathWatcher();
    watcher.watchPath_observer("/a", &listener);
    for (int number = 0; number < 20; ++number) {
        const std::string path = "/a/" + std::to_string(number);
        test.machine.bare.pathWatching.tell("/a", { PathChange::Kind::folderChanged, true, false, path });
        CHECK(listener.returned.waitFor(path));
        CHECK(test.machine.bare.clock.waitForSleep(std::chrono::seconds(1)));
    }
    CHECK(test.machine.threads.started().size() == 1);
    CHECK(test.host().threadCount() == 1);
    watcher.removeObserver(&listener);
    following = {};
    CHECK(test.host().waitForThreads(longestWait));
}

TEST_CASE("a thread on which nobody was called for a second ends")
{
    TestHost test;
    Listener listener;
    const OBObservation following = test.host().followChanges();
    OBPathWatcher& watcher = test.host().pathWatcher();
    watcher.watchPath_observer("/a", &listener);
    test.machine.bare.pathWatching.tell("/a", { PathChange::Kind::folderChanged, true, false, "/a" });
    CHECK(test.machine.bare.clock.waitForSleep(std::chrono::seconds(1)));
    test.machine.bare.clock.advance(std::chrono::seconds(1));
    CHECK(test.host().waitForThreads(longestWait));
    watcher.removeObserver(&listener);
}
