#pragma once

#include "platform/ThreadSafety.h"

#include <atomic>
#include <cstdint>

namespace platform {

/// How many threads use what is about to go. Any thread.
class ThreadCount {
public:
    void add()
    {
        Locked guard(_lock);
        ++_count;
    }
    void remove()
    {
        Locked guard(_lock);
        --_count;
        _changed.notifyAll();
    }
    void waitForNone()
    {
        Locked guard(_lock);
        while (_count > 0)
            _changed.wait(_lock);
    }

private:
    Mutex _lock;
    Condition _changed;
    int _count GUARDED_BY(_lock) = 0;
};

/// What others may know of the watcher's threads while they run.
struct WatchingCounts {
    std::atomic<std::uint64_t> watchedFolders { 0 };
    std::atomic<std::uint64_t> polledFolders { 0 };
    std::atomic<std::uint64_t> overflows { 0 };
    ThreadCount threads {}; ///< that use the roles which the watching was given
};

} // namespace platform
