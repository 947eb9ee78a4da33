#include "tests/platform/linux/watching/Listener.h"

#include <doctest/doctest.h>

#include <algorithm>
#include <cstdio>
#include <filesystem>
#include <fstream>
#include <functional>
#include <iterator>
#include <random>
#include <set>
#include <string>
#include <thread>
#include <vector>

#include <unistd.h>

using tests::Changes;
using tests::FollowedDisk;
using tests::Listener;

namespace {

namespace fs = std::filesystem;

using Paths = std::set<std::string>;

/// Everything below `root`, folders with a slash at their end.
Paths entriesBelow(const std::string& root)
{
    Paths entries;
    for (const fs::directory_entry& entry : fs::recursive_directory_iterator(root)) {
        const bool isFolder = entry.is_directory() && !entry.is_symlink();
        entries.insert(fs::relative(entry.path(), root).string() + (isFolder ? "/" : ""));
    }
    return entries;
}

std::size_t countFolders(const Paths& entries)
{
    return static_cast<std::size_t>(
        std::count_if(entries.begin(), entries.end(), [](const std::string& entry) { return entry.back() == '/'; }));
}

/// What is there as far as whoever keeps a list by what he is told can know.
void learn(const Changes& changes, Paths& known)
{
    for (const std::string& change : changes) {
        const std::string kind = change.substr(0, change.find(' '));
        const std::string path = change.substr(kind.size() + 1);
        if (kind == "appeared" || kind == "found")
            known.insert(path);
        if (kind != "disappeared" && kind != "left")
            continue;
        known.erase(path);
        if (path.back() == '/')
            std::erase_if(known, [&](const std::string& entry) { return entry.starts_with(path); });
    }
}

/// Does at random what people and programs do to folders and files.
class RandomWork {
public:
    /// In the folder `root`, to which it also copies the folder `copied`.
    RandomWork(std::string root, std::string copied, unsigned seed)
        : _root(std::move(root))
        , _copied(std::move(copied))
        , _random(seed)
    {
    }

    void doSomething()
    {
        std::error_code error;
        const std::string one = anyPath();
        const std::string other = anyPath();
        switch (number(7)) {
        case 0:
        case 1:
            fs::create_directories(one, error);
            break;
        case 2:
            std::ofstream(one + "/file " + std::to_string(number(3))).put('x');
            break;
        case 3:
            std::rename(one.c_str(), other.c_str());
            break;
        case 4:
            fs::remove_all(one, error);
            break;
        case 5:
            std::rename((one + "/file 1").c_str(), (other + "/file 2").c_str());
            break;
        default:
            fs::copy(_copied, other + "/copy", fs::copy_options::recursive, error);
        }
    }

private:
    unsigned number(unsigned count) { return static_cast<unsigned>(_random() % count); }
    std::string anyPath()
    {
        std::string path = _root;
        for (unsigned depth = number(3) + 1; depth > 0; --depth)
            path += '/' + std::string(1, static_cast<char>('a' + number(3)));
        return path;
    }

    const std::string _root;
    const std::string _copied;
    std::mt19937 _random;
};

} // namespace

TEST_CASE("after random changes every folder is watched, and whoever keeps a list by what he is told has it right")
{
    for (unsigned seed = 1; seed <= 10; ++seed) {
        CAPTURE(seed);
        FollowedDisk machine;
        const std::string root = machine.disk.folder("root");
        const std::string copied = machine.disk.folder("copied");
        machine.disk.file("copied/x/y/file 1");
        machine.disk.file("copied/z/file 2");
        machine.disk.file("root/a/b/file 1");
        machine.disk.file("root/b/c/file 2");
        Paths known = entriesBelow(root);
        Listener listener(machine.watching, root);
        const auto wayLength = machine.watching.state().watchedFolders - countFolders(known);
        std::thread([&] {
            RandomWork work(root, copied, seed);
            for (int count = 0; count < 300; ++count)
                work.doSomething();
        }).join();
        learn(tests::changesSoFar(listener, root), known);
        Paths real = entriesBelow(root);
        std::erase_if(real, [](const std::string& entry) { return entry.starts_with("marker"); });
        CHECK(Changes(known.begin(), known.end()) == Changes(real.begin(), real.end()));
        for (const std::string& entry : real) {
            if (entry.back() == '/')
                std::ofstream(root + '/' + entry + "probe").put('x');
        }
        const Changes probes = tests::changesSoFar(listener, root);
        for (const std::string& entry : real) {
            if (entry.back() != '/')
                continue;
            CAPTURE(entry);
            CHECK(std::count(probes.begin(), probes.end(), "appeared " + entry + "probe") == 1);
        }
        CHECK(machine.watching.state().watchedFolders == wayLength + countFolders(real));
    }
}

TEST_CASE("when reports are lost everything is looked at again, and everything counts as changed")
{
    FollowedDisk machine;
    machine.disk.folder("a/gone");
    Listener listener(machine.watching, machine.path("a"));
    Listener other(machine.watching, machine.path("a/later"));
    // The watcher is held in a handler until more has happened than the kernel keeps.
    platform::WakeSignal overflown;
    listener.onChange([&](const platform::PathChange&) { overflown.waitFor(std::chrono::minutes(1)); });
    machine.disk.folder("a/first");
    machine.disk.folder("a/x");
    machine.disk.folder("a/y");
    std::ifstream limit("/proc/sys/fs/inotify/max_queued_events");
    int events = 0;
    limit >> events;
    for (int count = 0; count < events; ++count) {
        tests::moveItem(machine.path("a/x"), machine.path("a/z"));
        tests::moveItem(machine.path("a/z"), machine.path("a/x"));
    }
    machine.disk.folder("a/later/inner");
    fs::remove(machine.path("a/gone"));
    overflown.raise();
    CHECK(listener.hears("anythingChanged ."));
    CHECK(other.hears("anythingChanged ."));
    CHECK(machine.watching.state().overflows == 1);
    machine.disk.file("a/later/inner/file");
    CHECK(listener.hears("appeared later/inner/file"));
    CHECK(other.hears("appeared inner/file"));
    machine.disk.folder("a/gone/again");
    CHECK(listener.hears("appeared gone/"));
}

TEST_CASE("watches may come and go from many threads while much happens")
{
    FollowedDisk machine;
    const std::string root = machine.disk.folder("root");
    Listener listener(machine.watching, root);
    std::vector<std::thread> threads;
    threads.emplace_back([&] {
        RandomWork work(root, machine.disk.folder("copied/a/b"), 7);
        for (int count = 0; count < 200; ++count)
            work.doSomething();
    });
    for (int number = 0; number < 3; ++number) {
        threads.emplace_back([&machine, number] {
            for (int count = 0; count < 20; ++count) {
                Listener passing;
                const std::string path = number == 0 ? "root" : number == 1 ? "root/a/b" : "root/c";
                passing.begin(machine.watching, machine.path(path), tests::afterEverything());
                if (count % 2 == 0)
                    passing.waitUntilStanding();
            }
        });
    }
    for (std::thread& thread : threads)
        thread.join();
    tests::changesSoFar(listener, root);
    listener.end();
    Listener again(machine.watching, root);
    std::ofstream(root + "/last").put('x');
    CHECK(again.hears("appeared last"));
}
