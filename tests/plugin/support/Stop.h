#pragma once

#include "tests/support/Turns.h"

#include <condition_variable>
#include <mutex>

namespace tests {

/// A place at which the first thread that comes by stops until the test lets it go on. Later ones pass.
class Stop {
public:
    ~Stop() { release(); }

    /// For the role that is to stop its caller.
    void stopHere()
    {
        std::unique_lock guard(_mutex);
        if (_wasReached)
            return;
        _wasReached = true;
        _changed.notify_all();
        _changed.wait_for(guard, longestWait, [this] { return _isReleased; });
    }
    /// False when no thread has come by.
    bool waitUntilReached()
    {
        std::unique_lock guard(_mutex);
        return _changed.wait_for(guard, longestWait, [this] { return _wasReached; });
    }
    void release()
    {
        {
            std::lock_guard guard(_mutex);
            _isReleased = true;
            _wasReached = true;
        }
        _changed.notify_all();
    }

private:
    std::mutex _mutex;
    std::condition_variable _changed;
    bool _wasReached = false;
    bool _isReleased = false;
};

} // namespace tests
