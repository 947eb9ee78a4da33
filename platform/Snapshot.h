#pragma once

#include "platform/ThreadSafety.h"

#include <utility>

namespace platform {

/// A value that one thread replaces whole while others read: a reader has the old one or the new one, never a mixture.
/// Meant for small values that share what is large (texts, shared pointers, snapshot lists). Any thread.
template <class T> class Snapshot {
public:
    Snapshot() = default;
    explicit Snapshot(T value)
        : _value(std::move(value))
    {
    }

    T load() const EXCLUDES(_lock)
    {
        Locked guard(_lock);
        return _value;
    }
    void store(T value) EXCLUDES(_lock) { (void)exchange(std::move(value)); }

    /// Answers the value that was replaced, so that what it held is released after the lock is.
    T exchange(T value) EXCLUDES(_lock)
    {
        Locked guard(_lock);
        std::swap(_value, value);
        return value;
    }

    /// Replaces the value by `change(old value)` in one step. `change` is a few instructions and calls nothing out.
    template <class Change> void update(const Change& change) EXCLUDES(_lock)
    {
        Locked guard(_lock);
        _value = change(std::move(_value));
    }

private:
    mutable SmallLock _lock;
    T _value GUARDED_BY(_lock) {};
};

} // namespace platform
