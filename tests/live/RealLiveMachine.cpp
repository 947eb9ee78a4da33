#include "tests/live/RealLiveMachine.h"

#include "platform/PathText.h"
#include "plugin/MontaroConstants.h"
#include "tests/support/OwnMounts.h"

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <fstream>
#include <utility>

#include <sys/mount.h>

namespace tests {

using namespace std::chrono_literals;
using std::chrono::nanoseconds;

namespace {

    constexpr int hurry = 10; // how much faster than elsewhere things happen
    constexpr nanoseconds longestPause = 50ms;
    /// Now and then longer than a reload is put off, so that what happens meets it.
    constexpr nanoseconds longestRest = 6s;
    constexpr nanoseconds longestDropping = 5s;
    constexpr nanoseconds longestCall = 5ms;
    constexpr nanoseconds pollInterval = 1s;
    constexpr nanoseconds betweenLooks = 20ms;
    /// Longer than what is written without being closed goes unheard.
    constexpr nanoseconds quietTime = 1500ms;
    /// Longer than folders that are polled go unlooked at.
    constexpr nanoseconds quietTimeWithPolling = 2 * pollInterval + 500ms;
    constexpr nanoseconds longestWait = 2min;

    [[noreturn]] void giveUp(const char* what)
    {
        std::fprintf(stderr, "tests: %s\n", what);
        std::abort();
    }

    /// Sometimes few folders are watched or none, and the others are polled.
    platform::LinuxWatchingLimits drawnLimits(Chance& chance)
    {
        platform::LinuxWatchingLimits limits;
        limits.pollInterval = std::chrono::duration_cast<std::chrono::milliseconds>(pollInterval);
        limits.mayUseInotify = !chance.oneIn(6);
        if (chance.oneIn(6))
            limits.watchesAtMost = 5 + chance.below(40);
        return limits;
    }

