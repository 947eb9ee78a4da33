#pragma once

#include "platform/PathWatching.h"
#include "platform/linux/watching/WatchedPlace.h"

#include <cstdint>
#include <optional>
#include <string>

namespace platform {

/// What looking at folders in intervals has found.
struct PollingReport {
    /// What changed, by its real path.
    std::optional<PathChange> change {};
    /// A folder, by its real path, that has been looked through for the first time with all below it; whether any of
    /// them changed since the time that was given.
    std::string folderLookedThrough {};
    bool hasChangedSince = false;
    /// The watch whose path leads to `place` now; 0 when the report is of something else.
    std::uint64_t watch = 0;
    WatchedPlace place {};
};

} // namespace platform
