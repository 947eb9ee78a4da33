#include "tests/support/simulated/SimulatedThreads.h"

#include <algorithm>
#include <atomic>
#include <cstdio>
#include <cstdlib>
#include <semaphore>
#include <thread>
#include <utility>

namespace tests {

namespace {

    constexpr std::chrono::nanoseconds never = std::chrono::nanoseconds::max();

} // namespace

/// One thread; all of it belongs to whoever runs at the moment.
struct SimulatedThreads::Thread {
    SimulatedThreads* owner = nullptr;
    std::string name {};
    std::function<void()> body {};
    std::function<bool()> mayGoOn {}; ///< what it waits for beside its time; none when empty
    std::chrono::nanoseconds at {}; ///< when it goes on in any case
    bool waitsForEver = false; ///< it may still wait when all is quiet
    bool hasEnded = false;
    std::binary_semaphore go { 0 };
    std::binary_semaphore back { 0 };
    std::thread thread {};
};

namespace {

    thread_local SimulatedThreads::Thread* current = nullptr;

    /// How often a condition was signalled, by whichever thread.
    std::atomic<std::uint64_t> signals { 0 };

} // namespace

SimulatedThreads::SimulatedThreads(Chance& chance, platform::Date now)
    : _chance(chance)
    , _start(now)
{
}

SimulatedThreads::~SimulatedThreads()
{
    removeEnded();
    if (!_threads.empty()) {
        std::fprintf(stderr, "tests: simulated thread %s has not ended\n", _threads.front()->name.c_str());
        std::abort();
    }
}

bool SimulatedThreads::startDetached(const std::string& name, std::function<void()> body)
{
    if (name == "ob-scan")
        return false;
    auto thread = std::make_shared<Thread>();
    thread->owner = this;
    thread->name = name;
    thread->body = std::move(body);
    thread->at = _passed;
    thread->thread = std::thread([this, thread] { this->body(thread); });
    _threads.push_back(std::move(thread));
    return true;
}

void SimulatedThreads::body(const std::shared_ptr<Thread>& thread)
{
    current = thread.get();
    thread->go.acquire();
    std::exchange(thread->body, nullptr)();
    thread->hasEnded = true;
    current = nullptr;
    thread->back.release();
}

platform::Date SimulatedThreads::now() const
{
    constexpr std::int64_t second = 1'000'000'000;
    const std::int64_t nanoseconds = _start.nanoseconds + _passed.count();
    return { _start.seconds + nanoseconds / second, static_cast<std::uint32_t>(nanoseconds % second) };
}

bool SimulatedThreads::sleep(std::chrono::nanoseconds duration, platform::WakeSignal& wake) const
{
    yield([&wake] { return wake.isRaised(); }, _passed + duration);
    return !wake.isRaised();
}

void SimulatedThreads::after(std::chrono::nanoseconds delay, std::function<void()> call)
{
    _calls.emplace(_passed + delay, std::move(call));
}

bool SimulatedThreads::isSimulated()
{
    return current != nullptr;
}

void SimulatedThreads::pause(std::chrono::nanoseconds duration) const
{
    if (current)
        yield(nullptr, _passed + duration);
}

void SimulatedThreads::waitUntil(std::function<bool()> condition) const
{
    current->waitsForEver = true;
    yield(std::move(condition), never);
    current->waitsForEver = false;
}

void SimulatedThreads::waitForMutex(pthread_mutex_t* mutex)
{
    const auto isFree = [mutex] { return ::pthread_mutex_trylock(mutex) == 0 && ::pthread_mutex_unlock(mutex) == 0; };
    current->owner->yield(isFree, never);
}

void SimulatedThreads::waitForCondition()
{
    current->owner->yield([before = signals.load()] { return signals != before; }, never);
}

void SimulatedThreads::conditionSignalled()
{
    ++signals;
}

void SimulatedThreads::yield(std::function<bool()> mayGoOn, std::chrono::nanoseconds at) const
{
    Thread& self = *current;
    self.mayGoOn = std::move(mayGoOn);
    self.at = at;
    self.back.release();
    self.go.acquire();
}

void SimulatedThreads::handOver(Thread& thread) const
{
    thread.mayGoOn = nullptr;
    thread.go.release();
    thread.back.acquire();
}

void SimulatedThreads::run(std::chrono::nanoseconds duration)
{
    const std::chrono::nanoseconds end = _passed + duration;
    while (runOne() || letTimePass(end))
        continue;
    _passed = std::max(_passed, end);
}

void SimulatedThreads::runUntilQuiet()
{
    while (runOne() || letTimePass(never))
        continue;
    checkForDeadlock();
}

/// Runs one of the threads and calls whose time has come; false when there is none.
bool SimulatedThreads::runOne()
{
    removeEnded();
    std::vector<std::shared_ptr<Thread>> ready;
    for (const auto& thread : _threads) {
        if (thread->at <= _passed || (thread->mayGoOn && thread->mayGoOn()))
            ready.push_back(thread);
    }
    const bool hasCall = !_calls.empty() && _calls.begin()->first <= _passed;
    if (ready.empty() && !hasCall)
        return false;
    const std::size_t chosen = _chance.below(ready.size() + (hasCall ? 1 : 0));
    if (chosen < ready.size()) {
        handOver(*ready[chosen]);
    } else {
        const auto call = _calls.extract(_calls.begin());
        call.mapped()();
    }
    return true;
}

/// To the next time at which something happens, if that comes before `end`.
bool SimulatedThreads::letTimePass(std::chrono::nanoseconds end)
{
    std::chrono::nanoseconds next = _calls.empty() ? never : _calls.begin()->first;
    for (const auto& thread : _threads)
        next = std::min(next, thread->at);
    if (next == never || next > end)
        return false;
    _passed = std::max(_passed, next);
    return true;
}

void SimulatedThreads::removeEnded()
{
    for (const auto& thread : _threads) {
        if (thread->hasEnded)
            thread->thread.join();
    }
    std::erase_if(_threads, [](const auto& thread) { return thread->hasEnded; });
}

void SimulatedThreads::checkForDeadlock() const
{
    for (const auto& thread : _threads) {
        if (!thread->waitsForEver) {
            std::fprintf(stderr, "tests: simulated thread %s waits for what never comes\n", thread->name.c_str());
            std::abort();
        }
    }
}

} // namespace tests
