#pragma once

#include <atomic>
#include <condition_variable>
#include <cstddef>
#include <mutex>

/// Counts the loads and reloads of one manager that are at work, and carries the request to cancel them.
///
/// A request stands until everything that was at work when it came has ended; work that wants to begin meanwhile waits
/// for that, so a request reaches what it was meant for and nothing later. Any thread.
class WorkGate {
public:
    /// Begins a piece of work, after a pending cancel has ended. False once the gate is closed: the work must not
    /// begin.
    bool begin()
    {
        std::unique_lock guard(_lock);
        _changed.wait(guard, [this] { return _closed || !_cancelPending.load(std::memory_order_relaxed); });
        if (_closed)
            return false;
        ++_atWork;
        return true;
    }

    /// Ends a piece of work that `begin` let begin; the last one ends a pending cancel.
    void end()
    {
        {
            std::lock_guard guard(_lock);
            --_atWork;
            if (_atWork == 0 && !_closed)
                _cancelPending.store(false, std::memory_order_release);
        }
        _changed.notify_all();
    }

    /// Asks what is at work to stop; void when nothing is.
    void requestCancel()
    {
        std::lock_guard guard(_lock);
        if (_atWork != 0)
            _cancelPending.store(true, std::memory_order_release);
    }

    /// Lets nothing begin any more, and asks what is at work to stop, for good.
    void close()
    {
        {
            std::lock_guard guard(_lock);
            _closed = true;
            _cancelPending.store(true, std::memory_order_release);
        }
        _changed.notify_all();
    }

    bool isCancelPending() const noexcept { return _cancelPending.load(std::memory_order_acquire); }

private:
    std::mutex _lock;
    std::condition_variable _changed;
    std::size_t _atWork = 0; // under _lock
    bool _closed = false; // under _lock
    std::atomic<bool> _cancelPending { false }; // written under _lock, read by every scan loop
};
