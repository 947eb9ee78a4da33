#include "tests/platform/linux/Environment.h"
#include "tests/platform/linux/watching/Listener.h"

#include <doctest/doctest.h>

#include <algorithm>
#include <cstdio>
#include <filesystem>
#include <fstream>
#include <string>
#include <vector>

#include <fcntl.h>
#include <linux/fs.h>
#include <sys/stat.h>
#include <sys/syscall.h>
#include <unistd.h>

using tests::Changes;
using tests::changesSoFar;
using tests::FollowedDisk;
using tests::Listener;

namespace {

Changes sorted(Changes changes)
{
    std::sort(changes.begin(), changes.end());
    return changes;
}

/// Makes a new file and closes it.
void makeFile(const std::string& path)
{
    std::ofstream file(path);
}

void exchangeItems(const std::string& one, const std::string& other)
{
    REQUIRE(syscall(SYS_renameat2, AT_FDCWD, one.c_str(), AT_FDCWD, other.c_str(), RENAME_EXCHANGE) == 0);
}

} // namespace

TEST_CASE("nothing exists before the first watch, and nothing stays after the last")
{
    FollowedDisk machine;
    const int before = tests::openDescriptors();
    {
        platform::LinuxPathWatching watching(machine.files, machine.volumes, machine.clock, machine.threads);
        CHECK(tests::openDescriptors() == before);
        Listener listener(watching, machine.path(""));
        CHECK(tests::openDescriptors() > before);
        CHECK(watching.state().watchedFolders > 0);
        listener.end();
    }
    CHECK(tests::openDescriptors() <= before + 2); // the mount table's thread ends in its own time
}

TEST_CASE("a file that is made is told to appear, and its arrival to end when it is closed")
{
    FollowedDisk machine;
    Listener listener(machine.watching, machine.path(""));
    const int file = open(machine.path("new").c_str(), O_CREAT | O_WRONLY | O_CLOEXEC, 0644);
    REQUIRE(write(file, "x", 1) == 1);
    CHECK(changesSoFar(listener, machine.path("")) == Changes { "appeared new" });
    REQUIRE(write(file, "y", 1) == 1);
    close(file);
    CHECK(changesSoFar(listener, machine.path("")) == Changes { "arrivalEnded new" });
}

TEST_CASE("a file that was there is told to have changed when it is closed")
{
    FollowedDisk machine;
    machine.disk.file("a/old", "x");
    Listener listener(machine.watching, machine.path(""));
    tests::writeFile(machine.path("a/old"), "y");
    CHECK(changesSoFar(listener, machine.path("")) == Changes { "contentChanged a/old" });
}

TEST_CASE("a write without a close is told after a quiet time")
{
    platform::LinuxWatchingLimits limits;
    limits.quietTime = std::chrono::milliseconds(20);
    FollowedDisk machine(limits);
    machine.disk.file("old", "x");
    Listener listener(machine.watching, machine.path(""));
    REQUIRE(truncate(machine.path("old").c_str(), 100) == 0);
    CHECK(listener.hears("contentChanged old"));
}

TEST_CASE("many writes without a close are told once in a quiet time")
{
    platform::LinuxWatchingLimits limits;
    limits.quietTime = std::chrono::hours(1);
    FollowedDisk machine(limits);
    machine.disk.file("old", "x");
    Listener listener(machine.watching, machine.path(""));
    const int file = open(machine.path("old").c_str(), O_WRONLY | O_CLOEXEC);
    for (int count = 0; count < 100; ++count) {
        REQUIRE(write(file, "y", 1) == 1);
        REQUIRE(changesSoFar(listener, machine.path("")).empty());
    }
    close(file);
    CHECK(changesSoFar(listener, machine.path("")) == Changes { "contentChanged old" });
}

TEST_CASE("writes to an arriving file that nobody closes are told in the end")
{
    platform::LinuxWatchingLimits limits;
    limits.arrivalQuietTime = std::chrono::milliseconds(20);
    FollowedDisk machine(limits);
    Listener listener(machine.watching, machine.path(""));
    const int file = open(machine.path("new").c_str(), O_CREAT | O_WRONLY | O_CLOEXEC, 0644);
    REQUIRE(write(file, "x", 1) == 1);
    CHECK(listener.hears("contentChanged new"));
    close(file);
    CHECK(listener.hears("arrivalEnded new"));
}

