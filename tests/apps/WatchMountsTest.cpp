#include "tests/apps/ProgramRun.h"
#include "tests/support/DescribedMachine.h"
#include "tests/support/LibraryBuilder.h"
#include "tests/support/OwnMounts.h"
#include "tests/support/TemporaryFolder.h"

#include <doctest/doctest.h>

#include <chrono>
#include <csignal>
#include <cstdio>
#include <fstream>
#include <string>
#include <thread>
#include <vector>

#include <sched.h>
#include <sys/mount.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

using namespace tests;

namespace {

constexpr const char* noMounts = "skipped: this system lets nobody have mounts of his own";
constexpr const char* place = "/media/ann/Holiday";

/// A scan may hold a volume for a moment, but whoever follows it does not.
bool unmounts(const std::string& path)
{
    const auto end = std::chrono::steady_clock::now() + std::chrono::minutes(1);
    while (umount2(path.c_str(), 0) != 0) {
        if (std::chrono::steady_clock::now() > end)
            return false;
        std::this_thread::yield();
    }
    return true;
}

bool succeeds(const std::string& program, std::vector<std::string> arguments)
{
    RunWishes wishes;
    wishes.program = program;
    wishes.arguments = std::move(arguments);
    return runProgram(wishes).status == 0;
}

/// A small disk in a file, which only root can mount.
class DiskImage {
public:
    explicit DiskImage(const std::string& path)
        : _path(path)
    {
        writeFile(path, {});
        _isMade = truncate(path.c_str(), off_t { 8 } << 20U) == 0
            && succeeds("/usr/sbin/mkfs.ext4", { "-q", "-F", "-L", "Holiday", path });
    }
    bool isMade() const { return _isMade; }
    bool mount() const { return succeeds("/usr/bin/mount", { "-o", "loop", _path, place }); }

private:
    const std::string _path;
    bool _isMade = false;
};

/// A home with an editor that is registered as real ones are.
class RealHome {
public:
    RealHome()
    {
        folder.folder("home/Movies/Montaro Projects");
        folder.folder("home/Movies/Montaro Events");
        folder.file("montaro");
        folder.file("data/applications/org.ombrix.Montaro.desktop",
            "[Desktop Entry]\nType=Application\nName=Montaro\nExec=" + folder.path("montaro") + "\n");
    }
    RunWishes watch(const std::vector<std::string>& options) const
    {
        RunWishes wishes { { "watch" }, { { "HOME", folder.path("home") }, { "XDG_DATA_HOME", folder.path("data") } } };
        wishes.arguments.insert(wishes.arguments.end(), options.begin(), options.end());
        return wishes;
    }
    LibraryBuilder events() const { return LibraryBuilder(folder.path("home/Movies/Montaro Events")); }

    const TemporaryFolder folder {};
};

/// A process that has its own users, in which anybody is root and may be given few watches.
bool takeWatches(int count)
{
    const std::string map = "0 " + std::to_string(geteuid()) + " 1";
    if (unshare(CLONE_NEWUSER) != 0)
        return false;
    std::ofstream("/proc/self/uid_map") << map;
    std::ofstream limit("/proc/sys/user/max_inotify_watches");
    limit << count;
    return static_cast<bool>(limit.flush());
}

} // namespace

