#pragma once

#include "platform/Value.h"

#include <chrono>
#include <condition_variable>
#include <mutex>

namespace platform {

/// Ends sleeps: once it is raised, every sleep that waits for it returns. Any thread.
class WakeSignal {
public:
    void raise()
    {
        {
            std::lock_guard guard(_mutex);
            _raised = true;
        }
        _changed.notify_all();
    }
    bool isRaised() const
    {
        std::lock_guard guard(_mutex);
        return _raised;
    }
    /// For clocks: blocks until the signal is raised or `duration` of real time has passed; true when it was raised.
    bool waitFor(std::chrono::nanoseconds duration)
    {
        std::unique_lock guard(_mutex);
        return _changed.wait_for(guard, duration, [this] { return _raised; });
    }

private:
    mutable std::mutex _mutex;
    std::condition_variable _changed;
    bool _raised = false;
};

/// Time and sleeping, so that a test can let hours pass at once. Any thread. None throws.
class Clock {
public:
    virtual ~Clock() = default;

    /// The wall clock.
    virtual Date now() const = 0;

    /// Time since an arbitrary start that never goes back.
    virtual std::chrono::nanoseconds monotonic() const = 0;

    /// Blocks the calling thread for `duration`, or until `wake` is raised. True when it slept to the end.
    virtual bool sleep(std::chrono::nanoseconds duration, WakeSignal& wake) const = 0;
};

} // namespace platform
