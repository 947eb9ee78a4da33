#include "platform/linux/watching/WatchingProblems.h"

#include "platform/linux/watching/InotifyLimits.h"

#include <algorithm>

namespace platform {

WatchingProblem usedUpWatches(std::uint64_t watchesAtMost)
{
    // What desktops set of themselves; a folder costs the kernel about a kilobyte at most.
    constexpr std::uint64_t usualLimit = 524'288;
    const std::string name = "max_user_watches";
    const std::uint64_t limit = std::min(inotifyLimit(name), watchesAtMost);
    return { {}, "the kernel's limit of watches (" + std::to_string(limit) + ") is used up",
        commandForInotifyLimit(name, std::max(usualLimit, limit * 2)) };
}

WatchingProblem noInotifyInstance()
{
    const std::string name = "max_user_instances";
    const std::uint64_t limit = inotifyLimit(name);
    return { {}, "the kernel's limit of inotify instances (" + std::to_string(limit) + ") is used up",
        commandForInotifyLimit(name, std::max<std::uint64_t>(limit * 2, 128)) };
}

WatchingProblem changedByOthers(std::string_view fileSystemType)
{
    return { {},
        "the kernel does not report what others change on a file system of type " + std::string(fileSystemType), {} };
}

} // namespace platform
