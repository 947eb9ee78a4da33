#pragma once

#include "platform/FolderListing.h"
#include "platform/Value.h"

#include <cstddef>
#include <cstdint>
#include <memory>
#include <optional>
#include <span>
#include <string>
#include <string_view>

namespace platform {

/// What whoever names a path has seen of it before.
enum class PathKnowledge : std::uint8_t {
    none,
    /// A plain file, by a path without symbolic links: saves looking again before it is opened. Where that is no longer
    /// so, a file system answers `linkOnTheWay` or why it is no plain file, and follows nothing.
    realPlainFile,
};

/// A plain file that is open for reading; closed when destroyed. One thread at a time.
class OpenFile {
public:
    virtual ~OpenFile() = default;
    /// Facts taken from the open file itself.
    virtual ItemStatus status() const = 0;
    /// Reads from `offset` (bytes) into `buffer` and answers how many bytes were read: fewer than asked for only at
    /// the end of the file; 0 as well when the disk fails.
    virtual std::size_t read(std::uint64_t offset, std::span<std::byte> buffer) const = 0;
};

/// An open file, or why there is none.
struct OpenResult {
    std::unique_ptr<OpenFile> file;
    FileProblem problem = FileProblem::none;
};

/// What this system reads of the file system; nothing here writes.
///
/// Paths are absolute byte strings of slash-separated components. Every operation may be called from any thread and
/// may block while a disk spins up or does not answer; none keeps a descriptor open after it has returned, an
/// `OpenFile` excepted. None throws.
class FileSystem {
public:
    virtual ~FileSystem() = default;

    /// The current user's home folder, absolute; absent when none is known.
    virtual std::optional<std::string> homeFolder() const = 0;

    /// The items directly inside `folder`, in the order the file system lists them.
    ///
    /// When there are none, says why. A scan treats all reasons alike; an explanation does not.
    virtual FolderListing itemsInFolder(std::string_view folder, const ListingRequest& request) const = 0;

    /// Facts about the item at `path`, links followed; absent when nothing exists at the end.
    virtual std::optional<ItemStatus> status(std::string_view path) const = 0;

    /// Facts about the item at `path` itself: a link in the last component is not followed, links before it are.
    virtual std::optional<ItemStatus> linkStatus(std::string_view path) const = 0;

    /// The target text of the symbolic link at `path`, as stored; absent when there is no link.
    virtual std::optional<std::string> linkTarget(std::string_view path) const = 0;

    /// The flags of the item at `path`, told as a listing of its folder tells them. A link's flags are its own.
    /// No flag is set when nothing is there.
    virtual ItemFlags itemFlags(std::string_view path) const = 0;

    /// The real path: every symbolic link on the way resolved. A link that leads nowhere gives the place it names; a
    /// link in circles gives the real path of its folder, and its name. Never empty; what does not exist stays as
    /// written.
    virtual std::string resolvedPath(std::string_view path) const = 0;

    /// Opens the plain file at `path` for reading, links followed. Never opens a pipe, device or socket.
    virtual OpenResult openPlainFile(std::string_view path, PathKnowledge known = PathKnowledge::none) const = 0;

    /// This file system without links that the machine adds to those on disk. A machine laid over another builds on it.
    virtual const FileSystem& withoutAddedLinks() const { return *this; }

    /// Whether anything exists at `path`, links followed.
    bool exists(std::string_view path) const { return status(path).has_value(); }

    /// Whether a folder on the way to `path` may not be searched, so that nothing is known of what stands there.
    bool isOutOfReach(std::string_view path) const
    {
        return !linkStatus(path) && openPlainFile(path).problem == FileProblem::notPermitted;
    }
};

} // namespace platform
