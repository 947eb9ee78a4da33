#include "tests/plugin/watching/FollowedSource.h"

#include "host/OBConstants.h"
#include "platform/Notifications.h"

#include <doctest/doctest.h>

#include <thread>

using namespace tests;
using platform::PathChange;
using std::chrono::milliseconds;
using std::chrono::seconds;
using Lines = std::vector<std::string>;

TEST_CASE("a change among the projects is answered after 5.0 seconds by one reload of the projects")
{
    FollowedSource test;
    test.projects().project("Second");
    test.change(test.projectsFolder());
    CHECK(test.clock.waitForSleep(seconds(5)));
    test.clock.advance(milliseconds(4999));
    CHECK(test.clock.waitForSleep(milliseconds(1)));
    CHECK(test.published.lines().empty());
    test.clock.advance(milliseconds(1));
    CHECK(test.published.waitFor("projects: First Second Events"));
}

TEST_CASE("a change anywhere else is answered after 5.0 seconds by one reload of the events")
{
    FollowedSource test;
    test.clip("Walk", "b.mov", noonOf(2013));
    test.change(test.eventsFolder());
    CHECK(test.clock.waitForSleep(seconds(5)));
    test.clock.advance(milliseconds(4999));
    CHECK(test.clock.waitForSleep(milliseconds(1)));
    CHECK(test.published.lines().empty());
    test.clock.advance(milliseconds(1));
    CHECK(test.published.waitFor("events: First Events"));
    CHECK(test.eventNames() == "Walk Trip");
}

TEST_CASE("changes that come while a reload waits schedule nothing more, of each half by itself")
{
    FollowedSource test;
    test.change(test.projectsFolder());
    CHECK(test.clock.waitForSleep(seconds(5)));
    test.clock.advance(seconds(2));
    test.change(test.projectsFolder() + "/First");
    test.change(test.projectsFolder());
    test.change(test.eventsFolder());
    CHECK(test.clock.waitForSleep(seconds(5)));
    test.clock.advance(seconds(3));
    CHECK(test.published.waitFor("projects: First Events"));
    CHECK(test.published.lines().size() == 1);
    test.clock.advance(seconds(2));
    CHECK(test.published.waitFor("events: First Events"));
    CHECK(test.published.lines().size() == 2);
    test.change(test.projectsFolder());
    CHECK(test.clock.waitForSleep(seconds(5)));
    test.clock.advance(seconds(5));
    CHECK(test.published.waitFor("projects: First Events", 2));
}

TEST_CASE("only a whole component that is exactly the name of the projects folder makes a change one of projects")
{
    struct Row {
        const char* path;
        const char* half;
    };
    const std::vector<Row> rows {
        { "/gone/Montaro Projects", "projects" },
        { "/gone/Montaro Projects/deep/er", "projects" },
        { "Montaro Projects/a", "projects" },
        { "/Montaro Projects/", "projects" },
        { "/gone/Montaro Projects 2/a", "events" },
        { "/gone/My Montaro Projects", "events" },
        { "/gone/montaro projects", "events" },
        { "/", "events" },
        { "XXX", "events" },
    };
    for (const Row& row : rows) {
        CAPTURE(std::string(row.path));
        FollowedSource test;
        test.change(row.path);
        CHECK(test.clock.waitForSleep(seconds(5)));
        test.clock.advance(seconds(5));
        CHECK(test.published.waitFor(std::string(row.half) + ": First Events"));
        CHECK(test.published.lines() == Lines { std::string(row.half) + ": First Events" });
    }
}

TEST_CASE("a change of the shared preferences reads the editor's preferences again and does nothing else")
{
    FollowedSource test;
    const std::string path = test.disk.file("home/Library/Preferences/org.ombrix.Zuno.plist");
    CHECK(test.source->inspection()->mostRecentEventFirst() == true);
    test.arrangeNewestFirst(false);
    test.source->watchedPathChanged_fileChangedEventFlags(path, 0);
    CHECK(test.source->inspection()->mostRecentEventFirst() == false);
    CHECK(test.clock.sleepers() == 0);
    // No flag was set: the next change is answered.
    test.change(test.eventsFolder());
    CHECK(test.clock.waitForSleep(seconds(5)));
    test.clock.advance(seconds(5));
    CHECK(test.published.waitFor("events: First Events"));
}

