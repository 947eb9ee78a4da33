#include "tests/host/TestHost.h"

#include <doctest/doctest.h>

#include <algorithm>
#include <atomic>
#include <mutex>
#include <numeric>
#include <thread>
#include <vector>

using namespace tests;
using namespace std::chrono_literals;

namespace {

/// Whether what jobs need is a processor, or a disk for which they wait.
enum class Need { processor, disk };

/// Jobs that note who runs what, on a machine whose time passes only inside them.
class NotedJobs {
public:
    /// Begins the job; answers how many are inside now, this one included.
    int begin(std::size_t index)
    {
        std::lock_guard guard(_lock);
        _begun.push_back(index);
        _farthestAhead = std::max(_farthestAhead, index - std::min(index, _taken));
        return ++_inside;
    }
    /// Lets time pass, on the processor or not, and ends the job.
    void end(Need need)
    {
        std::lock_guard guard(_lock);
        // Threads share both clocks here. So much that what other threads do between a look at one and a look at the
        // other is nothing against it.
        if (need == Need::processor)
            host.machine.threads.processorTime = host.machine.threads.processorTime.load() + 100ms;
        host.machine.bare.clock.advance(1ms);
        --_inside;
    }
    /// Waits inside a job; once in vain is enough for all jobs.
    void waitFor(const Event& event)
    {
        if (!_gaveUp && !event.wait())
            _gaveUp = true;
    }
    void take(std::size_t index)
    {
        std::lock_guard guard(_lock);
        _takenInOrder = _takenInOrder && index == _taken && std::this_thread::get_id() == _caller;
        ++_taken;
    }

    bool everyJobWasDoneOnceAndTakenInOrder(std::size_t count) const
    {
        std::vector<std::size_t> begun = _begun;
        std::sort(begun.begin(), begun.end());
        std::vector<std::size_t> all(count);
        std::iota(all.begin(), all.end(), std::size_t { 0 });
        return begun == all && _taken == count && _takenInOrder && _inside == 0;
    }
    /// How far before the one to be taken next a job was begun at most.
    std::size_t farthestAhead() const { return _farthestAhead; }
    std::size_t begunSoFar() const
    {
        std::lock_guard guard(_lock);
        return _begun.size();
    }
    std::size_t threadsStarted() const
    {
        const std::vector<std::string> started = host.machine.threads.started();
        return static_cast<std::size_t>(std::count(started.begin(), started.end(), "ob-scan"));
    }
    void perform(std::size_t count, const std::function<void(std::size_t)>& job)
    {
        manager->performInOrder(count, job, [this](std::size_t index) { take(index); });
    }
    /// The same with jobs that do nothing but let time pass.
    void perform(std::size_t count, Need need)
    {
        perform(count, [this, need](std::size_t index) {
            begin(index);
            end(need);
        });
    }

    TestHost host {};
    const std::shared_ptr<OBMediaManager> manager = host.manager();

private:
    const std::thread::id _caller = std::this_thread::get_id();
    std::atomic<bool> _gaveUp { false };
    mutable std::mutex _lock;
    std::vector<std::size_t> _begun {}; // under _lock, like what follows
    std::size_t _taken = 0;
    std::size_t _farthestAhead = 0;
    int _inside = 0;
    bool _takenInOrder = true;
};

} // namespace

TEST_CASE("every job is done once, and taken in order on the calling thread")
{
    for (const std::size_t count : { 1, 2, 7, 8, 9, 64, 65, 500 }) {
        CAPTURE(count);
        for (const Need need : { Need::processor, Need::disk }) {
            NotedJobs jobs;
            jobs.perform(count, need);
            CHECK(jobs.everyJobWasDoneOnceAndTakenInOrder(count));
        }
    }
}

TEST_CASE("without jobs nothing is called and nothing started")
{
    NotedJobs jobs;
    jobs.perform(0, Need::disk);
    CHECK(jobs.everyJobWasDoneOnceAndTakenInOrder(0));
    CHECK(jobs.threadsStarted() == 0);
}

TEST_CASE("fewer jobs than eight start no thread, eight do")
{
    NotedJobs few;
    few.perform(7, Need::disk);
    CHECK(few.threadsStarted() == 0);
    NotedJobs enough;
    enough.perform(8, Need::processor);
    CHECK(enough.threadsStarted() == 1);
}

TEST_CASE("two threads work while the processor is what jobs need")
{
    NotedJobs jobs;
    Event secondIsThere;
    jobs.perform(300, [&](std::size_t index) {
        if (jobs.begin(index) == 2)
            secondIsThere.happen();
        if (index >= 4)
            jobs.waitFor(secondIsThere);
        jobs.end(Need::processor);
    });
    CHECK(secondIsThere.hasHappened());
    CHECK(jobs.threadsStarted() == 1);
}

