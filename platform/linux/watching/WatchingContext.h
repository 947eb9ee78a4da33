#pragma once

#include "platform/linux/watching/DeviceWatchers.h"
#include "platform/linux/watching/FileArrivals.h"
#include "platform/linux/watching/FolderPolling.h"
#include "platform/linux/watching/InotifyInstance.h"
#include "platform/linux/watching/PolledMounts.h"
#include "platform/linux/watching/UntoldContents.h"
#include "platform/linux/watching/WatchedFolders.h"
#include "platform/linux/watching/WatchedRoots.h"

#include <cstddef>
#include <cstdint>
#include <string>
#include <utility>

namespace platform {

/// What the parts of the watcher share. The watcher's thread.
struct WatchingContext {
    WatchingContext(DeviceWatchers& all, std::string nameOfDevice, WatchingQueue& queue, FolderPolling::Parts parts)
        : watchers(all)
        , device(std::move(nameOfDevice))
        , files(all.roles().files)
        , limits(all.roles().limits)
        , mountsSeen(all.mountsSeen())
        , inotify(limits.mayUseInotify)
        , roots(folders, queue)
        , arrivals(limits.arrivalsAtMost)
        , counts(*parts.counts)
        , polling(std::move(parts))
    {
    }

    DeviceWatchers& watchers;
    const std::string device; ///< whose thread this is
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
    std::size_t counted = 0; ///< of its watches, in `counts`

    /// The device of this thread, by its number.
    std::string ownDevice() const { return device == DeviceWatchers::first ? mounts.deviceAt("/") : device; }

    /// Says how much is watched, before anybody is told that it is.
    void countWatches() { sayWatched(folders.watchCount()); }
    void sayWatched(std::size_t now) { counts.watchedFolders += now - std::exchange(counted, now); }
    /// By all threads together.
    std::uint64_t watchesInUse() const { return counts.watchedFolders - counted + folders.watchCount(); }
};

} // namespace platform
