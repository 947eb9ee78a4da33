// The locks of simulated threads, and where they may be disturbed.
//
// The framework's threads wait for one another in locks and conditions of the standard library, which end up here: in a
// program that is linked with this file these functions come before those of the C library. A simulated thread that
// would block hands over to another instead; every other thread gets what it asked for. What allocates or locks is also
// where a thread is made to stop between two steps of its own. Not in a build for the thread
// sanitizer, which needs these names itself.

#include "tests/support/simulated/SimulatedThreads.h"

#include <cerrno>
#include <cstdlib>
#include <new>

#include <dlfcn.h>
#include <sched.h>
#include <sys/syscall.h>
#include <unistd.h>

#if OMBRIX_SIMULATES_LOCKS

namespace {

/// The C library's own function called `name`.
template <class Function> Function* original(const char* name)
{
    return reinterpret_cast<Function*>(::dlsym(RTLD_NEXT, name));
}

/// The same of conditions, of which some machines have two kinds; a program that is linked today uses the later one.
template <class Function> Function* originalOfConditions(const char* name)
{
    void* const later = ::dlvsym(RTLD_NEXT, name, "GLIBC_2.3.2");
    return later ? reinterpret_cast<Function*>(later) : original<Function>(name);
}

int waitForCondition(pthread_mutex_t* mutex)
{
    ::pthread_mutex_unlock(mutex);
    tests::SimulatedThreads::waitForCondition();
    return ::pthread_mutex_lock(mutex);
}

} // namespace

#pragma GCC visibility push(default)

extern "C" {

int pthread_mutex_lock(pthread_mutex_t* mutex)
{
    static const auto lock = original<int(pthread_mutex_t*)>("pthread_mutex_lock");
    if (!tests::SimulatedThreads::isSimulated())
        return lock(mutex);
    tests::SimulatedThreads::mayBeDisturbed();
    int problem = ::pthread_mutex_trylock(mutex);
    while (problem == EBUSY) {
        tests::SimulatedThreads::waitForMutex(mutex);
        problem = ::pthread_mutex_trylock(mutex);
    }
    return problem;
}

int pthread_cond_wait(pthread_cond_t* condition, pthread_mutex_t* mutex)
{
    static const auto wait = originalOfConditions<int(pthread_cond_t*, pthread_mutex_t*)>("pthread_cond_wait");
    return tests::SimulatedThreads::isSimulated() ? waitForCondition(mutex) : wait(condition, mutex);
}

int pthread_cond_signal(pthread_cond_t* condition)
{
    static const auto signal = originalOfConditions<int(pthread_cond_t*)>("pthread_cond_signal");
    tests::SimulatedThreads::conditionSignalled();
    return signal(condition);
}

int pthread_cond_broadcast(pthread_cond_t* condition)
{
    static const auto broadcast = originalOfConditions<int(pthread_cond_t*)>("pthread_cond_broadcast");
    tests::SimulatedThreads::conditionSignalled();
    return broadcast(condition);
}

/// Asked for by who waits for a lock that is held for a few steps only: the sanitizers too, while nothing may allocate
/// memory, which a look-up of the original would.
int sched_yield()
{
    if (!tests::SimulatedThreads::isSimulated())
        return static_cast<int>(::syscall(SYS_sched_yield));
    tests::SimulatedThreads::letOthersRun();
    return 0;
}

} // extern "C"

// The address sanitizer has to see each kind of allocation itself.
#if !defined(__SANITIZE_ADDRESS__)
void* operator new(std::size_t size)
{
    tests::SimulatedThreads::mayBeDisturbed();
    if (void* const memory = std::malloc(size))
        return memory;
    throw std::bad_alloc();
}

void operator delete(void* memory) noexcept
{
    std::free(memory);
}

void operator delete(void* memory, std::size_t) noexcept
{
    std::free(memory);
}
#endif

#pragma GCC visibility pop

#endif
