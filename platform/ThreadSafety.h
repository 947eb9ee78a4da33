#pragma once

#include <atomic>
#include <mutex>

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
    std::mutex _mutex;
};

/// `std::recursive_mutex` that the compiler's analysis knows.
class CAPABILITY("mutex") RecursiveMutex {
public:
    void lock() ACQUIRE() { _mutex.lock(); }
    void unlock() RELEASE() { _mutex.unlock(); }

private:
    std::recursive_mutex _mutex;
};

/// A lock of four bytes for records of which there are very many: held for a few instructions, never across a call out.
class CAPABILITY("mutex") SmallLock {
public:
    void lock() ACQUIRE()
    {
        int expected = 0;
        if (_state.compare_exchange_strong(expected, 1, std::memory_order_acquire))
            return;
        while (_state.exchange(2, std::memory_order_acquire) != 0)
            _state.wait(2, std::memory_order_relaxed);
    }
    void unlock() RELEASE()
    {
        if (_state.exchange(0, std::memory_order_release) == 2)
            _state.notify_one();
    }

private:
    std::atomic<int> _state { 0 }; // 0 free, 1 held, 2 held and waited for
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