TEST_CASE("the shared preferences are compared by their path alone, whether or not they exist")
{
    FollowedSource test;
    test.arrangeNewestFirst(false);
    test.source->watchedPathChanged_fileChangedEventFlags(
        test.disk.path("home/Library/Preferences/org.ombrix.Zuno.plist"), 0);
    CHECK(test.source->inspection()->mostRecentEventFirst() == false);
    CHECK(test.clock.sleepers() == 0);
}

TEST_CASE("a change of the editor's own preferences file is one of a plain file: nothing is read again")
{
    FollowedSource test;
    test.arrangeNewestFirst(false);
    test.source->watchedPathChanged_fileChangedEventFlags(
        test.disk.file("home/Library/Preferences/org.ombrix.Montaro.plist"), 0);
    CHECK(test.source->inspection()->mostRecentEventFirst() == true);
    CHECK(test.clock.sleepers() == 0);
}

TEST_CASE("a file that is no object of the root changes nothing, whatever the components of its path")
{
    FollowedSource test;
    test.source->watchedPathChanged_fileChangedEventFlags(
        test.disk.file("home/Movies/Montaro Projects/First/notes.txt"), 0);
    test.source->watchedPathChanged_fileChangedEventFlags(test.disk.file("somewhere/else"), 0);
    CHECK(test.clock.sleepers() == 0);
    CHECK(test.published.lines().empty());
}

TEST_CASE("a movie of the root that changed is given its own thumbnail again, and nothing is reloaded")
{
    FollowedSource test;
    Trace read;
    test.movies.whenRead = [&read](std::string_view path) { read.add(std::string(path)); };
    const OBMediaObjectRef clip = test.source->rootMediaGroup()->mediaObjects().objects().front();
    CHECK(clip->name() == "a");
    test.source->watchedPathChanged_fileChangedEventFlags(clip->path(), 0);
    CHECK(read.lines() == Lines { clip->path().string() });
    const OBImageRef picture = clip->thumbnailImage();
    test.source->watchedPathChanged_fileChangedEventFlags(clip->path(), 0);
    CHECK(clip->thumbnailImage() == picture);
    CHECK(read.lines().size() == 1);
    CHECK(test.clock.sleepers() == 0);
    CHECK(test.published.lines().empty());
}

TEST_CASE("while a cancel is pending a changed path schedules nothing, and a change of the project query does")
{
    FollowedSource test;
    {
        HeldLoad load(test, *test.source);
        test.source->cancelLoad();
        std::thread other([&] {
            test.source->watchedPathChanged_fileChangedEventFlags(test.projectsFolder(), 0);
            test.source->watchedPathChanged_fileChangedEventFlags(test.eventsFolder(), 0);
        });
        other.join();
        CHECK(test.clock.sleepers() == 0);
        test.callOnThread([&] {
            test.source->watchedQueryChanged_queryScope(
                { platform::metadataQueryUpdatedNotification }, { test.projectsFolder() });
        });
        CHECK(test.clock.waitForSleep(seconds(5)));
    }
    test.clock.advance(seconds(5));
    // The load that was cancelled found nothing.
    CHECK(test.published.waitFor("projects: First"));
}

TEST_CASE("on the main thread a change of projects reloads at once")
{
    FollowedSource test;
    test.projects().project("Second");
    test.onMainThread([&] { test.source->watchedPathChanged_fileChangedEventFlags(test.projectsFolder(), 0); });
    CHECK(test.published.lines() == Lines { "projects: First Second Events" });
    CHECK(test.clock.sleepers() == 0);
    CHECK(test.mainRunLoop.delayedCalls().empty());
}

TEST_CASE("on the main thread a change of events reloads once 5.0 seconds later, also while a modal dialog runs")
{
    FollowedSource test;
    test.clip("Walk", "b.mov", noonOf(2013));
    test.onMainThread([&] {
        test.source->watchedPathChanged_fileChangedEventFlags(test.eventsFolder(), 0);
        test.source->watchedPathChanged_fileChangedEventFlags(test.eventsFolder(), 0);
    });
    CHECK(test.published.lines().empty());
    CHECK(test.mainRunLoop.delayedCalls() == Lines { "5000 ms in modes 3" });
    test.mainRunLoop.letDelayedCallsFallDue();
    CHECK(test.published.lines() == Lines { "events: First Events" });
    CHECK(test.eventNames() == "Walk Trip");
}

