#include "tests/platform/linux/Environment.h"
#include "tests/platform/linux/watching/Listener.h"
#include "tests/support/BareMachine.h"
#include "tests/support/DescribedMachine.h"

#include <doctest/doctest.h>

#include <filesystem>
#include <fstream>
#include <string>
#include <utility>

#include <sys/stat.h>
#include <unistd.h>

using tests::Changes;
using tests::changesSoFar;
using tests::FollowedDisk;
using tests::FollowedFiles;
using tests::Listener;

TEST_CASE("a path that does not exist is awaited")
{
    FollowedDisk machine;
    Listener listener(machine.watching, machine.path("a/b/c"));
    CHECK(listener.take().empty());
    machine.disk.folder("a");
    machine.disk.folder("a/other");
    machine.disk.folder("a/b");
    machine.disk.folder("a/b/c");
    CHECK(listener.hears("anythingChanged ."));
    machine.disk.file("a/b/c/file");
    CHECK(listener.hears("appeared file"));
}

TEST_CASE("a path whose folders are made while its way is being watched is followed")
{
    constexpr int rounds = 300;
    FollowedFiles<tests::NotedFileSystem> machine;
    for (int round = 0; round < rounds; ++round) {
        const std::string top = machine.path("round " + std::to_string(round));
        const std::string awaited = top + "/b/c";
        Listener listener(machine.watching, awaited);
        const int before = machine.files.resolutions();
        tests::makeFolder(top);
        // Now and a little later the watcher is at the folders on the way.
        while (machine.files.resolutions() < before + 3 + round % 9) { }
        tests::makeFolder(top + "/b");
        tests::makeFolder(awaited);
        REQUIRE(tests::comesToHear(listener, awaited, "file"));
    }
}

TEST_CASE("a path is followed that was found again before the move of a folder above it was reported")
{
    FollowedDisk machine;
    const std::string watched = machine.disk.folder("library/sub");
    Listener above(machine.watching, machine.disk.path());
    Listener listener(machine.watching, watched);
    bool isMoved = false;
    // The reports of what the handler does come after the look that it delays.
    above.onChange([&](const platform::PathChange&) {
        if (std::exchange(isMoved, true))
            return;
        tests::moveItem(machine.path("library"), machine.path("before"));
        tests::makeFolder(watched);
    });
    REQUIRE(chmod(watched.c_str(), 0700) == 0);
    REQUIRE(above.hears("appeared before/"));
    changesSoFar(above, machine.disk.path());
    CHECK(tests::comesToHear(listener, watched, "file"));
}

TEST_CASE("what happens beside an awaited path is told to nobody")
{
    FollowedDisk machine;
    machine.disk.folder("a/x");
    Listener witness(machine.watching, machine.path("a/x"));
    Listener listener(machine.watching, machine.path("a/b"));
    machine.disk.file("a/c/file");
    machine.disk.folder("a/d");
    changesSoFar(witness, machine.path("a/x"));
    CHECK(listener.take().empty());
}

TEST_CASE("a folder on the way that another one replaces leads to what is in that")
{
    FollowedDisk machine;
    machine.disk.folder("way/a/b/c");
    machine.disk.folder("way/new/b/c");
    Listener listener(machine.watching, machine.path("way/a/b/c"));
    tests::moveItem(machine.path("way/a"), machine.path("way/old"));
    listener.until("anythingChanged .");
    tests::moveItem(machine.path("way/new"), machine.path("way/a"));
    listener.until("anythingChanged .");
    machine.disk.file("way/a/b/c/file");
    CHECK(listener.hears("appeared file"));
    machine.disk.file("way/old/b/c/unseen");
    std::filesystem::remove_all(machine.path("way"));
    CHECK(listener.until("anythingChanged .") == Changes { "appeared file", "arrivalEnded file", "disappeared file" });
    machine.disk.folder("way/a");
    machine.disk.folder("way/a/b/c");
    CHECK(listener.hears("anythingChanged ."));
}

TEST_CASE("a watched path that vanishes and returns is told both times, and followed again")
{
    FollowedDisk machine;
    machine.disk.file("a/file");
    Listener listener(machine.watching, machine.path("a"));
    tests::moveItem(machine.path("a"), machine.path("b"));
    CHECK(listener.until("anythingChanged .").empty());
    machine.disk.file("b/other");
    tests::moveItem(machine.path("b"), machine.path("a"));
    CHECK(listener.until("anythingChanged .").empty());
    machine.disk.file("a/third");
    CHECK(listener.hears("appeared third"));
    std::filesystem::remove_all(machine.path("a"));
    listener.until("anythingChanged .");
    machine.disk.folder("a");
    CHECK(listener.hears("anythingChanged ."));
}

TEST_CASE("the rename of a folder above a watched path is a change of it")
{
    FollowedDisk machine;
    machine.disk.folder("a/b/c");
    Listener listener(machine.watching, machine.path("a/b/c"));
    tests::moveItem(machine.path("a"), machine.path("z"));
    CHECK(listener.until("anythingChanged .").empty());
    tests::moveItem(machine.path("z"), machine.path("a"));
    CHECK(listener.until("anythingChanged .").empty());
    machine.disk.file("a/b/c/file");
    CHECK(listener.hears("appeared file"));
}