TEST_CASE("an arriving file keeps arriving under its new name")
{
    FollowedDisk machine;
    machine.disk.folder("a");
    machine.disk.folder("b");
    Listener listener(machine.watching, machine.path(""));
    const int file = open(machine.path("a/new.part").c_str(), O_CREAT | O_WRONLY | O_CLOEXEC, 0644);
    tests::moveItem(machine.path("a/new.part"), machine.path("b/new"));
    REQUIRE(write(file, "x", 1) == 1);
    close(file);
    CHECK(changesSoFar(listener, machine.path(""))
        == Changes { "appeared a/new.part", "disappeared a/new.part", "appeared b/new", "arrivalEnded b/new" });
}

TEST_CASE("the first close of a file that came with what it held is a change and the end of its arrival")
{
    FollowedDisk machine;
    machine.disk.folder("in");
    machine.disk.file("out/file", "x");
    machine.disk.file("out/folder/file", "x");
    Listener listener(machine.watching, machine.path("in"));
    tests::moveItem(machine.path("out/file"), machine.path("in/file"));
    tests::moveItem(machine.path("out/folder"), machine.path("in/folder"));
    CHECK(changesSoFar(listener, machine.path("in"))
        == Changes { "appeared file", "appeared folder/", "found folder/file" });
    tests::writeFile(machine.path("in/file"), "y");
    tests::writeFile(machine.path("in/folder/file"), "y");
    CHECK(changesSoFar(listener, machine.path("in"))
        == Changes {
            "contentChanged file", "arrivalEnded file", "contentChanged folder/file", "arrivalEnded folder/file" });
    tests::writeFile(machine.path("in/file"), "z");
    CHECK(changesSoFar(listener, machine.path("in")) == Changes { "contentChanged file" });
}

TEST_CASE("an arrival that is no longer kept in mind still ends")
{
    platform::LinuxWatchingLimits limits;
    limits.arrivalsAtMost = 1;
    FollowedDisk machine(limits);
    Listener listener(machine.watching, machine.path(""));
    const int file = open(machine.path("first").c_str(), O_CREAT | O_WRONLY | O_CLOEXEC, 0644);
    makeFile(machine.path("second"));
    makeFile(machine.path("third"));
    close(file);
    CHECK(listener.hears("arrivalEnded first"));
}

TEST_CASE("a folder is watched with all below it before it is told to appear, and then all in it is found")
{
    FollowedDisk machine;
    machine.disk.file("out/a/b/file", "x");
    machine.disk.folder("in");
    Listener listener(machine.watching, machine.path("in"));
    listener.onChange([&](const platform::PathChange& change) {
        if (change.kind == platform::PathChange::Kind::appeared && change.path == machine.path("in/a"))
            makeFile(change.path + "/b/made meanwhile");
    });
    tests::moveItem(machine.path("out/a"), machine.path("in/a"));
    const Changes changes = listener.until("appeared a/b/made meanwhile");
    REQUIRE(!changes.empty());
    CHECK(changes.front() == "appeared a/");
    const Changes found(changes.begin() + 1, changes.end());
    CHECK(sorted(found) == Changes { "found a/b/", "found a/b/file", "found a/b/made meanwhile" });
}

TEST_CASE("folders made one in another are all followed")
{
    FollowedDisk machine;
    Listener listener(machine.watching, machine.path(""));
    machine.disk.folder("a/b/c/d/e");
    machine.disk.file("a/b/c/d/e/file");
    CHECK(listener.hears("appeared a/"));
    const std::string deepest = machine.path("a/b/c/d/e");
    changesSoFar(listener, machine.path(""));
    tests::writeFile(deepest + "/file", "y");
    makeFile(deepest + "/other");
    CHECK(listener.hears("appeared a/b/c/d/e/other"));
}

