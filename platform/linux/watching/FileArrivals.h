#pragma once

#include "platform/linux/watching/FileKey.h"

#include <cstddef>
#include <cstdint>
#include <list>
#include <unordered_map>
#include <utility>

namespace platform {

/// The files that have appeared and may still be being written. One thread at a time.
///
/// So many are kept in mind; the one that appeared first is dropped for another one. From then on a file of which
/// nothing is known may be one of the dropped, and counts as one whose state is not known: what is told of it is right
/// either way.
class FileArrivals {
public:
    enum class State : std::uint8_t {
        none,
        arriving, ///< made while its folder was watched, and not closed since
        unknown, ///< came with what it held; whether anybody writes to it cannot be told
    };

    explicit FileArrivals(std::size_t filesAtMost)
        : _filesAtMost(filesAtMost)
    {
    }

    void begin(const FileKey& file, State state);
    State state(const FileKey& file) const;
    /// Forgets the file, and answers what it was.
    State end(const FileKey& file);
    void move(const FileKey& from, const FileKey& to);
    void forgetFolder(WatchedFolders::Number folder);
    /// Forgets all, as if they had been dropped.
    void drop();

private:
    using Entries = std::list<std::pair<FileKey, State>>;

    const std::size_t _filesAtMost;
    Entries _entries {}; ///< in the order in which they appeared
    std::unordered_map<FileKey, Entries::iterator, FileKeyHash> _byFile {};
    bool _someWereDropped = false;
};

} // namespace platform
