#include "platform/linux/LinuxMainRunLoop.h"

#include <doctest/doctest.h>

#include <atomic>
#include <string>
#include <thread>
#include <vector>

using platform::RunLoopModes;
using namespace std::chrono_literals;

TEST_CASE_TEMPLATE("calls run in the order in which they were posted", Loop, platform::LinuxMainRunLoop)
{
    Loop loop;
    std::string order;
    for (char letter : std::string("abc"))
        loop.post([&order, letter] { order.push_back(letter); });
    loop.post([&loop] { loop.quit(); });
    loop.run();
    CHECK(order == "abc");
}

TEST_CASE_TEMPLATE("whoever runs the loop is the main thread until it has ended", Loop, platform::LinuxMainRunLoop)
{
    Loop loop;
    bool wasMain = false;
    std::atomic<bool> otherWasMain { true };
    CHECK_FALSE(loop.isMainThread());
    loop.post([&] {
        wasMain = loop.isMainThread();
        std::thread([&] { otherWasMain = loop.isMainThread(); }).join();
        loop.quit();
    });
    loop.run();
    CHECK(wasMain);
    CHECK_FALSE(otherWasMain);
    CHECK_FALSE(loop.isMainThread());
}

TEST_CASE_TEMPLATE("a call from another thread is waited for", Loop, platform::LinuxMainRunLoop)
{
    Loop loop;
    int value = 0;
    std::atomic<bool> wasPerformed { false };
    std::atomic<int> seen { 0 };
    std::thread asker([&] {
        wasPerformed = loop.performAndWait([&value] { value = 7; });
        seen = value;
        loop.quit();
    });
    loop.run();
    asker.join();
    CHECK(wasPerformed);
    CHECK(seen == 7);
}

TEST_CASE_TEMPLATE("on the main thread a call that is waited for runs at once", Loop, platform::LinuxMainRunLoop)
{
    Loop loop;
    std::string order;
    const auto atOnce = [&order] { order += "at once "; };
    loop.post([&] {
        loop.post([&order] { order += "posted "; });
        CHECK(loop.performAndWait(atOnce));
        loop.post([&loop] { loop.quit(); });
    });
    loop.run();
    CHECK(order == "at once posted ");
}

TEST_CASE_TEMPLATE("once the loop has ended nothing runs, and nobody waits", Loop, platform::LinuxMainRunLoop)
{
    Loop loop;
    int runs = 0;
    loop.post([&] {
        loop.quit();
        loop.post([&runs] { ++runs; });
    });
    loop.run();
    loop.post([&runs] { ++runs; });
    CHECK_FALSE(loop.performAndWait([&runs] { ++runs; }));
    loop.performAfterDelay(0ns, RunLoopModes::commonAndModalPanel, [&runs] { ++runs; });
    loop.run();
    CHECK(runs == 0);
}

TEST_CASE_TEMPLATE("who waits when the loop ends is told so", Loop, platform::LinuxMainRunLoop)
{
    Loop loop;
    std::atomic<bool> wasPerformed { true };
    std::atomic<bool> hasRun { false };
    std::thread asker;
    std::atomic<bool> isAsking { false };
    loop.post([&] {
        asker = std::thread([&] {
            isAsking = true;
            wasPerformed = loop.performAndWait([&hasRun] { hasRun = true; });
        });
        while (!isAsking)
            std::this_thread::yield();
        loop.quit();
    });
    loop.run();
    asker.join();
    CHECK_FALSE(wasPerformed);
    CHECK_FALSE(hasRun);
}

TEST_CASE_TEMPLATE("delayed calls run in the order of their times", Loop, platform::LinuxMainRunLoop)
{
    Loop loop;
    std::string order;
    loop.performAfterDelay(20ms, RunLoopModes::common, [&] {
        order += "c";
        loop.quit();
    });
    loop.performAfterDelay(10ms, RunLoopModes::common, [&order] { order += "b"; });
    loop.performAfterDelay(0ms, RunLoopModes::common, [&order] { order += "a"; });
    loop.run();
    CHECK(order == "abc");
}

TEST_CASE_TEMPLATE(
    "a modal loop runs plain calls and those that are for it, and nests", Loop, platform::LinuxMainRunLoop)
{
    Loop loop;
    std::string order;
    loop.post([&] {
        loop.performAfterDelay(0ms, RunLoopModes::common, [&] { order += "common "; });
        loop.performAfterDelay(1ms, RunLoopModes::commonAndModalPanel, [&] {
            order += "both ";
            loop.post([&] {
                order += "inner ";
                loop.endModal();
            });
            loop.runModal();
            order += "back ";
            loop.endModal();
        });
        loop.runModal();
        order += "ended ";
        loop.performAfterDelay(5ms, RunLoopModes::common, [&loop] { loop.quit(); });
    });
    loop.run();
    CHECK(order == "both inner back ended common ");
}

TEST_CASE_TEMPLATE("ending the loop ends modal loops inside it", Loop, platform::LinuxMainRunLoop)
{
    Loop loop;
    std::string order;
    loop.post([&] {
        loop.post([&loop] { loop.quit(); });
        loop.runModal();
        order += "modal ";
    });
    loop.run();
    order += "loop";
    CHECK(order == "modal loop");
}

TEST_CASE_TEMPLATE("many threads post and wait at once", Loop, platform::LinuxMainRunLoop)
{
    Loop loop;
    int count = 0;
    std::atomic<int> performed { 0 };
    std::vector<std::thread> threads(8);
    std::atomic<int> left { 8 };
    const auto counting = [&count] { ++count; };
    const auto work = [&] {
        for (int round = 0; round < 200; ++round) {
            loop.post(counting);
            performed += loop.performAndWait(counting) ? 1 : 0;
        }
        if (--left == 0)
            loop.quit();
    };
    for (std::thread& thread : threads)
        thread = std::thread(work);
    loop.run();
    for (std::thread& thread : threads)
        thread.join();
    CHECK(count == 3200);
    CHECK(performed == 1600);
}