TEST_CASE("what is deleted is told to disappear, and a deleted folder held nothing")
{
    FollowedDisk machine;
    machine.disk.file("a/file");
    machine.disk.folder("b");
    Listener listener(machine.watching, machine.path(""));
    std::filesystem::remove(machine.path("a/file"));
    std::filesystem::remove(machine.path("b"));
    CHECK(changesSoFar(listener, machine.path("")) == Changes { "disappeared a/file", "disappeared b/" });
}

TEST_CASE("a folder that is moved keeps its watches and is told under its new path with all in it")
{
    FollowedDisk machine;
    machine.disk.file("a/b/file");
    machine.disk.folder("z");
    Listener listener(machine.watching, machine.path(""));
    const auto before = machine.watching.state().watchedFolders;
    tests::moveItem(machine.path("a"), machine.path("z/c"));
    const Changes changes = changesSoFar(listener, machine.path(""));
    REQUIRE(changes.size() == 4);
    CHECK(Changes(changes.begin(), changes.begin() + 2) == Changes { "left a/", "appeared z/c/" });
    CHECK(sorted(changes) == Changes { "appeared z/c/", "found z/c/b/", "found z/c/b/file", "left a/" });
    CHECK(machine.watching.state().watchedFolders == before);
    makeFile(machine.path("z/c/b/other"));
    CHECK(listener.hears("appeared z/c/b/other"));
}

TEST_CASE("a folder that is moved out is gone with what it held, and no longer followed")
{
    FollowedDisk machine;
    machine.disk.file("in/a/file");
    machine.disk.folder("out");
    Listener listener(machine.watching, machine.path("in"));
    tests::moveItem(machine.path("in/a"), machine.path("out/a"));
    CHECK(changesSoFar(listener, machine.path("in")) == Changes { "left a/" });
    makeFile(machine.path("out/a/other"));
    CHECK(changesSoFar(listener, machine.path("in")).empty());
}

TEST_CASE("a file renamed over another one is the one gone and the other come")
{
    FollowedDisk machine;
    machine.disk.file("one");
    machine.disk.file("other");
    Listener listener(machine.watching, machine.path(""));
    tests::moveItem(machine.path("one"), machine.path("other"));
    CHECK(changesSoFar(listener, machine.path("")) == Changes { "disappeared one", "appeared other" });
}

TEST_CASE("after a folder has replaced an empty one it is followed at its new place")
{
    FollowedDisk machine;
    machine.disk.folder("one/inner");
    machine.disk.folder("other");
    Listener listener(machine.watching, machine.path(""));
    tests::moveItem(machine.path("one"), machine.path("other"));
    CHECK(changesSoFar(listener, machine.path("")) == Changes { "left one/", "appeared other/", "found other/inner/" });
    makeFile(machine.path("other/inner/file"));
    CHECK(listener.hears("appeared other/inner/file"));
}

TEST_CASE("of two entries that change places the last that is told is that both are there")
{
    FollowedDisk machine;
    machine.disk.file("one/a");
    machine.disk.file("other/b");
    machine.disk.file("file");
    Listener listener(machine.watching, machine.path(""));
    for (const std::string& partner : { std::string("other"), std::string("file") }) {
        exchangeItems(machine.path("one"), machine.path(partner));
        const Changes changes = changesSoFar(listener, machine.path(""));
        for (const std::string& name : { std::string("one"), partner }) {
            const auto isOf = [&](const std::string& change) {
                const auto text = change.substr(change.find(' ') + 1);
                return change[0] != 'f' && (text == name || text == name + "/");
            };
            const auto last = std::find_if(changes.rbegin(), changes.rend(), isOf);
            REQUIRE(last != changes.rend());
            CHECK(last->substr(0, 9) == "appeared ");
        }
    }
    makeFile(machine.path("file/new in b"));
    CHECK(listener.hears("appeared file/new in b"));
    makeFile(machine.path("other/new in a"));
    CHECK(listener.hears("appeared other/new in a"));
}

TEST_CASE("permissions and times of a folder are told once, those of a file not at all")
{
    FollowedDisk machine;
    machine.disk.file("a/file");
    Listener listener(machine.watching, machine.path(""));
    chmod(machine.path("a").c_str(), 0700);
    chmod(machine.path("a/file").c_str(), 0600);
    CHECK(changesSoFar(listener, machine.path("")) == Changes { "attributesChanged a/" });
    chmod(machine.path("").c_str(), 0700);
    CHECK(changesSoFar(listener, machine.path("")) == Changes { "attributesChanged ." });
}

