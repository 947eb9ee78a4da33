#pragma once

#include <set>
#include <string>

namespace platform {

/// What a watched path has behind it, whichever thread follows it.
struct RootHistory {
    bool isPlaced = false; ///< it has been found out where it leads
    bool stands = false; ///< and its observer was told that this is followed
    std::set<std::string> causesTold {}; ///< of folders that are polled
    /// Over which its way leads before it reaches that of the thread.
    std::set<std::string> devicesPassed {};
};

} // namespace platform
