#include "platform/linux/watching/InotifyLimits.h"
#include "platform/linux/LinuxPlatform.h"
#include "tests/support/TemporaryFolder.h"

#include <doctest/doctest.h>

#include <string>

#include <sys/inotify.h>
#include <unistd.h>

using namespace tests;

TEST_CASE("watches and instances in use are counted over the processes of one user")
{
    const TemporaryFolder proc;
    proc.link("12/fd/3", "anon_inode:inotify");
    proc.file("12/fdinfo/3", "pos:\t0\ninotify wd:2 ino:1 sdev:1\ninotify wd:1 ino:2 sdev:1\n");
    proc.link("12/fd/4", "socket:[1]");
    proc.file("12/fdinfo/4", "inotify wd:1\n");
    proc.link("13/fd/5", "anon_inode:inotify");
    proc.file("13/fdinfo/5", "pos:\t0\n");
    proc.link("self/fd/5", "anon_inode:inotify");
    const platform::InotifyUse use = platform::inotifyUse(proc.path(), ::geteuid());
    CHECK(use.watches == 2);
    CHECK(use.instances == 2);
    CHECK(platform::inotifyUse(proc.path(), ::geteuid() + 1).instances == 0);
}

TEST_CASE("the watches of this process are seen as the kernel tells them")
{
    const TemporaryFolder folder;
    const int instance = ::inotify_init1(IN_CLOEXEC);
    REQUIRE(instance >= 0);
    for (const char* name : { "a", "b", "c" })
        REQUIRE(::inotify_add_watch(instance, folder.folder(name).c_str(), IN_CREATE) >= 0);
    folder.link("proc/1", "/proc/" + std::to_string(::getpid()));
    const platform::InotifyUse use = platform::inotifyUse(folder.path("proc"), ::geteuid());
    CHECK(use.watches >= 3);
    CHECK(use.instances >= 1);
    ::close(instance);
}

TEST_CASE("the command that raises the limit of watches leaves room for those that are wanted")
{
    const auto limits = platform::inotifyLimits(3'000'000);
    if (!limits) {
        MESSAGE("skipped: this kernel knows no inotify");
        return;
    }
    const std::string command = "sudo sysctl fs.inotify.max_user_watches=";
    REQUIRE(limits->watches.remedy.rfind(command, 0) == 0);
    const unsigned long long raised = std::stoull(limits->watches.remedy.substr(command.size()));
    CHECK(raised >= limits->watches.inUse + 3'000'000);
    CHECK(raised > limits->watches.allowed);
    CHECK(limits->instances.remedy.rfind("sudo sysctl fs.inotify.max_user_instances=", 0) == 0);
}

TEST_CASE("a folder on a disk is followed by the kernel's reports, be it there or not")
{
    const TemporaryFolder folder;
    platform::LinuxPlatform machine;
    const platform::PathWatching& watching = machine.platform().pathWatching;
    CHECK(watching.meansOfFollowing(folder.path()) == platform::FollowingMeans::reports);
    CHECK(watching.meansOfFollowing(folder.path("none")) == platform::FollowingMeans::reports);
}
