#pragma once

#include "platform/linux/watching/FolderEvents.h"
#include "platform/linux/watching/FolderFollowing.h"
#include "platform/linux/watching/RootPlacing.h"
#include "platform/linux/watching/WatchingContext.h"
#include "platform/linux/watching/WatchingCounts.h"
#include "platform/linux/watching/WatchingQueue.h"

#include <memory>
#include <vector>

namespace platform {

class Clock;
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

/// What the watcher's thread does from the first watch to the last.
class PathWatcher {
public:
    /// `mountsSeen` outlives this object.
    PathWatcher(const WatcherRoles& roles, std::shared_ptr<WatchingQueue> queue, std::shared_ptr<WatchingCounts> counts,
        const MountsSeen& mountsSeen);

    /// Returns once nothing is watched any more.
    void run();

private:
    void watchMounts(const WatcherRoles& roles);
    void waitForWork();
    void takeTasks();
    void takeEvents();
    void resynchronise();

    const LinuxWatchingLimits _limits;
    const std::shared_ptr<WatchingQueue> _queue;
    const std::shared_ptr<WatchingCounts> _counts;
    WatchingContext _context;
    FolderFollowing _following { _context };
    RootPlacing _placing { _context, _following };
    FolderEvents _events { _context, _following };
    std::vector<std::shared_ptr<void>> _mountWatches {};
};

} // namespace platform
