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

    FolderPolling::Parts partsOfPolling(
        const WatcherRoles& roles, const std::shared_ptr<WatchingQueue>& queue, std::shared_ptr<WatchingCounts> counts)
    {
        return { roles.files, roles.clock, roles.threads, std::move(counts), roles.limits.pollInterval,
            [queue](std::vector<PollingReport> reports) { queue->report(std::move(reports)); } };
    }

} // namespace

PathWatcher::PathWatcher(const WatcherRoles& roles, std::shared_ptr<WatchingQueue> queue,
    std::shared_ptr<WatchingCounts> counts, const MountsSeen& mountsSeen)
    : _limits(roles.limits)
    , _queue(std::move(queue))
    , _counts(std::move(counts))
    , _context(roles.files, _limits, mountsSeen, *_queue, partsOfPolling(roles, _queue, _counts))
{
    watchMounts(roles);
}

// First the changes are followed, then the table is read, so that none is missed.
void PathWatcher::watchMounts(const WatcherRoles& roles)
{
    for (const Volumes* const volumes : roles.volumes) {
        if (auto watch = volumes->watchMounts([queue = _queue] { queue->noteMounts(); }))
            _mountWatches.push_back(std::move(watch));
    }
    _context.mounts = PolledMounts(MountTable::read(procFolder), _limits.furtherPolledTypes);
}

void PathWatcher::run()
{
    while (!_queue->endIfUnused()) {
        waitForWork();
        takeTasks();
        takeEvents();
        _events.tellDueContents();
        _placing.followNoted();
        _context.countWatches();
    }
    _counts->watchedFolders = 0;
}

void PathWatcher::waitForWork()
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
    std::array<pollfd, 2> sources { { { _queue->descriptor(), POLLIN, 0 },
        { _context.inotify.descriptor(), POLLIN, 0 } } };
    const int count = poll(sources.data(), sources.size(), timeout);
    if (count == 0 && _events.holdsMove())
        _events.releaseMove();
}

void PathWatcher::takeTasks()
{
    WatchingTasks tasks = _queue->take();
    if (tasks.mountsHaveChanged)
        _placing.takeMounts(PolledMounts(MountTable::read(procFolder), _limits.furtherPolledTypes));
    for (const auto& watch : tasks.added)
        _placing.begin(watch);
    for (const std::uint64_t watch : tasks.removed)
        _placing.end(watch);
    for (const PollingReport& report : tasks.reports)
        _placing.take(report);
    if (tasks.reportsWereLost)
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
    if (_context.inotify.isOpen())
        _context.inotify.forEachEvent(take);
    if (!isWhole)
        resynchronise();
}

// Reports were lost. All that have come up to now tell of what a look sees anyway.
void PathWatcher::resynchronise()
{
    ++_counts->overflows;
    _context.inotify.discardEvents();
    _events.forget();
    _placing.followAllAnew();
}

} // namespace platform
