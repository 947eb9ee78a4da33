#pragma once

#include "platform/Clock.h"
#include "platform/ThreadSafety.h"

#include <deque>
#include <functional>
#include <memory>
#include <vector>

class FrameworkCore;

/// Threads on which observers are called: as many as are needed at once, used again while changes are followed, and
/// gone a second after there is nothing to do. Any thread.
class DeliveryThreads {
public:
    /// `core` owns this object and outlives its threads.
    explicit DeliveryThreads(FrameworkCore& core)
        : _core(core)
    {
    }

    /// Runs `job` on a thread that does nothing else until it returns; jobs begin in the order in which they came.
    void run(std::function<void()> job);

    /// Whether threads wait for further jobs before they end.
    void setReused(bool reused);

private:
    using Idle = std::shared_ptr<platform::WakeSignal>;

    void work();
    std::function<void()> nextJob();
    std::function<void()> firstJob() REQUIRES(_lock);

    FrameworkCore& _core;
    platform::Mutex _lock;
    std::deque<std::function<void()>> _jobs GUARDED_BY(_lock);
    std::vector<Idle> _idle GUARDED_BY(_lock);
    bool _reused GUARDED_BY(_lock) = false;
};
