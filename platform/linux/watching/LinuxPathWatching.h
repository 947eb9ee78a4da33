#pragma once

#include "platform/PathWatching.h"
#include "platform/linux/watching/DeviceWatchers.h"
#include "platform/linux/watching/LinuxWatchingLimits.h"
#include "platform/linux/watching/WatchingCounts.h"

#include <atomic>
#include <cstdint>
#include <memory>
#include <string_view>

namespace platform {

class Clock;
class FileSystem;
class Threads;
class Volumes;

/// Follows folders by inotify(7), and by looking in intervals where that cannot be.
///
/// Nothing exists before the first watch: a thread and an inotify instance come with the first on each device and end
/// with its last, and a thread comes with each device that has to be polled. Nobody waits for them but the destructor,
/// which waits until a look that is under way has come to its end.
class LinuxPathWatching final : public PathWatching {
public:
    /// `files` tells where paths lead; it, `volumes` and the others outlive this object.
    LinuxPathWatching(const FileSystem& files, const Volumes& volumes, const Clock& clock, Threads& threads,
        LinuxWatchingLimits limits = {});
    ~LinuxPathWatching() override;
    LinuxPathWatching(const LinuxPathWatching&) = delete;
    LinuxPathWatching& operator=(const LinuxPathWatching&) = delete;

    /// By the clock with which the kernel stamps files, which stands still between its ticks. What is mounted is noted
    /// with it.
    Date timeOfChangesNow() const override;
    std::shared_ptr<void> watch(std::string_view path, Date since, PathWatchHandlers handlers) override;
    WatchingState state() const override;
    FollowingMeans meansOfFollowing(std::string_view path) const override;
    std::optional<WatchingLimits> limits(std::uint64_t furtherWatches) const override;
    /// What is mounted is told by this machine's own table, whatever `volumes` add to it.
    std::unique_ptr<PathWatching> withPathsOf(const FileSystem& files, const Volumes& volumes) const override;

private:
    explicit LinuxPathWatching(WatcherRoles roles);

    const std::shared_ptr<WatchingCounts> _counts;
    const std::shared_ptr<DeviceWatchers> _watchers;
    std::atomic<std::uint64_t> _lastNumber { 0 };
};

} // namespace platform