TEST_CASE("an awaited path is still awaited after the folder above it was renamed and another took its place")
{
    FollowedDisk machine;
    machine.disk.folder("a");
    Listener listener(machine.watching, machine.path("a/b/c"));
    tests::moveItem(machine.path("a"), machine.path("z"));
    machine.disk.folder("z/b/c");
    machine.disk.folder("a/b");
    machine.disk.folder("a/b/c");
    CHECK(listener.hears("anythingChanged ."));
    machine.disk.file("a/b/c/file");
    CHECK(listener.hears("appeared file"));
}

TEST_CASE("a link on the way that leads elsewhere is a change, and the new place is followed under the spelling")
{
    FollowedDisk machine;
    machine.disk.folder("one/inner");
    machine.disk.folder("two/inner");
    machine.disk.link("link", "one");
    const std::string chain = machine.disk.link("chain", machine.path("link"));
    Listener listener(machine.watching, chain + "/inner");
    machine.disk.file("one/inner/file");
    CHECK(listener.hears("appeared file"));
    listener.until("arrivalEnded file");
    machine.disk.link("new link", "two");
    tests::moveItem(machine.path("new link"), machine.path("link"));
    CHECK(listener.until("anythingChanged .").empty());
    machine.disk.file("two/inner/other");
    machine.disk.file("one/inner/unseen");
    CHECK(changesSoFar(listener, machine.path("two/inner")) == Changes { "appeared other", "arrivalEnded other" });
}

TEST_CASE("a path awaited through a link that leads nowhere is found where the link leads")
{
    FollowedDisk machine;
    machine.disk.link("link", "later/folder");
    Listener listener(machine.watching, machine.path("link"));
    machine.disk.folder("later/folder");
    CHECK(listener.hears("anythingChanged ."));
    machine.disk.file("later/folder/file");
    CHECK(listener.hears("appeared file"));
}

TEST_CASE("a folder above that can only be passed through does not keep a path from being followed")
{
    const auto check = [] {
        FollowedDisk machine;
        machine.disk.folder("a/b/c");
        chmod(machine.path("a").c_str(), 0300);
        Listener listener(machine.watching, machine.path("a/b/c"));
        tests::moveItem(machine.path("a/b"), machine.path("a/z"));
        const bool isTold = listener.hears("anythingChanged .") && listener.problems().empty();
        chmod(machine.path("a").c_str(), 0700);
        return isTold;
    };
    CHECK(tests::askAsOrdinaryUser(check) == tests::ChildAnswer::yes);
}

TEST_CASE("of a watched file changed content is told, and nothing of its neighbours")
{
    FollowedDisk machine;
    const std::string path = machine.disk.file("file", "x");
    Listener listener(machine.watching, path);
    Listener witness(machine.watching, machine.path(""));
    tests::writeFile(machine.path("neighbour"), "x");
    tests::writeFile(path, "y");
    CHECK(listener.until("contentChanged .").empty());
    CHECK(changesSoFar(witness, machine.path(""))
        == Changes { "appeared neighbour", "arrivalEnded neighbour", "contentChanged file" });
}

TEST_CASE("of a watched file disappearance, return and replacement are told by its own path only")
{
    FollowedDisk machine;
    const std::string path = machine.disk.file("a/file", "x");
    Listener listener(machine.watching, path);
    std::filesystem::remove(path);
    CHECK(listener.until("anythingChanged .").empty());
    tests::writeFile(path, "y");
    CHECK(listener.until("anythingChanged .").empty());
    Listener witness(machine.watching, machine.path("a"));
    const auto onlyOfItself = [&] {
        changesSoFar(witness, machine.path("a"));
        Changes changes = listener.take();
        const bool isTold = !changes.empty();
        std::erase(changes, "anythingChanged .");
        std::erase(changes, "contentChanged .");
        return isTold && changes.empty();
    };
    machine.disk.file("a/new", "z");
    tests::moveItem(machine.path("a/new"), path);
    CHECK(listener.hears("anythingChanged ."));
    CHECK(onlyOfItself());
    tests::writeFile(path, "y");
    CHECK(onlyOfItself());
    std::filesystem::remove(path);
    CHECK(listener.until("anythingChanged .").empty());
    machine.disk.folder("a/file");
    CHECK(listener.until("anythingChanged .").empty());
    machine.disk.file("a/file/inner");
    CHECK(listener.hears("appeared inner"));
}

TEST_CASE("changes on a described machine come in the spelling of its links and volumes")
{
    FollowedDisk machine;
    machine.disk.folder("real/inner");
    const std::string volume = machine.disk.folder("volume");
    tests::BareMachine bare(machine.files);
    tests::DescribedMachine description;
    description.link("/Ombrix Link", machine.path("real")).localVolume(volume, "Ombrix Disk");
    const platform::Platform described = description.platform(machine.path("machine.json"), bare.platform());
    const auto watching = machine.watching.withPathsOf(described.fileSystem, described.volumes);
    Listener linked(*watching, "/Ombrix Link/inner");
    Listener onVolume(*watching, "/Volumes/Ombrix Disk/Movies");
    machine.disk.file("real/inner/file");
    CHECK(linked.hears("appeared file"));
    machine.disk.folder("volume/Movies");
    CHECK(onVolume.hears("anythingChanged ."));
    machine.disk.file("volume/Movies/file");
    CHECK(onVolume.hears("appeared file"));
}
