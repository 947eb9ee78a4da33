#include "tests/platform/linux/Environment.h"
#include "tests/platform/linux/watching/Listener.h"
#include "tests/support/VirtualClock.h"

#include <doctest/doctest.h>

#include <filesystem>
#include <fstream>
#include <string>

#include <sys/mount.h>

using tests::Changes;
using tests::Listener;

namespace {

/// A disk where time stands still until a test lets the polled folders be looked at.
struct PolledDisk {
    tests::TemporaryFolder disk {};
    platform::LinuxFileSystem files {};
    platform::LinuxVolumes volumes { files };
    tests::VirtualClock clock {};
    platform::LinuxThreads threads {};
    platform::LinuxPathWatching watching;

    explicit PolledDisk(platform::LinuxWatchingLimits limits)
        : watching(files, volumes, clock, threads, std::move(limits))
    {
    }
    std::string path(const std::string& relativePath) const { return disk.path(relativePath); }
    void lookAgain(int devices = 1)
    {
        REQUIRE(clock.waitForSleepers(devices));
        clock.advance(std::chrono::seconds(10));
    }
};

platform::LinuxWatchingLimits withoutInotify()
{
    platform::LinuxWatchingLimits limits;
    limits.mayUseInotify = false;
    return limits;
}

} // namespace

TEST_CASE("where no inotify instance can be had folders are looked at every ten seconds, and the remedy is told once")
{
    PolledDisk machine(withoutInotify());
    machine.disk.folder("a/b");
    Listener listener(machine.watching, machine.path(""));
    CHECK(machine.watching.state().watchedFolders == 0);
    CHECK(machine.watching.state().polledFolders == 3);
    machine.disk.file("a/b/file");
    machine.lookAgain();
    CHECK(listener.until("folderChanged a/b/") == Changes {});
    machine.disk.folder("c/d");
    machine.lookAgain();
    CHECK(listener.until("folderChanged c/d/") == Changes { "folderChanged .", "appeared c/", "folderChanged c/" });
    machine.disk.file("c/d/file");
    machine.lookAgain();
    CHECK(listener.until("folderChanged c/d/") == Changes {});
    std::filesystem::remove_all(machine.path("c"));
    machine.lookAgain();
    CHECK(listener.until("left c/") == Changes { "folderChanged ." });
    REQUIRE(listener.problems().size() == 1);
    CHECK(listener.problems().front().path == machine.path(""));
    CHECK(listener.problems().front().remedy.find("sudo sysctl fs.inotify.max_user_instances=") == 0);
}

TEST_CASE("a polled path that does not exist is awaited")
{
    PolledDisk machine(withoutInotify());
    Listener listener(machine.watching, machine.path("a/b"));
    CHECK(listener.take().empty());
    REQUIRE(machine.clock.waitForSleepers(1));
    machine.disk.folder("a/b");
    machine.lookAgain();
    CHECK(listener.hears("anythingChanged ."));
    std::filesystem::remove_all(machine.path("a"));
    listener.take();
    machine.lookAgain();
    CHECK(listener.hears("anythingChanged ."));
}

TEST_CASE("a polled folder that changed after the given time counts as a change of anything")
{
    PolledDisk machine(withoutInotify());
    const platform::Date since = machine.watching.timeOfChangesNow();
    machine.disk.folder("a/b");
    Listener listener(machine.watching, machine.path(""), since);
    CHECK(listener.take() == Changes { "anythingChanged ." });
}

TEST_CASE("folders beyond the limit of watches are polled, the others are not")
{
    platform::LinuxWatchingLimits limits;
    PolledDisk counted(limits);
    counted.disk.folder("a");
    {
        const Listener listener(counted.watching, counted.path("a"));
        limits.watchesAtMost = counted.watching.state().watchedFolders;
    }
    PolledDisk machine(limits);
    machine.disk.folder("a/beyond/inner");
    Listener listener(machine.watching, machine.path("a"));
    REQUIRE(listener.hearsFailure());
    REQUIRE(machine.clock.waitForSleepers(1));
    REQUIRE(listener.problems().size() == 1);
    CHECK(listener.problems().front().path == machine.path("a/beyond"));
    CHECK(listener.problems().front().remedy == "sudo sysctl fs.inotify.max_user_watches=524288");
    machine.disk.file("a/file");
    CHECK(listener.until("arrivalEnded file") == Changes { "appeared file" });
    machine.disk.file("a/beyond/inner/file");
    machine.lookAgain();
    CHECK(listener.until("folderChanged beyond/inner/") == Changes {});
    CHECK(machine.watching.state().polledFolders == 2);
    tests::moveItem(machine.path("a/beyond"), machine.path("a/moved"));
    CHECK(listener.until("folderChanged moved/inner/").front() == "left beyond/");
    machine.disk.file("a/moved/inner/other");
    machine.lookAgain();
    CHECK(listener.hears("folderChanged moved/inner/"));
    std::filesystem::remove_all(machine.path("a/moved"));
    CHECK(listener.hears("disappeared moved/"));
}

TEST_CASE("folders of a file system that others change are polled, and nothing there is touched to tell")
{
    const auto check = [] {
        platform::LinuxWatchingLimits limits;
        limits.furtherPolledTypes = { "tmpfs" };
        PolledDisk machine(limits);
        machine.disk.folder("a/share");
        if (mount("memory", machine.path("a/share").c_str(), "tmpfs", 0, nullptr) != 0)
            return false;
        tests::makeFolder(machine.path("a/share/inner"));
        bool isRight = true;
        {
            Listener outer(machine.watching, machine.path("a"));
            Listener inner(machine.watching, machine.path("a/share/inner"));
            std::ofstream(machine.path("a/share/inner/file")).put('x');
            machine.lookAgain();
            isRight = inner.hears("folderChanged .") && outer.hears("folderChanged share/inner/")
                && outer.hearsFailure() && outer.problems().front().path == machine.path("a/share")
                && outer.problems().front().remedy.empty();
        }
        return umount(machine.path("a/share").c_str()) == 0 && isRight;
    };
    const tests::ChildAnswer answer = tests::askWithOwnMounts(check);
    if (answer == tests::ChildAnswer::impossible)
        MESSAGE("skipped: this system lets nobody have mounts of his own");
    CHECK(answer != tests::ChildAnswer::no);
}