TEST_CASE("a delayed reload of a source that has ended does not happen")
{
    FollowedSource test;
    test.onMainThread([&] { test.source->watchedPathChanged_fileChangedEventFlags(test.eventsFolder(), 0); });
    test.source = nullptr;
    test.mainRunLoop.letDelayedCallsFallDue();
    CHECK(test.published.lines().empty());
}

TEST_CASE("of a query only the news of its result counts")
{
    FollowedSource test;
    test.source->watchedQueryChanged_queryScope(
        { platform::metadataQueryFinishedGatheringNotification }, { test.projectsFolder() });
    test.source->watchedQueryChanged_queryScope({ "anything" }, { test.eventsFolder() });
    CHECK(test.clock.sleepers() == 0);
}

TEST_CASE("a query whose scope does not hold the default projects folder, or nothing, is about the events")
{
    for (const bool hasScope : { true, false }) {
        FollowedSource test;
        std::vector<std::string> scope;
        if (hasScope)
            scope = { "", test.eventsFolder(), "/Montaro Projects" };
        test.callOnThread([&test, scope] {
            test.source->watchedQueryChanged_queryScope({ platform::metadataQueryUpdatedNotification }, scope);
        });
        CHECK(test.clock.waitForSleep(seconds(5)));
        test.clock.advance(seconds(5));
        CHECK(test.published.waitFor("events: First Events"));
    }
}

TEST_CASE("the project query sleeps 5.0 seconds on whatever thread it is told on, and reloads the projects")
{
    FollowedSource test;
    const auto tell = [&test] {
        test.source->watchedQueryChanged_queryScope(
            { platform::metadataQueryUpdatedNotification }, { "", test.eventsFolder(), test.projectsFolder() });
    };
    std::thread waiting([&] { test.onMainThread(tell); });
    CHECK(test.clock.waitForSleep(seconds(5)));
    CHECK(test.published.lines().empty());
    std::thread second(tell); // finds that a reload waits
    second.join();
    test.clock.advance(seconds(5));
    waiting.join();
    CHECK(test.published.lines() == Lines { "projects: First Events" });
}

TEST_CASE("a project query reloads also when the default projects folder has gone")
{
    FollowedSource test;
    removeItem(test.projectsFolder());
    test.callOnThread([&] {
        test.source->watchedQueryChanged_queryScope(
            { platform::metadataQueryUpdatedNotification }, { test.projectsFolder() });
    });
    CHECK(test.clock.waitForSleep(seconds(5)));
    test.clock.advance(seconds(5));
    CHECK(test.published.waitFor("projects: Events"));
}

TEST_CASE("what is seen on disk reaches the source: a project that comes is shown, one that goes is not")
{
    FollowedSource test;
    const BundleBuilder second = test.projects().project("Second");
    test.pathWatching.tell(
        test.projectsFolder(), { PathChange::Kind::appeared, true, false, test.projectsFolder() + "/Second" });
    CHECK(test.clock.waitForSleep(seconds(5)));
    test.clock.advance(seconds(5));
    CHECK(test.published.waitFor("projects: First Second Events"));
    removeItem(second.path());
    test.pathWatching.tell(
        test.projectsFolder(), { PathChange::Kind::disappeared, true, false, test.projectsFolder() + "/Second" });
    CHECK(test.clock.waitForSleep(seconds(5)));
    test.clock.advance(seconds(5));
    CHECK(test.published.waitFor("projects: First Events"));
}

TEST_CASE("a source is at rest when no load, report, reload or delayed call of it is under way")
{
    FollowedSource test;
    CHECK(test.comesToRest());
    test.change(test.projectsFolder());
    CHECK_FALSE(test.source->isAtRest());
    CHECK(test.clock.waitForSleep(seconds(5)));
    CHECK_FALSE(test.source->isAtRest());
    test.clock.advance(seconds(5));
    CHECK(test.published.waitFor("projects: First Events"));
    CHECK(test.comesToRest());
    test.source->performAfterDelay(seconds(5), platform::RunLoopModes::common, [] {});
    CHECK_FALSE(test.source->isAtRest());
}
