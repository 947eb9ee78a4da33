#pragma once

#include "platform/Platform.h"

#include <chrono>
#include <condition_variable>
#include <cstddef>
#include <exception>
#include <functional>
#include <memory>
#include <mutex>
#include <optional>
#include <vector>

/// Jobs that several threads run and the calling thread takes the results of, in the order of the jobs.
///
/// Two threads work where the processor is what they need; up to eight while they mostly wait for a disk, which serves
/// several readers faster than one. The calling thread works too, and no job is begun far ahead of the one that is to
/// be taken next, so little lies waiting.
class OrderedWork : public std::enable_shared_from_this<OrderedWork> {
public:
    using Job = std::function<void(std::size_t index)>;
    /// Starts a thread that runs `body`; false when there is none to be had.
    using ThreadStarter = std::function<bool(std::function<void()> body)>;

    OrderedWork(const platform::Platform& platform, ThreadStarter startThread, std::size_t count, const Job& job);

    /// Calls `job` once for each index below `count`, on any of the threads, and `take` for each in order, on the
    /// calling thread. When it returns, or throws what one of the two threw, no other thread is inside `job` or will
    /// be.
    void perform(const Job& take);

private:
    static constexpr std::size_t threadsAtWork = 2;
    static constexpr std::size_t threadsThatWait = 8;
    static constexpr std::size_t jobsAhead = 64;
    static constexpr std::size_t jobsForAThread = 8; // fewer are done before a thread has started
    static constexpr std::size_t jobsBetweenLooks = 4;
    static constexpr std::size_t untimedBetweenAtWork = 3; // asking for a thread's time is a call to the system

    /// How long a job took, and how much of that on a processor.
    struct Times {
        std::chrono::nanoseconds passed {};
        std::chrono::nanoseconds onProcessor {};
    };

    void takeAll(const Job& take);
    bool canClaim() const; // under _lock
    void help();
    void runClaimed(std::unique_lock<std::mutex>& guard);
    std::optional<Times> runJob(std::size_t index, bool isTimed);
    Times runTimed(std::size_t index);
    void noteTimes(const Times& times); // under _lock
    void startThreads(std::unique_lock<std::mutex>& guard);

    const platform::Platform& _platform;
    const ThreadStarter _startThread;
    const std::size_t _count;
    const Job& _job; // the caller's, which waits for every job that was begun

    std::mutex _lock; // guards what follows
    std::condition_variable _changed;
    std::vector<bool> _done;
    std::exception_ptr _thrown; // by a job; no other is begun
    std::size_t _next = 0; // the first job that nobody has begun
    std::size_t _taken = 0;
    std::size_t _jobsAtWork = 0;
    std::size_t _helpers = 0;
    std::size_t _threadsWanted = threadsAtWork;
    std::size_t _timedJobs = 0;
    std::size_t _untimedLeft = 0; // before the next job that is timed
    std::size_t _untimedBetween = 0;
    std::chrono::nanoseconds _passed {};
    std::chrono::nanoseconds _onProcessor {};
};
