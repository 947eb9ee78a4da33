#pragma once

#include "platform/linux/watching/FileArrivals.h"
#include "platform/linux/watching/FolderPolling.h"
#include "platform/linux/watching/InotifyInstance.h"
#include "platform/linux/watching/LinuxWatchingLimits.h"
#include "platform/linux/watching/MountsSeen.h"
#include "platform/linux/watching/PolledMounts.h"
#include "platform/linux/watching/UntoldContents.h"
#include "platform/linux/watching/WatchedFolders.h"
#include "platform/linux/watching/WatchedRoots.h"

#include <utility>

namespace platform {

class FileSystem;

/// What the parts of the watcher share. The watcher's thread.
struct WatchingContext {
    WatchingContext(const FileSystem& fileSystem, const LinuxWatchingLimits& theLimits, const MountsSeen& seen,
        WatchingQueue& queue, FolderPolling::Parts parts)
        : files(fileSystem)
        , limits(theLimits)
        , mountsSeen(seen)
        , inotify(theLimits.mayUseInotify)
        , roots(folders, queue)
        , arrivals(theLimits.arrivalsAtMost)
        , counts(*parts.counts)
        , polling(std::move(parts))
    {
    }

    const FileSystem& files;
    const LinuxWatchingLimits& limits;
    const MountsSeen& mountsSeen;
    InotifyInstance inotify;
    WatchedFolders folders {};
    WatchedRoots roots;
    FileArrivals arrivals;
    UntoldContents contents {};
    PolledMounts mounts {};
    WatchingCounts& counts;
    FolderPolling polling;

    /// Says how much is watched, before anybody is told that it is.
    void countWatches() { counts.watchedFolders = folders.watchCount(); }
};

} // namespace platform
