#include "platform/linux/watching/LinuxPathWatching.h"

#include "platform/linux/watching/InotifyLimits.h"
#include "platform/linux/watching/PolledMounts.h"
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
    : _counts(std::make_shared<WatchingCounts>())
    , _watchers(std::make_shared<DeviceWatchers>(std::move(roles), _counts))
{
}

LinuxPathWatching::~LinuxPathWatching()
{
    _watchers->end();
    _counts->threads.waitForNone();
}

Date LinuxPathWatching::timeOfChangesNow() const
{
    timespec now {};
    clock_gettime(CLOCK_REALTIME_COARSE, &now);
    const Date date { now.tv_sec, static_cast<std::uint32_t>(now.tv_nsec) };
    _watchers->mountsSeen().look(date);
    return date;
}

std::shared_ptr<void> LinuxPathWatching::watch(std::string_view path, Date since, PathWatchHandlers handlers)
{
    const std::uint64_t number = ++_lastNumber;
    _watchers->add(
        std::make_shared<const PathWatch>(PathWatch { number, std::string(path), since, std::move(handlers) }));
    return { _watchers.get(), [watchers = _watchers, number](void*) { watchers->remove(number); } };
}

WatchingState LinuxPathWatching::state() const
{
    return { _counts->watchedFolders, _counts->polledFolders, _counts->overflows };
}

FollowingMeans LinuxPathWatching::meansOfFollowing(std::string_view path) const
{
    const WatcherRoles& roles = _watchers->roles();
    const PolledMounts mounts(MountTable::read("/proc"), roles.limits.furtherPolledTypes);
    const WatchedPlace place
        = placeOfPath(roles.files, path, [&](std::string_view reached) { return !mounts.holds(reached); });
    if (mounts.isAutomountPoint(place.path))
        return FollowingMeans::nothing;
    return place.endsEarly || !roles.limits.mayUseInotify ? FollowingMeans::looking : FollowingMeans::reports;
}

std::optional<WatchingLimits> LinuxPathWatching::limits(std::uint64_t furtherWatches) const
{
    return inotifyLimits(furtherWatches);
}

std::unique_ptr<PathWatching> LinuxPathWatching::withPathsOf(const FileSystem& files, const Volumes& volumes) const
{
    const WatcherRoles& roles = _watchers->roles();
    std::vector<const Volumes*> all = roles.volumes;
    all.push_back(&volumes);
    return std::unique_ptr<PathWatching>(
        new LinuxPathWatching(WatcherRoles { files, std::move(all), roles.clock, roles.threads, roles.limits }));
}

} // namespace platform
