#include "platform/linux/LinuxClock.h"

#include <algorithm>
#include <ctime>

namespace platform {

Date LinuxClock::now() const
{
    timespec time {};
    clock_gettime(CLOCK_REALTIME, &time);
    return { time.tv_sec, static_cast<std::uint32_t>(time.tv_nsec) };
}

std::chrono::nanoseconds LinuxClock::monotonic() const
{
    timespec time {};
    clock_gettime(CLOCK_MONOTONIC, &time);
    return std::chrono::seconds(time.tv_sec) + std::chrono::nanoseconds(time.tv_nsec);
}

bool LinuxClock::sleep(std::chrono::nanoseconds duration, WakeSignal& wake) const
{
    // A point in time further off than the clock can count would lie in the past.
    constexpr std::chrono::nanoseconds longest = std::chrono::hours(24 * 365 * 100);
    return !wake.waitFor(std::clamp(duration, std::chrono::nanoseconds::zero(), longest));
}

} // namespace platform
