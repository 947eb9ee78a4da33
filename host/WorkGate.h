#pragma once

#include "platform/Value.h"

#include <atomic>
#include <condition_variable>
#include <cstddef>
#include <mutex>
#include <optional>

/// Counts the loads and reloads of one manager that are at work, and carries the request to cancel them.
///
/// A request stands until everything that was at work when it came has ended; work that wants to begin meanwhile waits
/// for that, so a request reaches what it was meant for and nothing later. Work of the main thread that others must
/// not wait for, nor it for them, is alone while it lasts. Any thread.
class WorkGate {
public:
    /// Begins a piece of work, after a pending cancel and work that is alone have ended; it began at `now` as folders
    /// are dated. False once the gate is closed: the work must not begin.
    bool begin(platform::Date now)
    {
        std::unique_lock guard(_lock);
        _changed.wait(
            guard, [this] { return _closed || (!_isAlone && !_cancelPending.load(std::memory_order_relaxed)); });
        if (_closed)
            return false;
        count(now);
        return true;
    }

    /// Begins work that is alone until it ends; false, at once, when something is at work or the gate is closed.
    bool beginAlone(platform::Date now)
    {
        std::lock_guard guard(_lock);
        if (_closed || _atWork != 0)
            return false;
        _isAlone = true;
        count(now);
        return true;
    }

    /// Ends a piece of work that was let begin; the last one ends a pending cancel. True when nothing is at work now.
    bool end()
    {
        bool isIdle = false;
        {
            std::lock_guard guard(_lock);
            --_atWork;
            isIdle = _atWork == 0;
            if (isIdle) {
                _isAlone = false;
                _beganAt.reset();
                if (!_closed)
                    _cancelPending.store(false, std::memory_order_release);
            }
        }
        _changed.notify_all();
        return isIdle;
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

    /// Whether nothing is at work, and so no cancel is pending either.
    bool isIdle() const
    {
        std::lock_guard guard(_lock);
        return _atWork == 0;
    }

    /// When the first of what is at work began; absent while nothing is.
    std::optional<platform::Date> beganAt() const
    {
        std::lock_guard guard(_lock);
        return _beganAt;
    }

private:
    void count(platform::Date now) // under _lock
    {
        if (_atWork++ == 0)
            _beganAt = now;
    }

    mutable std::mutex _lock;
    std::condition_variable _changed;
    std::size_t _atWork = 0; // under _lock
    bool _isAlone = false; // under _lock
    bool _closed = false; // under _lock
    std::optional<platform::Date> _beganAt; // under _lock
    std::atomic<bool> _cancelPending { false }; // written under _lock, read by every scan loop
};