TEST_CASE("a disk that is mounted while it is watched shows its events, can be unmounted, and they go")
{
    if (!enterOwnMounts() || !mountMemory("/media")) {
        MESSAGE(noMounts);
        return;
    }
    const RealHome home;
    makeFolder(place);
    const DiskImage disk(home.folder.path("disk"));
    if (!disk.isMade() || !disk.mount()) {
        MESSAGE("skipped: this system mounts no disk that lies in a file");
        return;
    }
    LibraryBuilder(std::string(place) + "/Montaro Events").event("Coast").movie("a.mov");
    REQUIRE(unmounts(place));
    RunningProgram changes(home.watch({ "--json", "--changes" }));
    RunningProgram lines(home.watch({}));
    REQUIRE(changes.prints("]}\n"));
    REQUIRE(lines.prints("watching"));
    REQUIRE(disk.mount());
    CHECK(changes.prints("\"name\":\"Coast\",\"path\":\"/Volumes/Holiday/Montaro Events/Coast\""));
    // Whether the volume or its folder is told first, nobody knows; the cause is of the first.
    CHECK(changes.prints("],\"removed\":[],\"changed\":[],\"cause\":\""));
    CHECK(lines.prints("+ Coast (1 clip)"));
    CHECK(unmounts(place));
    CHECK(changes.prints("\"removed\":[{\"kind\":\"group\",\"name\":\"Events\""));
    CHECK(lines.prints("- Coast (1 clip)"));
    // The second time nobody has to be told of the volume: its folder is awaited.
    CHECK(disk.mount());
    CHECK(changes.prints("{\"half\":\"events\",\"added\":[{\"kind\":\"group\",\"name\":\"Events\""));
    CHECK(unmounts(place));
    CHECK(changes.end(SIGTERM).errors.empty());
    CHECK(lines.end(SIGTERM).status == 0);
}

TEST_CASE("a file system in memory that a machine calls a disk comes and goes with projects and events")
{
    if (!enterOwnMounts()) {
        MESSAGE(noMounts);
        return;
    }
    const TemporaryFolder folder;
    const std::string stick = folder.folder("stick");
    const std::string store = folder.folder("store");
    DescribedMachine description;
    description.home(folder.folder("home")).editor(folder.file("montaro"));
    description.localVolume(stick, "Stick").link("/Volumes/Stick", stick).write(folder.path("machine.json"));
    REQUIRE(mountMemory(store));
    LibraryBuilder(store + "/Montaro Events").event("Coast").movie("a.mov");
    LibraryBuilder(store + "/Montaro Projects").project("Trip").movie("b.mov");
    RunningProgram program({ { "--machine", folder.path("machine.json"), "watch", "--json" } });
    REQUIRE(program.prints("]}\n"));
    REQUIRE(mount(store.c_str(), stick.c_str(), nullptr, MS_BIND, nullptr) == 0);
    CHECK(program.prints("\"name\":\"Trip\""));
    CHECK(program.prints("\"name\":\"Coast\""));
    CHECK(unmounts(stick));
    // Only now the root is empty: it began with a group of events, though without any.
    CHECK(program.prints("\"mediaObjects\":[],\"childGroups\":[]}\n"));
    CHECK(program.end(SIGTERM).status == 0);
    CHECK(unmounts(store));
}

TEST_CASE("where the kernel gives few watches the other folders are looked at, and that is said")
{
    const RealHome home;
    for (int number = 0; number < 40; ++number)
        home.events().event("Event " + std::to_string(number)).movie("a.mov");
    if (!takeWatches(30)) {
        MESSAGE("skipped: this system lets nobody have few watches");
        return;
    }
    RunningProgram program(home.watch({}));
    REQUIRE(program.prints("watching"));
    CHECK(program.prints(": looked at every 10 s only: the kernel's limit of watches ("));
    home.events().event("Event 7").movie("b.mov");
    home.events().event("Event 39").movie("b.mov");
    CHECK(program.prints("~ Event 39: 1 → 2 clips"));
    CHECK(program.prints("~ Event 7: 1 → 2 clips"));
    CHECK(program.end(SIGTERM).status == 0);
}

TEST_CASE("when the kernel drops reports nothing is lost, and that is said")
{
    std::uint64_t reports = 0;
    std::ifstream("/proc/sys/fs/inotify/max_queued_events") >> reports;
    const RealHome home;
    RunningProgram program(home.watch({}));
    REQUIRE(program.prints("watching"));
    program.stop();
    const std::string one = home.events().file("one").path("one");
    const std::string other = home.events().path("other");
    for (std::uint64_t count = 0; count <= reports; count += 4) {
        REQUIRE(std::rename(one.c_str(), other.c_str()) == 0);
        REQUIRE(std::rename(other.c_str(), one.c_str()) == 0);
    }
    home.events().event("Coast").movie("a.mov");
    program.goOn();
    CHECK(program.prints("warning   change queue overflowed; both halves are scanned again, nothing is missing\n"));
    CHECK(program.prints("+ Coast (1 clip)"));
    CHECK(program.end(SIGTERM).status == 0);
}