TEST_CASE("each root hears in its own spelling, once, of what happens in folders that several share")
{
    FollowedDisk machine;
    machine.disk.folder("a/b");
    const std::string link = machine.disk.link("link", "a");
    Listener outer(machine.watching, machine.path("a"));
    Listener inner(machine.watching, machine.path("a/b"));
    Listener linked(machine.watching, link);
    const auto watches = machine.watching.state().watchedFolders;
    makeFile(machine.path("a/b/file"));
    const Changes expected { "appeared b/file", "arrivalEnded b/file" };
    CHECK(changesSoFar(outer, machine.path("a")) == expected);
    CHECK(inner.until("arrivalEnded file") == Changes { "appeared file" });
    CHECK(linked.until("arrivalEnded b/file") == Changes { "appeared b/file" });
    outer.end();
    linked.end();
    makeFile(machine.path("a/b/other"));
    makeFile(machine.path("a/outside"));
    CHECK(changesSoFar(inner, machine.path("a/b")) == Changes { "appeared other", "arrivalEnded other" });
    CHECK(machine.watching.state().watchedFolders <= watches);
}

TEST_CASE("a folder that changed after the given time counts as a change of anything, once a root")
{
    FollowedDisk machine;
    machine.disk.folder("a/b");
    machine.disk.folder("a/c");
    const platform::Date since = machine.watching.timeOfChangesNow();
    machine.disk.file("a/b/file");
    machine.disk.file("a/c/file");
    Listener changed(machine.watching, machine.path(""), since);
    CHECK(changed.take() == Changes { "anythingChanged ." });
    Listener unchanged(machine.watching, machine.path(""), tests::afterEverything());
    CHECK(unchanged.take().empty());
}

TEST_CASE("no handler is called once the watch has gone, and a watch may go in its own handler")
{
    FollowedDisk machine;
    Listener witness(machine.watching, machine.path(""));
    Listener gone(machine.watching, machine.path(""));
    gone.onChange([&gone](const platform::PathChange&) { gone.end(); });
    makeFile(machine.path("first"));
    makeFile(machine.path("second"));
    CHECK(witness.hears("appeared second"));
    changesSoFar(witness, machine.path(""));
    CHECK(gone.take() == Changes { "appeared first" });
}

TEST_CASE("a handler may begin a watch")
{
    FollowedDisk machine;
    machine.disk.folder("a");
    Listener listener(machine.watching, machine.path(""));
    Listener second;
    listener.onChange([&](const platform::PathChange& change) {
        if (change.path == machine.path("go") && change.kind == platform::PathChange::Kind::appeared)
            second.begin(machine.watching, machine.path("a"), tests::afterEverything());
    });
    makeFile(machine.path("go"));
    REQUIRE(second.waitUntilStanding());
    makeFile(machine.path("a/file"));
    CHECK(second.hears("appeared file"));
}

TEST_CASE("an ordinary user is told when a folder becomes readable, and what is in it")
{
    FollowedDisk machine;
    machine.disk.file("a/closed/inner/file");
    for (const char* const folder : { "", "a", "a/closed", "a/closed/inner" })
        chmod(machine.path(folder).c_str(), 0777);
    const auto check = [&] {
        const std::string closed = machine.path("a/closed");
        tests::TemporaryFolder own;
        const std::string mine = own.folder("mine/closed");
        own.file("mine/closed/inner/file");
        chmod(mine.c_str(), 0);
        Listener listener(machine.watching, own.path("mine"));
        const bool isNoProblem = listener.problems().empty();
        chmod(mine.c_str(), 0700);
        const Changes changes = changesSoFar(listener, own.path("mine"));
        const Changes expected { "attributesChanged closed/", "found closed/inner/", "found closed/inner/file" };
        makeFile(mine + "/inner/other");
        return isNoProblem && changes == expected && listener.hears("appeared closed/inner/other");
    };
    CHECK(tests::askAsOrdinaryUser(check) == tests::ChildAnswer::yes);
}
