#include "tests/plugin/watching/FollowedSource.h"

#include "platform/Notifications.h"
#include "tests/support/Turns.h"

#include <doctest/doctest.h>

#include <stdexcept>

using namespace tests;
using std::chrono::seconds;
using Lines = std::vector<std::string>;

namespace {

void tellOfVolume(SourceMachine& machine, const char* path)
{
    platform::Value::Dictionary userInfo;
    if (path)
        userInfo.emplace_back(platform::Text(platform::mountedVolumePathKey), path);
    machine.workspaceNotifications.post({ platform::volumeMountedNotification, nullptr, std::move(userInfo) });
}

std::vector<std::string> eventPaths(FollowedSource& test)
{
    return test.abbreviated(test.source->inspection()->eventSearchPaths());
}

const Lines before { "DISK/home/Movies/Montaro Events", "/Montaro Events" };

} // namespace

TEST_CASE("a mounted volume's event folder is searched from then on, after 5.0 seconds, also where it does not exist")
{
    FollowedSource test;
    test.volumes.local.store({ { "/media/disk", "Backup" } });
    tellOfVolume(test, "/media/disk");
    CHECK(test.clock.waitForSleep(seconds(5)));
    Lines expected = before;
    expected.emplace_back("/Volumes/Backup/Montaro Events");
    CHECK(eventPaths(test) == expected);
    test.clock.advance(seconds(5));
    CHECK(test.published.waitFor("events: First Events"));
}

TEST_CASE("events on a volume that is mounted later are shown")
{
    FollowedSource test;
    EventMachine::datedClip(test.volumeEvents("Backup").event("Old"), "o.mov", noonOf(2010));
    test.volumes.local.store({ { "/media/disk", "Backup" } });
    tellOfVolume(test, "/media/disk");
    CHECK(test.clock.waitForSleep(seconds(5)));
    test.clock.advance(seconds(5));
    CHECK(test.published.waitFor("events: First Events"));
    CHECK(test.eventNames() == "Trip Old");
}

TEST_CASE("a volume that is mounted again adds nothing and reloads nothing")
{
    FollowedSource test;
    test.volumes.local.store({ { "/media/disk", "Backup" } });
    tellOfVolume(test, "/media/disk");
    CHECK(test.clock.waitForSleep(seconds(5)));
    test.clock.advance(seconds(5));
    CHECK(test.published.waitFor("events: First Events"));
    tellOfVolume(test, "/media/disk");
    test.following = {};
    test.waitForThreads();
    CHECK(eventPaths(test).size() == 3);
    CHECK(test.published.lines().size() == 1);
}

TEST_CASE("network volumes, volumes without a name and notifications without a path change nothing")
{
    FollowedSource test;
    test.volumes.local.store({ { "/Network/Servers/a", "A" }, { "/private/Network/b", "B" }, { "/Networks", "C" },
        { "/media/nameless", "" } });
    tellOfVolume(test, "/Network/Servers/a");
    tellOfVolume(test, "/private/Network/b");
    tellOfVolume(test, "/Networks");
    tellOfVolume(test, "/media/nameless");
    tellOfVolume(test, nullptr);
    test.following = {};
    test.waitForThreads();
    CHECK(eventPaths(test) == before);
    CHECK(test.published.lines().empty());
}

TEST_CASE("before the first load a mounted volume adds nothing")
{
    SourceMachine machine;
    machine.volumes.local.store({ { "/media/disk", "Backup" } });
    const auto source = machine.makeSource();
    source->_fileSystemMountedThreaded({ platform::volumeMountedNotification, nullptr,
        platform::Value::Dictionary { { platform::Text(platform::mountedVolumePathKey), "/media/disk" } } });
    CHECK(machine.clock.sleepers() == 0);
    machine.volumes.local.store({});
    machine.load(*source);
    CHECK(machine.abbreviated(source->inspection()->eventSearchPaths()) == before);
}

TEST_CASE("a volume below a folder of projects' name reloads the projects, and its events are searched all the same")
{
    FollowedSource test;
    test.volumes.local.store({ { "/media/Montaro Projects", "Odd" } });
    tellOfVolume(test, "/media/Montaro Projects");
    CHECK(test.clock.waitForSleep(seconds(5)));
    CHECK(eventPaths(test).back() == "/Volumes/Odd/Montaro Events");
    test.clock.advance(seconds(5));
    CHECK(test.published.waitFor("projects: First Events"));
}

TEST_CASE("two volumes in quick succession are answered by one reload that covers both")
{
    FollowedSource test;
    EventMachine::datedClip(test.volumeEvents("One").event("Ones"), "o.mov", noonOf(2010));
    EventMachine::datedClip(test.volumeEvents("Two").event("Twos"), "t.mov", noonOf(2009));
    test.volumes.local.store({ { "/media/one", "One" }, { "/media/two", "Two" } });
    tellOfVolume(test, "/media/one");
    CHECK(test.clock.waitForSleep(seconds(5)));
    tellOfVolume(test, "/media/two");
    // The second worker leaves the reload to the first, which sleeps.
    CHECK(waitUntil([&] { return eventPaths(test).size() == 4 && test.host->threadCount() == 1; }));
    test.clock.advance(seconds(5));
    CHECK(test.published.waitFor("events: First Events"));
    CHECK(test.eventNames() == "Trip Ones Twos");
    test.following = {};
    test.waitForThreads();
    CHECK(test.published.lines().size() == 1);
}

TEST_CASE("an error of the worker is one line on the console, and the source goes on")
{
    FollowedSource test;
    test.volumes.local.store({ { "/media/disk", "Backup" } });
    test.files.onEachCall = [](std::string_view path) {
        if (path == "/media/disk")
            throw std::runtime_error("the disk is on fire");
    };
    tellOfVolume(test, "/media/disk");
    test.following = {};
    test.waitForThreads();
    CHECK(test.console.lines() == Lines { "Error in _fileSystemMountedThreaded: the disk is on fire" });
    CHECK(eventPaths(test).back() == "/Volumes/Backup/Montaro Events");
    CHECK(test.published.lines().empty());
}
