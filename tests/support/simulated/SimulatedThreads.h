#pragma once

#include "platform/Clock.h"
#include "platform/Threads.h"
#include "tests/support/simulated/Chance.h"

#include <chrono>
#include <functional>
#include <map>
#include <memory>
#include <string>
#include <vector>

#include <pthread.h>

// The thread sanitizer needs the locks to itself; without them, threads that wait for one another would stop for good.
#if defined(__SANITIZE_THREAD__)
#define OMBRIX_SIMULATES_LOCKS 0
#elif defined(__has_feature)
#if __has_feature(thread_sanitizer)
#define OMBRIX_SIMULATES_LOCKS 0
#endif
#endif
#if !defined(OMBRIX_SIMULATES_LOCKS)
#define OMBRIX_SIMULATES_LOCKS 1
#endif

namespace tests {

/// Whether simulated threads can wait for one another in this build.
inline constexpr bool simulatesLocks = OMBRIX_SIMULATES_LOCKS != 0;

/// Threads and time of a simulated machine: threads run one at a time, on real ones that hand over, and time passes
/// only when none can run. Which one goes on is drawn from the seed, so a seed replays exactly.
///
/// A thread runs until it sleeps, ends, waits for a lock or a condition, or reaches a call of the simulated disk that
/// takes its time; those of the code under test also now and then where they allocate or lock. The thread that made
/// this object drives the others and does nothing else meanwhile.
class SimulatedThreads : public platform::Threads, public platform::Clock {
public:
    SimulatedThreads(Chance& chance, platform::Date now);
    /// Every thread has ended.
    ~SimulatedThreads() override;
    SimulatedThreads(const SimulatedThreads&) = delete;
    SimulatedThreads& operator=(const SimulatedThreads&) = delete;

    /// Refuses the threads that help a scan: with them the order of its calls would not be the seed's.
    bool startDetached(const std::string& name, std::function<void()> body) override;
    void setNiceOfCurrentThread(int) override { }
    std::chrono::nanoseconds processorTimeOfCurrentThread() const override { return {}; }

    platform::Date now() const override;
    std::chrono::nanoseconds monotonic() const override { return _passed; }
    bool sleep(std::chrono::nanoseconds duration, platform::WakeSignal& wake) const override;

    /// Has a thread of the machine's own make a call after a while.
    void after(std::chrono::nanoseconds delay, std::function<void()> call);
    /// Of the driving thread: runs `body` on a thread of an application, and all others, until it has returned.
    void perform(std::function<void()> body);
    /// Of the driving thread, when nothing more is to come: runs every thread to its end.
    void letAllEnd();

    /// Whether the caller is one of these threads.
    static bool isSimulated();
    // Of these threads, the application's for instance; of any other: nothing.
    /// Lets time pass, and others run.
    void pause(std::chrono::nanoseconds duration) const;
    /// Lets others run until `condition` holds, which is asked on the driving thread.
    void waitUntil(std::function<bool()> condition) const;
    /// Lets others run until there is nothing left but threads that wait in `waitUntil`.
    void waitUntilQuiet() const;

    /// While one lives, its thread goes on undisturbed where it does not wait: for what is no code under test.
    class Undisturbed {
    public:
        Undisturbed();
        ~Undisturbed();
        Undisturbed(const Undisturbed&) = delete;
        Undisturbed& operator=(const Undisturbed&) = delete;
    };

    // For the locks and allocations of these threads.
    struct Thread;
    static void mayBeDisturbed();
    static void letOthersRun();
    static void waitForMutex(pthread_mutex_t* mutex);
    static void waitForCondition();
    static void conditionSignalled();

private:
    using Calls = std::multimap<std::chrono::nanoseconds, std::function<void()>>;

    Thread& start(const std::string& name, std::function<void()> body);
    void body(const std::shared_ptr<Thread>& thread);
    void makeCalls();
    bool hasDueCall() const { return !_calls.empty() && _calls.begin()->first <= _passed; }
    void handOver(Thread& thread) const;
    void yield(std::function<bool()> mayGoOn, std::chrono::nanoseconds at) const;
    bool runOne();
    bool letTimePass();
    bool tellQuiet();
    void removeEnded();

    Chance& _chance;
    const platform::Date _start;
    std::chrono::nanoseconds _passed {};
    std::vector<std::shared_ptr<Thread>> _threads {};
    Calls _calls {};
    bool _ends = false;
};

} // namespace tests
