#pragma once

#include "platform/PathWatching.h"

#include <cstdint>
#include <string>
#include <string_view>

namespace platform {

// Why folders are polled, in words, without the path.

/// The watches that may be used are used up: the kernel's, or `watchesAtMost` where that is less.
WatchingProblem usedUpWatches(std::uint64_t watchesAtMost);

/// The kernel gives no inotify instance.
WatchingProblem noInotifyInstance();

/// The file system of this type is changed by others, too, of which the kernel hears nothing.
WatchingProblem changedByOthers(std::string_view fileSystemType);

} // namespace platform
