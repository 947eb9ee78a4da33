#pragma once

#include "host/OBMediaGroup.h"
#include "host/OBPublication.h"
#include "platform/FileSystem.h"
#include "platform/Value.h"

#include <chrono>
#include <cstdint>
#include <functional>
#include <string>

/// How a load ended.
enum class OBLoadOutcome : std::uint8_t {
    loaded, ///< the tree is complete
    cancelled, ///< somebody cancelled: the tree holds what had been gathered
    unavailable, ///< the source cannot load now: `canLoadData` answered false
    ended, ///< the manager has ended
    failed, ///< the source threw an error; the tree is the one that was installed last
};

/// The answer to a request for a tree.
struct OBLoadResult {
    OBLoadOutcome outcome = OBLoadOutcome::loaded;
    OBMediaGroupRef rootMediaGroup {}; ///< the installed tree; null when none was ever installed
    std::string problem {}; ///< of a load that failed: what the source threw
};

/// How far the load at work, or the last one, has come.
struct OBLoadProgress {
    bool isLoading = false;
    std::uint64_t foldersDone = 0; ///< listed; how many there will be, nobody knows before the end
    std::uint64_t itemsFound = 0; ///< media objects
    std::uint64_t itemsSkipped = 0; ///< files and folders that a rule kept out
    platform::Text pathAtWork {}; ///< the folder or file being read
    std::chrono::nanoseconds pathAtWorkSince {}; ///< monotonic time of the platform's clock
};

/// A folder that could not be read although something is there.
struct OBLoadProblem {
    std::string path;
    platform::FileProblem problem = platform::FileProblem::none;
};

/// What an application wants to hear of a manager; a call that is not set is not made.
struct OBManagerCallbacks {
    /// A tree was installed, or the installed one was changed and published again.
    std::function<void(OBMediaGroupRef)> rootPublished {};
    /// The same, with what is known of it.
    std::function<void(OBPublication)> published {};
    /// At most ten times a second.
    std::function<void(OBLoadProgress)> progressed {};
    std::function<void(OBLoadResult)> loadEnded {};
};
