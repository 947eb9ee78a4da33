#pragma once

#include "platform/Clock.h"

#include <condition_variable>
#include <mutex>
#include <set>

namespace tests {

/// A clock that stands still until a test moves it.
///
/// A thread that sleeps is woken when the time has come or its signal is raised. The signal is looked at every few
/// milliseconds of real time, so that a raise needs no help from the test. Any thread.
class VirtualClock : public platform::Clock {
public:
    explicit VirtualClock(platform::Date now = { 1'600'000'000, 0 });

    platform::Date now() const override;
    std::chrono::nanoseconds monotonic() const override;
    bool sleep(std::chrono::nanoseconds duration, platform::WakeSignal& wake) const override;

    /// Lets `duration` pass at once; sleepers whose time has come wake.
    void advance(std::chrono::nanoseconds duration);
    /// Waits until at least `count` threads sleep. False when that has not happened within a minute of real time.
    bool waitForSleepers(int count) const;
    /// Waits until a thread sleeps that has exactly `left` still to sleep. False as above.
    bool waitForSleep(std::chrono::nanoseconds left) const;
    /// How many threads sleep now.
    int sleepers() const;

private:
    const platform::Date _start;
    mutable std::mutex _mutex;
    mutable std::condition_variable _changed;
    std::chrono::nanoseconds _passed {};
    mutable int _sleepers = 0;
    mutable std::multiset<std::chrono::nanoseconds> _ends {}; // of those sleeps
};

} // namespace tests
