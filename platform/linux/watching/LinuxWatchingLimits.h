#pragma once

#include <chrono>
#include <cstddef>
#include <cstdint>
#include <limits>
#include <string>
#include <vector>

namespace platform {

/// How far the watching of this machine goes.
struct LinuxWatchingLimits {
    /// How many folders the kernel is asked to report on, beside its own limit.
    std::uint64_t watchesAtMost = std::numeric_limits<std::uint64_t>::max();
    bool mayUseInotify = true;
    /// How long after a write a file that is not closed is told to have changed, and how often at most.
    std::chrono::milliseconds quietTime { 1000 };
    /// The same for a file that is still arriving: whoever writes it is expected to close it.
    std::chrono::milliseconds arrivalQuietTime { 10'000 };
    /// How many arriving files are kept in mind.
    std::size_t arrivalsAtMost = 4096;
    /// How often folders are looked at whose changes the kernel does not report.
    std::chrono::milliseconds pollInterval { 10'000 };
    /// File systems of these types are polled too.
    std::vector<std::string> furtherPolledTypes {};
};

} // namespace platform
