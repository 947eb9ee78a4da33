#pragma once

#include "platform/linux/watching/FileKey.h"

#include <chrono>
#include <cstddef>
#include <map>
#include <optional>
#include <unordered_map>
#include <vector>

namespace platform {

/// The files that were written to and not closed since, each with the time at which that is to be told. One thread at a
/// time.
class UntoldContents {
public:
    using Instant = std::chrono::steady_clock::time_point;

    /// `file` was written to, which is told at `due` unless it is to be told before.
    void add(const FileKey& file, Instant due);
    /// Forgets the file.
    void end(const FileKey& file);
    void move(const FileKey& from, const FileKey& to);
    void forgetFolder(WatchedFolders::Number folder);
    void clear();

    /// When the next one is due; absent when there is none.
    std::optional<Instant> nextDue() const;
    /// Takes out those that are due at `now`, and those that are too many to be kept.
    std::vector<FileKey> takeDue(Instant now);

private:
    using ByTime = std::multimap<Instant, FileKey>;

    ByTime _byTime;
    std::unordered_map<FileKey, ByTime::iterator, FileKeyHash> _byFile;
};

} // namespace platform
