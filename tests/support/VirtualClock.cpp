#include "tests/support/VirtualClock.h"

namespace tests {

VirtualClock::VirtualClock(platform::Date now)
    : _start(now)
{
}

platform::Date VirtualClock::now() const
{
    constexpr std::int64_t second = 1'000'000'000;
    const std::int64_t nanoseconds = _start.nanoseconds + monotonic().count();
    return { _start.seconds + nanoseconds / second, static_cast<std::uint32_t>(nanoseconds % second) };
}

std::chrono::nanoseconds VirtualClock::monotonic() const
{
    std::lock_guard guard(_mutex);
    return _passed;
}

bool VirtualClock::sleep(std::chrono::nanoseconds duration, platform::WakeSignal& wake) const
{
    constexpr std::chrono::milliseconds betweenLooks { 2 };
    std::unique_lock guard(_mutex);
    const std::chrono::nanoseconds end = _passed + duration;
    ++_sleepers;
    const auto mine = _ends.insert(end);
    _changed.notify_all();
    bool isAwake = wake.isRaised();
    while (!isAwake && _passed < end) {
        _changed.wait_for(guard, betweenLooks);
        isAwake = wake.isRaised();
    }
    --_sleepers;
    _ends.erase(mine);
    _changed.notify_all();
    return !isAwake;
}

void VirtualClock::advance(std::chrono::nanoseconds duration)
{
    std::lock_guard guard(_mutex);
    _passed += duration;
    _changed.notify_all();
}

bool VirtualClock::waitForSleepers(int count) const
{
    constexpr std::chrono::minutes longest { 1 };
    std::unique_lock guard(_mutex);
    return _changed.wait_for(guard, longest, [this, count] { return _sleepers >= count; });
}

bool VirtualClock::waitForSleep(std::chrono::nanoseconds left) const
{
    constexpr std::chrono::minutes longest { 1 };
    std::unique_lock guard(_mutex);
    return _changed.wait_for(guard, longest, [this, left] { return _ends.contains(_passed + left); });
}

int VirtualClock::sleepers() const
{
    std::lock_guard guard(_mutex);
    return _sleepers;
}

} // namespace tests
