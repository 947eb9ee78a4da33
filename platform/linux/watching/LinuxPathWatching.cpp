#include "platform/linux/watching/LinuxPathWatching.h"

#include "platform/Threads.h"
#include "platform/linux/SignalsHeld.h"
#include "platform/linux/watching/InotifyLimits.h"
#include "platform/linux/watching/WatchedPlace.h"

#include <ctime>
#include <utility>

namespace platform {

LinuxPathWatching::LinuxPathWatching(
    const FileSystem& files, const Volumes& volumes, const Clock& clock, Threads& threads, LinuxWatchingLimits limits)
    : LinuxPathWatching(WatcherRoles { files, { &volumes }, clock, threads, std::move(limits) })
{
}

LinuxPathWatching::LinuxPathWatching(WatcherRoles roles)
    : _roles(std::move(roles))
    , _counts(std::make_shared<WatchingCounts>())
    , _mountsSeen(std::make_shared<MountsSeen>(_roles.volumes))
{
}

LinuxPathWatching::~LinuxPathWatching()
{
    {
        Locked guard(_lock);
        if (_queue)
            _queue->end();
    }
    _counts->threads.waitForNone();
}

Date LinuxPathWatching::timeOfChangesNow() const
{
    timespec now {};
    clock_gettime(CLOCK_REALTIME_COARSE, &now);
    const Date date { now.tv_sec, static_cast<std::uint32_t>(now.tv_nsec) };
    _mountsSeen->look(date);
    return date;
}

std::shared_ptr<void> LinuxPathWatching::watch(std::string_view path, Date since, PathWatchHandlers handlers)
{
    Locked guard(_lock);
    const std::uint64_t number = ++_lastNumber;
    const auto watch
        = std::make_shared<const PathWatch>(PathWatch { number, std::string(path), since, std::move(handlers) });
    if (!_queue || !_queue->add(watch)) {
        _queue = std::make_shared<WatchingQueue>();
        _queue->add(watch);
        if (!startThread())
            _queue->end();
    }
    return { _queue.get(), [queue = _queue, number](void*) { queue->remove(number); } };
}

bool LinuxPathWatching::startThread()
{
    _counts->threads.add();
    const SignalsHeld inherited;
    const bool isStarted = _roles.threads.startDetached(
        "watching", [roles = _roles, queue = _queue, counts = _counts, mounts = _mountsSeen] {
            PathWatcher(roles, queue, counts, *mounts).run();
            counts->threads.remove();
        });
    if (!isStarted)
        _counts->threads.remove();
    return isStarted;
}

WatchingState LinuxPathWatching::state() const
{
    return { _counts->watchedFolders, _counts->polledFolders, _counts->overflows };
}

FollowingMeans LinuxPathWatching::meansOfFollowing(std::string_view path) const
{
    const PolledMounts mounts(MountTable::read("/proc"), _roles.limits.furtherPolledTypes);
    const WatchedPlace place = placeOfPath(_roles.files, path, mounts);
    if (mounts.isAutomountPoint(place.path))
        return FollowingMeans::nothing;
    return place.isPolled || !_roles.limits.mayUseInotify ? FollowingMeans::looking : FollowingMeans::reports;
}

std::optional<WatchingLimits> LinuxPathWatching::limits(std::uint64_t furtherWatches) const
{
    return inotifyLimits(furtherWatches);
}

std::unique_ptr<PathWatching> LinuxPathWatching::withPathsOf(const FileSystem& files, const Volumes& volumes) const
{
    std::vector<const Volumes*> all = _roles.volumes;
    all.push_back(&volumes);
    return std::unique_ptr<PathWatching>(
        new LinuxPathWatching(WatcherRoles { files, std::move(all), _roles.clock, _roles.threads, _roles.limits }));
}

} // namespace platform
