#pragma once

#include <atomic>
#include <condition_variable>
#include <mutex>
#include <thread>

// Clang's thread safety analysis (clang.llvm.org, "Thread Safety Analysis"); other compilers read nothing here.
#if defined(__clang__)
#define OMBRIX_THREAD_ANNOTATION(x) __attribute__((x))
#else
#define OMBRIX_THREAD_ANNOTATION(x)
#endif

#define CAPABILITY(x) OMBRIX_THREAD_ANNOTATION(capability(x))
#define SCOPED_CAPABILITY OMBRIX_THREAD_ANNOTATION(scoped_lockable)
#define GUARDED_BY(x) OMBRIX_THREAD_ANNOTATION(guarded_by(x))
#define PT_GUARDED_BY(x) OMBRIX_THREAD_ANNOTATION(pt_guarded_by(x))
#define REQUIRES(...) OMBRIX_THREAD_ANNOTATION(requires_capability(__VA_ARGS__))
#define ACQUIRE(...) OMBRIX_THREAD_ANNOTATION(acquire_capability(__VA_ARGS__))
#define TRY_ACQUIRE(...) OMBRIX_THREAD_ANNOTATION(try_acquire_capability(__VA_ARGS__))
#define RELEASE(...) OMBRIX_THREAD_ANNOTATION(release_capability(__VA_ARGS__))
#define EXCLUDES(...) OMBRIX_THREAD_ANNOTATION(locks_excluded(__VA_ARGS__))
#define ASSERT_CAPABILITY(x) OMBRIX_THREAD_ANNOTATION(assert_capability(x))
#define NO_THREAD_SAFETY_ANALYSIS OMBRIX_THREAD_ANNOTATION(no_thread_safety_analysis)

namespace platform {

/// `std::mutex` that the compiler's analysis knows.
class CAPABILITY("mutex") Mutex {
public:
    void lock() ACQUIRE() { _mutex.lock(); }
    void unlock() RELEASE() { _mutex.unlock(); }
    bool try_lock() TRY_ACQUIRE(true) { return _mutex.try_lock(); }

private:
    friend class Condition;
    std::mutex _mutex;
};

/// `std::condition_variable` for `Mutex`.
class Condition {
public:
    void wait(Mutex& lock) REQUIRES(lock)
    {
        std::unique_lock held(lock._mutex, std::adopt_lock);
        _condition.wait(held);
        held.release();
    }
    template <class Instant> void waitUntil(Mutex& lock, const Instant& instant) REQUIRES(lock)
    {
        std::unique_lock held(lock._mutex, std::adopt_lock);
        _condition.wait_until(held, instant);
        held.release();
    }
    void notifyOne() { _condition.notify_one(); }
    void notifyAll() { _condition.notify_all(); }

private:
    std::condition_variable _condition;
};

/// `std::recursive_mutex` that the compiler's analysis knows.
class CAPABILITY("mutex") RecursiveMutex {
public:
    void lock() ACQUIRE() { _mutex.lock(); }
    void unlock() RELEASE() { _mutex.unlock(); }

private:
    std::recursive_mutex _mutex;
};

/// A lock of one byte for records of which there are very many: held for a few instructions and never across a call
/// out, so whoever finds it held lets the holder run and looks again.
class CAPABILITY("mutex") SmallLock {
public:
    void lock() ACQUIRE()
    {
        while (_isHeld.exchange(true, std::memory_order_acquire))
            std::this_thread::yield();
    }
    void unlock() RELEASE() { _isHeld.store(false, std::memory_order_release); }

private:
    std::atomic<bool> _isHeld { false };
};

/// Holds a lock for a scope.
template <class Lock> class SCOPED_CAPABILITY Locked {
public:
    explicit Locked(Lock& lock) ACQUIRE(lock)
        : _lock(lock)
    {
        _lock.lock();
    }
    ~Locked() RELEASE() { _lock.unlock(); }
    Locked(const Locked&) = delete;
    Locked& operator=(const Locked&) = delete;

private:
    Lock& _lock;
};

} // namespace platform
