#pragma once

#include "platform/PathWatching.h"

#include <cstdint>
#include <string>

namespace platform {

/// What the processes of one user use of inotify(7).
struct InotifyUse {
    std::uint64_t watches = 0;
    std::uint64_t instances = 0;
};

/// Counts what the processes of `user` use that may be looked into, as `procFolder` tells it (proc_pid_fdinfo(5)).
InotifyUse inotifyUse(const std::string& procFolder, unsigned user);

/// The kernel's limit called `name`, such as "max_user_watches"; 0 where it has none of the kind.
std::uint64_t inotifyLimit(const std::string& name);
/// The command that sets it to `limit`.
std::string commandForInotifyLimit(const std::string& name, std::uint64_t limit);

/// What this user's processes may use and do, with commands that leave room for `furtherWatches`; absent where the
/// kernel knows no inotify.
std::optional<WatchingLimits> inotifyLimits(std::uint64_t furtherWatches);

} // namespace platform
