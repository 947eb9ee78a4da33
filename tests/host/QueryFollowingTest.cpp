#include "host/OBConstants.h"
#include "host/OBMetadataQuery.h"
#include "host/OBPathWatcher.h"
#include "platform/Notifications.h"
#include "tests/host/TestHost.h"

#include <doctest/doctest.h>

#include <string>
#include <thread>
#include <vector>

using namespace tests;
using platform::PathChange;
using Kind = PathChange::Kind;
using Lines = std::vector<std::string>;

namespace {

constexpr const char* movieQuery = "(kMDItemContentType = 'org.ombrix.movie')";
const std::string finished(platform::metadataQueryFinishedGatheringNotification);
const std::string updated(platform::metadataQueryUpdatedNotification);

/// Writes down the notifications of its query, and stops at a gate.
class Listener : public OBPathWatcherObserver {
public:
    void watchedQueryChanged_queryScope(
        const platform::Notification& notification, const std::vector<std::string>& scope) override
    {
        scopes.write(scope.empty() ? "nothing" : scope.front());
        journal.write(notification.name.string());
    }
    Journal journal {};
    Journal scopes {};
};

/// An observer of one query over a folder on disk.
struct QueryOfFolder {
    explicit QueryOfFolder(const char* text = movieQuery)
        : following(test.host().followChanges())
    {
        watcher().watchQuery_observer_queryScope_queryRunMode(text, &listener, { folder }, OBQueryRunModeLive);
    }
    ~QueryOfFolder()
    {
        watcher().removeObserver(&listener);
        following = {};
    }
    OBPathWatcher& watcher() { return test.host().pathWatcher(); }
    ScriptedPathWatching& disk() { return test.machine.bare.pathWatching; }
    void tell(Kind kind, const std::string& name, bool isFolder = false, bool heldMore = false)
    {
        disk().tell(folder, { kind, isFolder, heldMore, folder + "/" + name });
    }
    /// Whether a change is told as an update.
    bool updates(Kind kind, const std::string& name, bool isFolder = false, bool heldMore = false)
    {
        tell(kind, name, isFolder, heldMore);
        disk().tellStanding(folder);
        CHECK(listener.journal.waitFor(finished));
        CHECK(waitUntil([this] { return watcher().isAtRest(&listener); })); // the two may overtake one another
        return listener.journal.count(updated) != 0;
    }

    TestHost test {};
    const std::string folder = test.machine.folder.folder("scope");
    Listener listener {};
    OBObservation following;
};

} // namespace

TEST_CASE("a query that asks by name or type tells that it has gathered once all its folders are followed")
{
    QueryOfFolder query;
    query.watcher().watchQuery_observer_queryScope_queryRunMode(
        movieQuery, &query.listener, { "/a", "/b" }, OBQueryRunModeLive);
    CHECK(query.disk().watchedPaths() == Lines { "/a", "/b" });
    query.disk().tellStanding("/a");
    query.disk().tell("/a", { Kind::anythingChanged, true, false, "/a" });
    CHECK(query.listener.journal.waitFor(updated));
    CHECK(query.listener.journal.count(finished) == 0);
    query.disk().tellStanding("/b");
    CHECK(query.listener.journal.waitFor(finished));
    CHECK(query.listener.scopes.lines() == Lines { "/a", "/a" });
}

TEST_CASE("a query that is registered again over other folders tells nothing more of the old ones")
{
    class Stopping : public OBPathWatcherObserver {
    public:
        void watchedQueryChanged_queryScope(
            const platform::Notification&, const std::vector<std::string>& scope) override
        {
            journal.write(scope.front());
            gate.pass();
        }
        Gate gate {};
        Journal journal {};
    };
    QueryOfFolder query;
    Stopping stopping;
    stopping.gate.close();
    query.watcher().watchQuery_observer_queryScope_queryRunMode(movieQuery, &stopping, { "/old" }, OBQueryRunModeLive);
    query.disk().tell("/old", { Kind::anythingChanged, true, false, "/old" });
    CHECK(stopping.gate.waitForArrivals(1));
    query.disk().tell("/old", { Kind::anythingChanged, true, false, "/old" });
    CHECK(stopping.gate.waitForArrivals(2));
    query.disk().tell("/old", { Kind::anythingChanged, true, false, "/old" });
    std::thread again([&] {
        query.watcher().watchQuery_observer_queryScope_queryRunMode(
            movieQuery, &stopping, { "/new" }, OBQueryRunModeLive);
    });
    while (query.watcher().queriesWatchedBy(&stopping).front().scope.front() == "/old")
        std::this_thread::yield();
    stopping.gate.open();
    again.join();
    query.disk().tell("/new", { Kind::anythingChanged, true, false, "/new" });
    CHECK(stopping.journal.waitFor("/new"));
    CHECK(stopping.journal.count("/old") == 2);
    query.watcher().removeObserver(&stopping);
}

TEST_CASE("a query over no folder has gathered at once")
{
    QueryOfFolder query;
    query.watcher().watchQuery_observer_queryScope_queryRunMode(movieQuery, &query.listener, {}, OBQueryRunModeLive);
    CHECK(query.listener.journal.waitFor(finished));
}

