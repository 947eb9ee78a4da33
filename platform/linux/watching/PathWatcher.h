#pragma once

#include "platform/linux/watching/FolderEvents.h"
#include "platform/linux/watching/FolderFollowing.h"
#include "platform/linux/watching/RootPlacing.h"
#include "platform/linux/watching/WatchingContext.h"
#include "platform/linux/watching/WatchingQueue.h"

#include <memory>
#include <string>
#include <vector>

namespace platform {

/// What the thread of a device does from its first watch to its last.
class PathWatcher {
public:
    /// `watchers` outlives this object.
    PathWatcher(DeviceWatchers& watchers, const std::string& device, std::shared_ptr<WatchingQueue> queue);

    /// Returns once nothing is watched any more.
    void run();

private:
    struct Work {
        bool hasTasks = false;
        bool hasEvents = false;
    };

    void watchMounts();
    PolledMounts mountsNow() const;
    void takeMounts();
    Work waitForWork();
    void takeTasks(WatchingTasks tasks);
    void takeEvents();
    void resynchronise();

    const std::shared_ptr<WatchingQueue> _queue;
    const Descriptor _mountTable; ///< tells whether it has changed since it was last asked
    WatchingContext _context;
    FolderFollowing _following { _context };
    RootPlacing _placing { _context, _following };
    FolderEvents _events { _context, _following };
    std::vector<std::shared_ptr<void>> _mountWatches {};
};

} // namespace platform
