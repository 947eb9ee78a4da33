#include "platform/linux/watching/PathWatcher.h"

#include "platform/Volumes.h"

#include <algorithm>
#include <array>
#include <chrono>
#include <utility>

#include <poll.h>

namespace platform {

namespace {

    constexpr const char* procFolder = "/proc";

    FolderPolling::Parts partsOfPolling(DeviceWatchers& watchers, const std::shared_ptr<WatchingQueue>& queue)
    {
        const WatcherRoles& roles = watchers.roles();
        return { roles.files, roles.clock, roles.threads, watchers.counts(), roles.limits.pollInterval,
            [queue](std::vector<PollingReport> reports) { queue->report(std::move(reports)); } };
    }

} // namespace

PathWatcher::PathWatcher(DeviceWatchers& watchers, const std::string& device, std::shared_ptr<WatchingQueue> queue)
    : _queue(std::move(queue))
    , _mountTable(MountTable::open(procFolder))
    , _context(watchers, device, *_queue, partsOfPolling(watchers, _queue))
{
    watchMounts();
}

// First the changes are followed, then the table is read, so that none is missed.
void PathWatcher::watchMounts()
{
    for (const Volumes* const volumes : _context.watchers.roles().volumes) {
        if (auto watch = volumes->watchMounts([queue = _queue] { queue->noteMounts(); }))
            _mountWatches.push_back(std::move(watch));
    }
    _context.mounts = mountsNow();
}

PolledMounts PathWatcher::mountsNow() const
{
    return { MountTable::read(procFolder), _context.limits.furtherPolledTypes };
}

void PathWatcher::run()
{
    while (!_queue->endIfUnused()) {
        const Work work = waitForWork();
        WatchingTasks tasks = work.hasTasks ? _queue->take() : WatchingTasks {};
        // Another thread hands over by what is mounted now, and what is looked at is on what is mounted now.
        takeMounts();
        takeTasks(std::move(tasks));
        if (work.hasEvents)
            takeEvents();
        _events.tellDueContents();
        _placing.followNoted();
        _context.countWatches();
    }
    _context.sayWatched(0);
}

PathWatcher::Work PathWatcher::waitForWork()
{
    // The other half of a move comes with the next report or, cut off at the end of a read, at once.
    constexpr int waitForMove = 2;
    int timeout = -1;
    if (const auto due = _context.contents.nextDue()) {
        const auto rest = std::chrono::ceil<std::chrono::milliseconds>(*due - std::chrono::steady_clock::now());
        timeout = static_cast<int>(std::clamp<std::int64_t>(rest.count(), 0, 60'000));
    }
    if (_events.holdsMove())
        timeout = waitForMove;
    if (_context.roots.haveNotes())
        timeout = 0;
    std::array<pollfd, 2> sources { { { _queue->descriptor(), POLLIN, 0 },
        { _context.inotify.descriptor(), POLLIN, 0 } } };
    const int count = poll(sources.data(), sources.size(), timeout);
    if (count == 0 && _events.holdsMove())
        _events.releaseMove();
    return { count > 0 && sources[0].revents != 0, count > 0 && sources[1].revents != 0 };
}

void PathWatcher::takeTasks(WatchingTasks tasks)
{
    for (AddedWatch& added : tasks.added)
        _placing.begin(std::move(added));
    for (const std::uint64_t watch : tasks.removed)
        _placing.end(watch);
    for (const PollingReport& report : tasks.reports)
        _placing.take(report);
    if (tasks.reportsWereLost)
        _placing.followAllAnew();
}

void PathWatcher::takeMounts()
{
    // Whoever mounts without end must not hold up the rest.
    constexpr int readingsAtMost = 16;
    if (!MountTable::hasChanged(_mountTable.number()))
        return;
    PolledMounts now = _context.mounts;
    std::vector<std::string> points;
    int readings = 0;
    // What changes before a reading is in it, and must not look as if it had come and gone after it.
    do {
        PolledMounts next = mountsNow();
        const std::vector<std::string> changed = changedMountPoints(now.table(), next.table());
        points.insert(points.end(), changed.begin(), changed.end());
        now = std::move(next);
    } while (++readings < readingsAtMost && MountTable::hasChanged(_mountTable.number()));
    if (!points.empty())
        _placing.takeMounts(std::move(now), points);
    // The table is as before, and was not meanwhile: something was mounted for a moment, or was unmounted and mounted
    // again and bears the numbers that it had. Nothing tells where.
    else
        _placing.followAllAnew();
}

void PathWatcher::takeEvents()
{
    bool isWhole = true;
    const auto take = [&](const FolderEvent& event) {
        isWhole = _events.take(event);
        return isWhole;
    };
    // One buffer at a time: tasks come in between.
    _context.inotify.forEachEvent(take);
    if (!isWhole)
        resynchronise();
}

// Reports were lost. All that have come up to now tell of what a look sees anyway.
void PathWatcher::resynchronise()
{
    ++_context.counts.overflows;
    _context.inotify.discardEvents();
    _events.forget();
    _placing.followAllAnew();
}

} // namespace platform