TEST_CASE("eight threads work while jobs wait for a disk, never more")
{
    NotedJobs jobs;
    Event eightAreThere;
    std::atomic<int> mostInside { 0 };
    jobs.perform(300, [&](std::size_t index) {
        const int inside = jobs.begin(index);
        for (int most = mostInside; most < inside && !mostInside.compare_exchange_weak(most, inside);) { }
        if (inside == 8)
            eightAreThere.happen();
        if (index >= 100)
            jobs.waitFor(eightAreThere);
        jobs.end(Need::disk);
    });
    CHECK(eightAreThere.hasHappened());
    CHECK(mostInside == 8);
    CHECK(jobs.threadsStarted() == 7);
    CHECK(jobs.everyJobWasDoneOnceAndTakenInOrder(300));
}

TEST_CASE("threads leave once jobs need the processor again")
{
    NotedJobs jobs;
    Event eightAreThere;
    std::atomic<int> mostInsideAtTheEnd { 0 };
    jobs.perform(500, [&](std::size_t index) {
        const int inside = jobs.begin(index);
        if (inside == 8)
            eightAreThere.happen();
        if (index >= 100 && index < 200)
            jobs.waitFor(eightAreThere);
        // By now whoever began a job in the days of eight threads has ended it. Who is still there gets a turn.
        for (int turn = 0; index >= 400 && turn < 200; ++turn)
            std::this_thread::yield();
        if (index >= 400)
            for (int most = mostInsideAtTheEnd;
                 most < inside && !mostInsideAtTheEnd.compare_exchange_weak(most, inside);) { }
        jobs.end(index < 200 ? Need::disk : Need::processor);
    });
    CHECK(eightAreThere.hasHappened());
    CHECK(mostInsideAtTheEnd <= 2);
    CHECK(jobs.everyJobWasDoneOnceAndTakenInOrder(500));
}

TEST_CASE("where no thread is to be had the calling thread does all jobs")
{
    NotedJobs jobs;
    jobs.host.machine.threads.refuses = true;
    const std::thread::id caller = std::this_thread::get_id();
    std::atomic<bool> isElsewhere { false };
    jobs.perform(300, [&](std::size_t index) {
        jobs.begin(index);
        if (std::this_thread::get_id() != caller)
            isElsewhere = true;
        jobs.end(Need::disk);
    });
    CHECK_FALSE(isElsewhere);
    CHECK(jobs.everyJobWasDoneOnceAndTakenInOrder(300));
}

TEST_CASE("jobs are begun up to sixty-four ahead of the one that is taken next, and no further")
{
    NotedJobs jobs;
    bool isAhead = false;
    jobs.manager->performInOrder(
        300,
        [&](std::size_t index) {
            jobs.begin(index);
            jobs.end(Need::processor);
        },
        [&](std::size_t index) {
            // While the first is being taken, the other thread goes as far as it may.
            if (index == 0) {
                isAhead = waitUntil([&] { return jobs.begunSoFar() >= 64; });
                giveOthersTheirTurn();
            }
            jobs.take(index);
        });
    CHECK(isAhead);
    CHECK(jobs.farthestAhead() == 63);
    CHECK(jobs.everyJobWasDoneOnceAndTakenInOrder(300));
}

TEST_CASE("the calling thread takes what is done before it begins another job")
{
    NotedJobs jobs;
    jobs.host.machine.threads.refuses = true;
    jobs.perform(100, Need::disk);
    CHECK(jobs.farthestAhead() == 0);
}

TEST_CASE("afterwards no thread is left, inside a job or waiting for one")
{
    NotedJobs jobs;
    for (int round = 0; round < 5; ++round) {
        jobs.perform(200, [&](std::size_t) { jobs.host.machine.bare.clock.advance(1ms); });
        CHECK(jobs.host.host().waitForThreads(longestWait));
        CHECK(jobs.host.host().threadCount() == 0);
    }
    CHECK(jobs.threadsStarted() > 0);
}

TEST_CASE("when it returns no job is running, however long the last ones took")
{
    NotedJobs jobs;
    std::atomic<int> inside { 0 };
    for (int round = 0; round < 200; ++round) {
        jobs.manager->performInOrder(
            16,
            [&](std::size_t) {
                ++inside;
                std::this_thread::yield();
                --inside;
            },
            [](std::size_t) {});
        REQUIRE(inside == 0);
    }
}