    std::uint64_t reportsThatTheKernelKeeps()
    {
        std::uint64_t count = 0;
        std::ifstream("/proc/sys/fs/inotify/max_queued_events") >> count;
        return count;
    }

} // namespace

void RealVolumes::list(const ListedVolumes& volumes)
{
    const std::lock_guard guard(_lock);
    _listed = volumes;
    ++_timesListed;
}

std::uint64_t RealVolumes::generation() const
{
    const std::lock_guard guard(_lock);
    return _mounts.generation() + _timesListed;
}

std::vector<std::string> RealVolumes::localVolumes() const
{
    const std::lock_guard guard(_lock);
    return _listed.localVolumes();
}

std::vector<std::string> RealVolumes::removableMedia() const
{
    const std::lock_guard guard(_lock);
    return _listed.removableMedia();
}

std::string RealVolumes::displayName(std::string_view path) const
{
    const std::lock_guard guard(_lock);
    return _listed.displayName(path);
}

std::optional<std::string> RealVolumes::fileSystemType(std::string_view path) const
{
    const std::lock_guard guard(_lock);
    return _listed.fileSystemType(path);
}

RealLiveMachine::RealLiveMachine(std::uint64_t seed, void* linkedEntryPoint, bool mayMount)
    : _mayMount(mayMount)
    , _chance(seed)
    , _delays(seed + 1)
    , _links({ { "/" + std::string(MontaroProjectsFolderName), _disk.systemPath("/Montaro Projects") },
                 { "/" + std::string(MontaroEventsFolderName), _disk.systemPath("/Montaro Events") } },
          _mounted, _realFiles)
    , _kernelWatching(_linkedFiles, _mounted, _clock, _threads, drawnLimits(_chance))
    , _bundles(_realFiles, linkedEntryPoint)
{
    for (const char* folder : { "/Users/ann/Movies", "/Users/ann/Library/Preferences", "/media/ann", "/elsewhere" })
        _disk.makeFolders(folder);
    setenv("HOME", _disk.systemPath("/Users/ann").c_str(), 1);
    _workspace.applications = { { MontaroBundleIdentifier, _disk.systemPath("/opt/montaro") } };
    _files.onEachCall = [this](std::string_view) { delayCall(); };
    listVolumes();
    _mainThread = std::thread([this] { _mainRunLoop.run(); });
}

RealLiveMachine::~RealLiveMachine()
{
    _mainRunLoop.quit();
    _mainThread.join();
    for (const Volume& volume : volumes) {
        umount2(_disk.systemPath(volume.mountPoint).c_str(), MNT_DETACH);
        umount2(_stores.path(volume.displayName).c_str(), MNT_DETACH);
    }
}

platform::Platform RealLiveMachine::platform()
{
    return { _files, _pathWatching, _told, _workspace, _preferences, _metadataIndex, _movies, _notifications,
        _workspaceNotifications, _clock, _calendar, _threads, _mainRunLoop, _console, _bundles, _languages };
}

/// Now and then a call of the disk takes its time, so that other things happen inside a scan.
void RealLiveMachine::delayCall()
{
    nanoseconds delay {};
    alone([&] { delay = _delays.oneIn(6) ? _delays.time(longestCall) : nanoseconds(0); });
    if (delay.count() != 0)
        sleep(delay);
}

void RealLiveMachine::makeVolume(const Volume& volume)
{
    volumes.push_back(volume);
    _disk.makeFolders(volume.mountPoint);
    if (_mayMount && !mountMemory(_stores.folder(volume.displayName)))
        giveUp("no file system in memory can be mounted");
}

bool RealLiveMachine::mount(Volume& volume)
{
    const std::string place = _disk.systemPath(volume.mountPoint);
    const std::string store = _stores.path(volume.displayName);
    volume.isMounted = _mayMount && ::mount(store.c_str(), place.c_str(), nullptr, MS_BIND, nullptr) == 0;
    listVolumes();
    return volume.isMounted;
}

/// A scan may hold the volume for a moment, and so may a file that is being copied there; nothing else does.
bool RealLiveMachine::unmount(Volume& volume)
{
    const nanoseconds start = passed();
    while (umount2(_disk.systemPath(volume.mountPoint).c_str(), 0) != 0) {
        if (_disk.isWriting())
            return false;
        if (passed() - start > longestWait)
            giveUp("a volume that is watched cannot be unmounted");
        sleep(1ms);
    }
    volume.isMounted = false;
    listVolumes();
    return true;
}

void RealLiveMachine::listVolumes()
{
    ListedVolumes listed;
    listed.local = { { "/", "Boot" } };
    for (const Volume& volume : volumes) {
        if (!volume.isMounted)
            continue;
        listed.local.push_back({ spelled(volume.mountPoint), volume.displayName });
        if (volume.isRemovable)
            listed.removable.push_back({ spelled(volume.mountPoint), volume.displayName });
    }
    _mounted.list(listed);
    _told.list(listed);
}

void RealLiveMachine::tellVolumes(const ListedVolumes* told)
{
    if (told)
        _told.list(*told);
    else
        listVolumes();
}

/// While the watcher does not go on, more happens than the kernel keeps, and then what else happens.
void RealLiveMachine::dropReports()
{
    for (const char* const folder : { "/Users/ann/Movies/Montaro Projects", "/Users/ann/Movies/Montaro Events" }) {
        if (_disk.kindOf(folder) != platform::ItemKind::folder)
            continue;
        _pathWatching.hold();
        _disk.storm(folder, 4);
        _disk.storm(folder, reportsThatTheKernelKeeps() + 1000);
        after(_chance.time(longestDropping), [this] { _pathWatching.goOn(); });
        return;
    }
}

void RealLiveMachine::tell(const std::string& watchedPath, const platform::PathChange& change)
{
    _pathWatching.tell(watchedPath, change);
}

void RealLiveMachine::setWhenListing(std::function<platform::FileProblem(std::string_view)> whenListing)
{
    _files.whenListing = std::move(whenListing);
}

void RealLiveMachine::sleep(nanoseconds duration) const
{
    _clock.sleep(duration, _never);
}

void RealLiveMachine::makeCalls(nanoseconds until)
{
    while (!_calls.empty() && _calls.begin()->first <= until) {
        sleep(std::max(nanoseconds(0), _calls.begin()->first - passed()));
        const std::function<void()> call = std::move(_calls.extract(_calls.begin()).mapped());
        call();
    }
    sleep(std::max(nanoseconds(0), until - passed()));
}

void RealLiveMachine::pause(nanoseconds duration)
{
    makeCalls(passed() + std::min(duration, longestPause));
}

void RealLiveMachine::pauseBetweenOperations()
{
    const nanoseconds longest = _chance.oneIn(12) ? longestRest : longestPause;
    const auto drawn = _chance.below(static_cast<std::size_t>(longest.count()));
    makeCalls(passed() + nanoseconds(static_cast<std::int64_t>(drawn)));
}

void RealLiveMachine::after(nanoseconds delay, std::function<void()> call)
{
    _calls.emplace(passed() + delay / hurry, std::move(call));
}

void RealLiveMachine::waitUntilQuiet(const std::function<bool()>& isAtRest)
{
    while (!_calls.empty())
        makeCalls(_calls.begin()->first);
    const nanoseconds start = passed();
    nanoseconds quietSince = start;
    while (passed() - quietSince < (somethingIsPolled() ? quietTimeWithPolling : quietTime)) {
        sleep(betweenLooks);
        if (!isAtRest())
            quietSince = passed();
        if (passed() - start > longestWait)
            giveUp("what was changed does not come to rest");
    }
}

void RealLiveMachine::waitUntil(const std::function<bool()>& condition)
{
    const nanoseconds start = passed();
    while (!condition()) {
        sleep(betweenLooks);
        if (passed() - start > longestWait)
            giveUp("a load does not come to its end");
    }
}

void RealLiveMachine::end()
{
    _mainRunLoop.quit();
}

void RealLiveMachine::alone(const std::function<void()>& call)
{
    const std::lock_guard guard(_lock);
    call();
}

} // namespace tests
