#include "platform/linux/LinuxMainRunLoop.h"

#include <doctest/doctest.h>

#include <atomic>
#include <chrono>
#include <future>
#include <memory>
#include <thread>
#include <vector>

using namespace std::chrono_literals;
using platform::LinuxMainRunLoop;
using platform::RunLoopModes;

namespace {

/// Calls `atEnd` when it is destroyed.
class Ending {
public:
    explicit Ending(std::function<void()> atEnd)
        : _atEnd(std::move(atEnd))
    {
    }
    ~Ending() { _atEnd(); }
    Ending(const Ending&) = delete;
    Ending& operator=(const Ending&) = delete;

private:
    std::function<void()> _atEnd;
};

} // namespace

TEST_CASE("who waits before the loop has begun waits for it")
{
    LinuxMainRunLoop loop;
    bool wasPerformed = false;
    bool wasOnMainThread = false;
    std::promise<void> begins;
    std::thread waiter([&] {
        begins.set_value();
        wasPerformed = loop.performAndWait([&] { wasOnMainThread = loop.isMainThread(); });
        loop.quit();
    });
    begins.get_future().wait();
    loop.run();
    waiter.join();
    CHECK(wasPerformed);
    CHECK(wasOnMainThread);
}

TEST_CASE("who waits for a loop that is ended before it begins is told so")
{
    LinuxMainRunLoop loop;
    bool wasPerformed = true;
    bool hasRun = false;
    std::promise<void> begins;
    std::thread waiter([&] {
        begins.set_value();
        wasPerformed = loop.performAndWait([&hasRun] { hasRun = true; });
    });
    begins.get_future().wait();
    loop.quit();
    waiter.join();
    CHECK_FALSE(wasPerformed);
    CHECK_FALSE(hasRun);
    loop.run();
    CHECK(!loop.isMainThread());
}

TEST_CASE("each call that is waited for runs once or not at all, and its thread knows which")
{
    LinuxMainRunLoop loop;
    constexpr int threadCount = 8;
    std::atomic<int> runs { 0 };
    std::atomic<int> answers { 0 };
    std::vector<std::thread> threads;
    threads.reserve(threadCount);
    for (int number = 0; number < threadCount; ++number) {
        threads.emplace_back([&] {
            while (loop.performAndWait([&] {
                if (++runs == 500)
                    loop.quit();
            }))
                ++answers;
        });
    }
    loop.run();
    for (std::thread& thread : threads)
        thread.join();
    CHECK(runs.load() == answers.load());
    CHECK(runs.load() == 500);
}

TEST_CASE("what a dropped call owns may use the loop while it ends")
{
    LinuxMainRunLoop loop;
    int endings = 0;
    const auto useLoop = [&] {
        ++endings;
        loop.post([] { CHECK(false); });
        CHECK(!loop.isMainThread());
    };
    auto first = std::make_shared<Ending>(useLoop);
    auto second = std::make_shared<Ending>(useLoop);
    loop.post([first] { CHECK(false); });
    loop.performAfterDelay(0s, RunLoopModes::common, [second] { CHECK(false); });
    first.reset();
    second.reset();
    loop.quit();
    CHECK(endings == 2);
    auto third = std::make_shared<Ending>(useLoop);
    loop.performAfterDelay(0s, RunLoopModes::common, [ending = std::move(third)] { CHECK(false); });
    CHECK(endings == 3);
}

TEST_CASE("a call that keeps posting itself does not keep a delayed one from running")
{
    LinuxMainRunLoop loop;
    bool delayedHasRun = false;
    std::function<void()> again = [&] {
        if (!delayedHasRun)
            loop.post(again);
        else
            loop.quit();
    };
    loop.performAfterDelay(1ms, RunLoopModes::common, [&] { delayedHasRun = true; });
    loop.post(again);
    loop.run();
    CHECK(delayedHasRun);
}

TEST_CASE("ending twice from one call ends the two innermost modal loops")
{
    LinuxMainRunLoop loop;
    std::vector<int> order;
    loop.post([&] {
        loop.post([&] {
            loop.post([&] {
                loop.endModal();
                loop.endModal();
                order.push_back(0);
            });
            loop.runModal();
            order.push_back(1);
        });
        loop.runModal();
        order.push_back(2);
        loop.quit();
    });
    loop.run();
    CHECK(order == std::vector<int> { 0, 1, 2 });
}

TEST_CASE("a modal loop that is asked for on another thread does not run")
{
    LinuxMainRunLoop loop;
    loop.runModal();
    loop.endModal();
    loop.post([&] { loop.quit(); });
    loop.run();
    CHECK(!loop.isMainThread());
}

TEST_CASE("a delayed call for another mode waits until its mode returns")
{
    LinuxMainRunLoop loop;
    std::vector<int> order;
    loop.post([&] {
        loop.performAfterDelay(0s, RunLoopModes::common, [&] {
            order.push_back(2);
            loop.quit();
        });
        loop.performAfterDelay(1ms, RunLoopModes::commonAndModalPanel, [&] {
            order.push_back(1);
            loop.endModal();
        });
        loop.runModal();
    });
    loop.run();
    CHECK(order == std::vector<int> { 1, 2 });
}

TEST_CASE("a delay beyond what a clock counts is waited for, and one of less than nothing is over")
{
    LinuxMainRunLoop loop;
    loop.performAfterDelay(std::chrono::nanoseconds::max(), RunLoopModes::common, [] { CHECK(false); });
    loop.performAfterDelay(std::chrono::nanoseconds::min(), RunLoopModes::common, [&] { loop.quit(); });
    loop.run();
}

TEST_CASE("calls without a body are nothing")
{
    LinuxMainRunLoop loop;
    loop.post({});
    loop.performAfterDelay(0s, RunLoopModes::common, {});
    CHECK(!loop.performAndWait({}));
    loop.post([&] { loop.quit(); });
    loop.run();
}
