#pragma once

#include "platform/Value.h"

#include <cstdint>
#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace platform {

class FileSystem;
class Volumes;

/// What was seen to happen at or below a watched path.
struct PathChange {
    enum class Kind : std::uint8_t {
        appeared, ///< an entry is new in its folder: made there, moved there, or renamed to this
        disappeared, ///< an entry is gone from its folder: deleted, moved away, or renamed from this
        found, ///< an entry that was in a folder when that had just appeared; tells nothing to who lists that folder
        contentChanged, ///< a file was written to: told when it is closed, else a while after, once in that while
        arrivalEnded, ///< a file that may have been being written when it appeared or was found has been closed
        attributesChanged, ///< permissions or times of a folder were set
        folderChanged, ///< entries directly in a folder changed; which is not known
        anythingChanged, ///< of all that is at or below `path` nothing is known any more
    };

    Kind kind = Kind::anythingChanged;
    bool isFolder = false; ///< of an entry: whether it is a folder, links not followed
    bool heldMore = false; ///< of a folder that disappeared: it left with what was in it
    std::string path {}; ///< begins with the watched path as it was spelled
};

/// Why some folders are not followed by the kernel's own reports.
struct WatchingProblem {
    std::string path; ///< the first folder that it concerns
    std::string cause; ///< half a sentence, as in "the kernel's limit of watches (8192) is used up"
    std::string remedy; ///< the command that mends it; empty when none does
};

/// How much is followed, and how.
struct WatchingState {
    std::uint64_t watchedFolders = 0; ///< by the kernel's reports
    std::uint64_t polledFolders = 0; ///< by looking at their change times
    std::uint64_t overflows = 0; ///< how often reports were lost, after which everything counted as changed
};

/// By what changes at and below a path are noticed.
enum class FollowingMeans : std::uint8_t {
    nothing, ///< they are not
    reports, ///< the kernel's own
    looking, ///< looking at its folders in intervals
};

/// One thing of which the kernel gives a user's programs only so many.
struct WatchingLimit {
    std::uint64_t inUse = 0; ///< by all programs of this user
    std::uint64_t allowed = 0;
    std::string remedy {}; ///< the command that raises it far enough
};

/// What the kernel's reports cost of what it gives.
struct WatchingLimits {
    WatchingLimit watches {}; ///< one a folder
    WatchingLimit instances {}; ///< one a program and disk that it watches
};

/// Who hears of one watched path. The calls come on the watcher's own threads, one at a time for one path, and must
/// return soon.
struct PathWatchHandlers {
    std::function<void(const PathChange&)> changed;
    /// Everything at and below the path is followed from now on. Not called before `watch` has returned.
    std::function<void()> stands {};
    std::function<void(const WatchingProblem&)> failed {};
};

/// Follows what happens to folders and files. Any thread.
///
/// A folder is followed with everything below it, links not followed. A path is spelled as the file system takes it;
/// links on the way to it are followed, and watched. It need not exist: it is awaited. No descriptor stays open below
/// a mount point, and nothing is done while nothing changes, except to look at polled folders.
class PathWatching {
public:
    virtual ~PathWatching() = default;

    /// The time that a change made now would bear as the change time of its folder.
    virtual Date timeOfChangesNow() const = 0;

    /// Follows `path` until the answer is destroyed; no handler is called once that has returned, unless it is
    /// destroyed inside a handler, and it must not be destroyed under a lock that a handler takes. Answers at once. A
    /// folder at or below it that changed at `since` or later, before it was followed, counts as a change of anything.
    virtual std::shared_ptr<void> watch(std::string_view path, Date since, PathWatchHandlers handlers) = 0;

    virtual WatchingState state() const = 0;

    /// By what `path` would be followed now, limits aside. Touches no disk on which it would only be looked at; may
    /// block while another does not answer.
    virtual FollowingMeans meansOfFollowing(std::string_view path) const
    {
        static_cast<void>(path);
        return FollowingMeans::nothing;
    }

    /// The limits on the kernel's reports, with commands that leave room for `furtherWatches` more; absent where there
    /// are none.
    virtual std::optional<WatchingLimits> limits(std::uint64_t furtherWatches) const
    {
        static_cast<void>(furtherWatches);
        return std::nullopt;
    }

    /// The same machine watched by the paths of `files`, for a machine laid over this one. Both arguments outlive the
    /// answer.
    virtual std::unique_ptr<PathWatching> withPathsOf(const FileSystem& files, const Volumes& volumes) const = 0;
};

} // namespace platform
