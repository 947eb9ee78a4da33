#include "host/OrderedWork.h"

#include "platform/Clock.h"
#include "platform/Threads.h"

#include <algorithm>
#include <utility>

OrderedWork::OrderedWork(
    const platform::Platform& platform, ThreadStarter startThread, std::size_t count, const Job& job)
    : _platform(platform)
    , _startThread(std::move(startThread))
    , _count(count)
    , _job(job)
    , _done(count)
{
}

void OrderedWork::perform(const Job& take)
{
    try {
        takeAll(take);
    } catch (...) {
        std::unique_lock guard(_lock);
        _next = _count;
        _changed.notify_all();
        while (_jobsAtWork != 0)
            _changed.wait(guard);
        throw;
    }
}

void OrderedWork::takeAll(const Job& take)
{
    std::unique_lock guard(_lock);
    for (std::size_t index = 0; index < _count; ++index) {
        while (!_done[index]) {
            startThreads(guard);
            if (canClaim())
                runClaimed(guard);
            else if (!_done[index] && !_thrown)
                _changed.wait(guard);
            if (_thrown)
                std::rethrow_exception(_thrown);
        }
        guard.unlock();
        take(index);
        guard.lock();
        _taken = index + 1;
        _changed.notify_all();
    }
}

bool OrderedWork::canClaim() const
{
    return _next < std::min(_count, _taken + jobsAhead);
}

/// A further thread, until there is nothing left to begin or fewer threads will do.
void OrderedWork::help()
{
    std::unique_lock guard(_lock);
    while (_next < _count && _helpers < _threadsWanted) {
        if (canClaim())
            runClaimed(guard);
        else
            _changed.wait(guard);
    }
    --_helpers;
}

void OrderedWork::runClaimed(std::unique_lock<std::mutex>& guard)
{
    const std::size_t index = _next++;
    const bool isTimed = _untimedLeft == 0;
    _untimedLeft = isTimed ? _untimedBetween : _untimedLeft - 1;
    ++_jobsAtWork;
    guard.unlock();
    std::exception_ptr thrown;
    std::optional<Times> times;
    try {
        times = runJob(index, isTimed);
    } catch (...) {
        thrown = std::current_exception();
    }
    guard.lock();
    --_jobsAtWork;
    if (thrown) {
        _thrown = thrown;
        _next = _count;
    } else {
        _done[index] = true;
    }
    if (times)
        noteTimes(*times);
    _changed.notify_all();
}

std::optional<OrderedWork::Times> OrderedWork::runJob(std::size_t index, bool isTimed)
{
    if (isTimed)
        return runTimed(index);
    _job(index);
    return std::nullopt;
}

OrderedWork::Times OrderedWork::runTimed(std::size_t index)
{
    const std::chrono::nanoseconds began = _platform.clock.monotonic();
    const std::chrono::nanoseconds beganOnProcessor = _platform.threads.processorTimeOfCurrentThread();
    _job(index);
    const std::chrono::nanoseconds onProcessor = _platform.threads.processorTimeOfCurrentThread() - beganOnProcessor;
    return { _platform.clock.monotonic() - began, onProcessor };
}

void OrderedWork::noteTimes(const Times& times)
{
    _passed += times.passed;
    _onProcessor += times.onProcessor;
    if (++_timedJobs < jobsBetweenLooks)
        return;
    const bool mostlyWaits = _onProcessor * 2 < _passed;
    _threadsWanted = mostlyWaits ? std::min(_threadsWanted * 2, threadsThatWait) : threadsAtWork;
    _untimedBetween = mostlyWaits ? 0 : untimedBetweenAtWork;
    _timedJobs = 0;
    _passed = _onProcessor = {};
}

/// Helpers are started where enough is left for them to do; where the system gives none, this thread does it all.
void OrderedWork::startThreads(std::unique_lock<std::mutex>& guard)
{
    while (_helpers + 1 < _threadsWanted && _next + jobsForAThread <= _count) {
        ++_helpers;
        guard.unlock();
        const bool isStarted = _startThread([work = shared_from_this()] { work->help(); });
        guard.lock();
        if (!isStarted) {
            --_helpers;
            _threadsWanted = _helpers + 1;
            return;
        }
    }
}
