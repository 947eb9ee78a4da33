#pragma once

#include "platform/Clock.h"
#include "platform/ThreadSafety.h"
#include "platform/linux/watching/LinuxWatchingLimits.h"
#include "platform/linux/watching/MountsSeen.h"
#include "platform/linux/watching/RootHistory.h"
#include "platform/linux/watching/WatchingCounts.h"
#include "platform/linux/watching/WatchingQueue.h"

#include <cstdint>
#include <map>
#include <memory>
#include <string>
#include <vector>

namespace platform {

class FileSystem;
class Threads;
class Volumes;

/// What a watcher works with; all but the limits outlives its threads.
struct WatcherRoles {
    const FileSystem& files;
    std::vector<const Volumes*> volumes; ///< that tell of mounts
    const Clock& clock;
    Threads& threads;
    LinuxWatchingLimits limits {};
};

/// The watcher's threads: one for each device to which watched paths lead, so that a disk that does not answer keeps no
/// other's changes from being told. A thread comes with the first path and ends with the last. Any thread.
///
/// Where a path leads cannot be told without a look at the disks on its way. So each begins with the thread of "/",
/// which no program can do without, and is handed over wherever its way goes on to another device. What is mounted
/// below a watched folder is followed by the folder's thread all the same.
class DeviceWatchers : public std::enable_shared_from_this<DeviceWatchers> {
public:
    /// The name of the thread with which every path begins, beside the numbers of devices.
    static constexpr const char* first = "";

    DeviceWatchers(WatcherRoles roles, std::shared_ptr<WatchingCounts> counts);

    const WatcherRoles& roles() const noexcept { return _roles; }
    const std::shared_ptr<WatchingCounts>& counts() const noexcept { return _counts; }
    MountsSeen& mountsSeen() noexcept { return _mountsSeen; }

    void add(const std::shared_ptr<const PathWatch>& watch);
    /// No handler of it is called from now on. Waits for one that is being called by another thread.
    void remove(std::uint64_t number);
    /// Has the thread of `device` follow what the calling one has ceased to follow, unless it has been removed.
    void handOver(const std::shared_ptr<const PathWatch>& watch, const std::string& device, RootHistory history);
    /// Ends all threads, and lets none begin. Waits for handlers that are being called by other threads.
    void end();

private:
    using Queue = std::shared_ptr<WatchingQueue>;

    void giveTo(const std::string& device, const AddedWatch& added) REQUIRES(_lock);
    bool startThread(const std::string& device, const Queue& queue) REQUIRES(_lock);
    void threadEnds(const std::string& device, const Queue& queue);

    const WatcherRoles _roles;
    const std::shared_ptr<WatchingCounts> _counts;
    MountsSeen _mountsSeen;
    Mutex _lock; ///< taken before a queue's own
    std::map<std::string, Queue> _queues GUARDED_BY(_lock);
    std::map<std::uint64_t, Queue> _queueOfWatch GUARDED_BY(_lock);
    bool _hasEnded GUARDED_BY(_lock) = false;
};

} // namespace platform
