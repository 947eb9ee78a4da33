#include "tests/support/simulated/SimulatedThreads.h"

#include <algorithm>
#include <atomic>
#include <cstdio>
#include <cstdlib>
#include <semaphore>
#include <thread>
#include <utility>

#include <sched.h>

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
    bool isTested = false; ///< it runs code under test
    bool waitsForEver = false; ///< it may still wait when all is quiet
    bool waitsForQuiet = false;
    bool hasEnded = false;
    std::binary_semaphore go { 0 };
    std::binary_semaphore back { 0 };
    std::thread thread {};
};

namespace {

    constexpr std::size_t disturbsOneIn = 150;
    constexpr std::chrono::seconds longestDisturbance { 3 };

    thread_local SimulatedThreads::Thread* current = nullptr;
    thread_local int undisturbed = 0;

    /// How often a condition was signalled, by whichever thread.
    std::atomic<std::uint64_t> signals { 0 };

    /// Keeps this thread, and those that it starts, on the processor where it is: handing over is faster there.
    class OneProcessor {
    public:
        OneProcessor()
        {
            ::sched_getaffinity(0, sizeof(_before), &_before);
            cpu_set_t one;
            CPU_ZERO(&one);
            CPU_SET(::sched_getcpu(), &one);
            ::sched_setaffinity(0, sizeof(one), &one);
        }
        ~OneProcessor() { ::sched_setaffinity(0, sizeof(_before), &_before); }
        OneProcessor(const OneProcessor&) = delete;
        OneProcessor& operator=(const OneProcessor&) = delete;

    private:
        cpu_set_t _before {};
    };

} // namespace

SimulatedThreads::Undisturbed::Undisturbed()
{
    ++undisturbed;
}

SimulatedThreads::Undisturbed::~Undisturbed()
{
    --undisturbed;
}

SimulatedThreads::SimulatedThreads(Chance& chance, platform::Date now)
    : _chance(chance)
    , _start(now)
{
    start("machine", [this] { makeCalls(); });
}

SimulatedThreads::~SimulatedThreads()
{
    letAllEnd();
}

void SimulatedThreads::letAllEnd()
{
    _ends = true;
    while (runOne())
        continue;
    if (!_threads.empty()) {
        std::fprintf(stderr, "tests: simulated thread %s has not ended\n", _threads.front()->name.c_str());
        std::abort();
    }
}

bool SimulatedThreads::startDetached(const std::string& name, std::function<void()> body)
{
    const Undisturbed here;
    if (name == "ob-scan")
        return false;
    start(name, std::move(body)).isTested = true;
    return true;
}

SimulatedThreads::Thread& SimulatedThreads::start(const std::string& name, std::function<void()> body)
{
    auto thread = std::make_shared<Thread>();
    thread->owner = this;
    thread->name = name;
    thread->body = std::move(body);
    thread->at = _passed;
    thread->thread = std::thread([this, thread] { this->body(thread); });
    _threads.push_back(thread);
    return *thread;
}

void SimulatedThreads::body(const std::shared_ptr<Thread>& thread)
{
    thread->go.acquire();
    current = thread.get();
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
    const Undisturbed here;
    _calls.emplace(_passed + delay, std::move(call));
}

void SimulatedThreads::makeCalls()
{
    while (!_ends) {
        waitUntil([this] { return hasDueCall() || _ends; });
        if (!hasDueCall())
            continue;
        const auto call = _calls.extract(_calls.begin());
        call.mapped()();
    }
}

void SimulatedThreads::perform(std::function<void()> body)
{
    const OneProcessor here;
    bool isDone = false;
    start("application", [&] {
        body();
        isDone = true;
    });
    while (!isDone && (runOne() || letTimePass() || tellQuiet()))
        continue;
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

void SimulatedThreads::waitUntilQuiet() const
{
    current->waitsForQuiet = true;
    yield(nullptr, never);
    current->waitsForQuiet = false;
}

void SimulatedThreads::mayBeDisturbed()
{
    if (!current || !current->isTested || undisturbed != 0)
        return;
    const SimulatedThreads& owner = *current->owner;
    if (owner._chance.oneIn(disturbsOneIn))
        owner.pause(owner._chance.oneIn(2) ? owner._chance.time(longestDisturbance) : std::chrono::nanoseconds(0));
}

void SimulatedThreads::letOthersRun()
{
    // Who holds what is waited for may itself wait for time to pass.
    current->owner->pause(std::chrono::milliseconds(1));
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
    const Undisturbed here;
    Thread& self = *current;
    self.mayGoOn = std::move(mayGoOn);
    self.at = at;
    // The handing over locks and yields by itself.
    current = nullptr;
    self.back.release();
    self.go.acquire();
    current = &self;
}

void SimulatedThreads::handOver(Thread& thread) const
{
    thread.mayGoOn = nullptr;
    thread.go.release();
    thread.back.acquire();
}

/// Runs one of the threads whose time has come; false when there is none.
bool SimulatedThreads::runOne()
{
    removeEnded();
    std::vector<std::shared_ptr<Thread>> ready;
    for (const auto& thread : _threads) {
        if (thread->at <= _passed || (thread->mayGoOn && thread->mayGoOn()))
            ready.push_back(thread);
    }
    if (ready.empty())
        return false;
    handOver(*_chance.of(ready));
    return true;
}

/// To the next time at which something happens.
bool SimulatedThreads::letTimePass()
{
    // A call may be due while the thread that is to make it waits in another.
    std::chrono::nanoseconds next = _calls.empty() || hasDueCall() ? never : _calls.begin()->first;
    for (const auto& thread : _threads)
        next = std::min(next, thread->at);
    if (next == never)
        return false;
    _passed = next;
    return true;
}

/// Nothing can run any more: whoever waits for that goes on.
bool SimulatedThreads::tellQuiet()
{
    Thread* told = nullptr;
    for (const auto& thread : _threads) {
        if (thread->waitsForQuiet) {
            told = thread.get();
        } else if (!thread->waitsForEver) {
            std::fprintf(stderr, "tests: simulated thread %s waits for what never comes\n", thread->name.c_str());
            std::abort();
        }
    }
    if (told)
        handOver(*told);
    return told != nullptr;
}

void SimulatedThreads::removeEnded()
{
    for (const auto& thread : _threads) {
        if (thread->hasEnded)
            thread->thread.join();
    }
    std::erase_if(_threads, [](const auto& thread) { return thread->hasEnded; });
}

} // namespace tests
