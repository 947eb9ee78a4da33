#pragma once

#include "platform/linux/watching/WatchingContext.h"

#include <cstdint>
#include <limits>
#include <string>
#include <string_view>

namespace platform {

/// Gives folders their watches and takes them away. The watcher's thread.
class FolderFollowing {
public:
    using Number = WatchedFolders::Number;

    /// What a look through a folder and all below it has shown.
    struct Look {
        bool isThere = true;
        bool hasChangedSince = false; ///< one of the folders, at the given time or later
        bool hasEntries = false;
    };

    /// A folder through which a way leads.
    struct WayFolder {
        Number entry = WatchedFolders::none; ///< none where there is no such folder
        bool isWatched = false; ///< what stands there now
        bool isRefused = false; ///< it is there, and gets no watch for want of any
    };

    /// Later than any change.
    static constexpr Date never { std::numeric_limits<std::int64_t>::max(), 0 };

    explicit FolderFollowing(WatchingContext& context)
        : _context(context)
    {
    }

    /// Watches `folder`, whose entry is there, with all below it, and makes the entries what the disk says now. Each
    /// folder is watched before it is listed. What is gone loses its entry, `folder` excepted.
    Look lookThrough(Number folder, Date since);
    /// Tells of everything that is in `folder` and below it.
    void tellFound(Number folder);

    /// The entry at the real path `path`, which is made if there is none, without a watch; none where no folder can be.
    Number entryAt(std::string_view path);
    /// The folder at the real path `path`, with a watch that tells when it is moved or deleted, and what `marks` ask
    /// besides.
    WayFolder folderOnTheWay(const std::string& path, unsigned marks);

    /// Removes `folder` with all below it: it is not there any more.
    void drop(Number folder);
    /// No root leads to `folder` any more: it and what is below it stays only as far as others need it.
    void release(Number folder);
    /// Has the watch of `folder` report no more than is needed, and removes it where nothing is.
    void settle(Number folder);
    /// Gives the polled folders below `folder` up, which are about to be looked for elsewhere.
    void stopPollingBelow(Number folder);
    /// Polls the folder at the real path `path` with all below it, from now on; those that changed at `since` or later
    /// are reported. With `never` the folder is a new one, and all that is in it is told.
    void poll(const std::string& path, Date since);
    void tellUsedUpLimit(const std::string& path);
    void forgetFiles(Number folder);

private:
    bool isNeeded(Number folder) const;
    void narrowWatch(Number folder);
    void takeWatchFrom(Number folder);
    void remove(Number folder);
    void tellFoundIn(Number folder);

    WatchingContext& _context;
};

/// Watches `folder`, whose real path is `path`, for what its marks ask. 0, or the error number; ENOSPC also where the
/// watches that may be used are used up.
int watchFolder(WatchingContext& context, WatchedFolders::Number folder, const char* path);

} // namespace platform