TEST_CASE("files that come into a result by their name or leave it are told, everything else is not")
{
    struct Row {
        Kind kind;
        const char* name;
        bool isTold;
    };
    for (const Row& row : std::vector<Row> {
             { Kind::appeared, "there.mov", true },
             { Kind::found, "there.mov", true },
             { Kind::appeared, "there.txt", false },
             { Kind::appeared, "gone.mov", true },
             { Kind::appeared, "link.mov", true },
             { Kind::disappeared, "gone.mov", true },
             { Kind::disappeared, "gone.txt", false },
             { Kind::contentChanged, "there.mov", false },
             { Kind::arrivalEnded, "there.mov", false },
         }) {
        CAPTURE(std::string(row.name));
        QueryOfFolder query;
        query.test.machine.folder.file("scope/there.mov");
        query.test.machine.folder.file("scope/there.txt");
        query.test.machine.folder.link("scope/link.mov", "there.mov");
        CHECK(query.updates(row.kind, row.name) == row.isTold);
    }
}

TEST_CASE("a folder with a movie's name is no file of the result")
{
    QueryOfFolder query;
    query.test.machine.folder.folder("scope/folder.mov");
    CHECK_FALSE(query.updates(Kind::appeared, "folder.mov", true));
}

TEST_CASE("where it is not known what left or changed, the result may have changed")
{
    struct Row {
        Kind kind;
        bool heldMore;
        bool isTold;
    };
    for (const Row& row : std::vector<Row> { { Kind::disappeared, true, true }, { Kind::disappeared, false, false },
             { Kind::folderChanged, false, true }, { Kind::anythingChanged, false, true },
             { Kind::attributesChanged, false, false } }) {
        QueryOfFolder query;
        CHECK(query.updates(row.kind, "folder", true, row.heldMore) == row.isTold);
    }
}

TEST_CASE("a text that is no query is logged once with its column, and finds nothing")
{
    QueryOfFolder query("kMDItemFSName = ");
    query.watcher().watchQuery_observer_queryScope_queryRunMode(
        "kMDItemFSName = ", &query.listener, { "/b" }, OBQueryRunModeLive);
    CHECK(query.disk().watchedPaths().empty());
    const Lines log = query.test.log->lines();
    REQUIRE(log.size() == 1);
    CHECK(log.front().find("column 17") != std::string::npos);
}

TEST_CASE("a query that asks for what lies in files tells when a file's content makes it come or go")
{
    QueryOfFolder query("kMDItemFSSize > 3");
    const std::string file = query.test.machine.folder.file("scope/a", "1234");
    query.disk().tellStanding(query.folder);
    CHECK(query.listener.journal.waitFor(finished));
    CHECK(query.listener.journal.count(updated) == 0);
    writeFile(file, "12");
    query.tell(Kind::contentChanged, "a");
    CHECK(query.listener.journal.waitFor(updated));
    writeFile(file, "123456");
    query.tell(Kind::contentChanged, "a");
    CHECK(query.listener.journal.waitFor(updated, 2));
    writeFile(file, "1234567");
    query.tell(Kind::contentChanged, "a");
    query.test.machine.folder.file("scope/b", "12345");
    query.tell(Kind::appeared, "b");
    CHECK(query.listener.journal.waitFor(updated, 3));
    CHECK(query.listener.journal.count(updated) == 3);
}

TEST_CASE("an application follows a query file by file: first what is there, then what comes and goes")
{
    TestHost test;
    Journal journal;
    const TemporaryFolder& disk = test.machine.folder;
    const std::string scope = disk.folder("scope");
    disk.file("scope/sub/a.mov");
    disk.file("scope/b.mov");
    disk.file("scope/c.txt");
    const OBMetadataQuery::ParseResult parsed = OBMetadataQuery::parse(movieQuery);
    const auto write = [&](const char* mark) {
        return [&journal, mark, size = scope.size()](
                   std::string_view path) { journal.write(mark + std::string(path.substr(size))); };
    };
    OBObservation following = test.host().followQuery(parsed.query, { scope },
        { .found = write(""), .gathered = [&] { journal.write("gathered"); }, .came = write("+"), .went = write("-") });
    ScriptedPathWatching& watching = test.machine.bare.pathWatching;
    watching.tellStanding(scope);
    CHECK(journal.waitFor("gathered"));
    CHECK(journal.lines() == Lines { "/b.mov", "/sub/a.mov", "gathered" });

    disk.file("scope/d.mov");
    watching.tell(scope, { Kind::appeared, false, false, scope + "/d.mov" });
    CHECK(journal.waitFor("+/d.mov"));
    watching.tell(scope, { Kind::appeared, false, false, scope + "/d.mov" });
    disk.file("other/e.mov");
    removeItem(scope + "/sub");
    watching.tell(scope, { Kind::disappeared, true, true, scope + "/sub" });
    CHECK(journal.waitFor("-/sub/a.mov"));
    removeItem(scope + "/b.mov");
    disk.file("scope/f.mov");
    disk.file("scope/sub/g.mov");
    watching.tell(scope, { Kind::folderChanged, true, false, scope });
    CHECK(journal.waitFor("+/f.mov"));
    watching.tell(scope, { Kind::anythingChanged, true, false, scope });
    CHECK(journal.waitFor("+/sub/g.mov"));
    CHECK(journal.lines()
        == Lines { "/b.mov", "/sub/a.mov", "gathered", "+/d.mov", "-/sub/a.mov", "-/b.mov", "+/f.mov", "+/sub/g.mov" });
    following = {};
    CHECK(watching.watchedPaths().empty());
}
