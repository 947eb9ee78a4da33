#include "platform/linux/LinuxClock.h"
#include "tests/support/VirtualClock.h"

#include <doctest/doctest.h>

#include <atomic>
#include <thread>

using namespace std::chrono_literals;

TEST_CASE_TEMPLATE("monotonic time never goes back", Clock, platform::LinuxClock, tests::VirtualClock)
{
    const Clock clock {};
    auto before = clock.monotonic();
    for (int round = 0; round < 1000; ++round) {
        const auto after = clock.monotonic();
        CHECK(after >= before);
        before = after;
    }
}

TEST_CASE_TEMPLATE("a date's nanoseconds are less than a second", Clock, platform::LinuxClock, tests::VirtualClock)
{
    const Clock clock {};
    CHECK(clock.now().seconds > 1'500'000'000);
    CHECK(clock.now().nanoseconds < 1'000'000'000);
}

TEST_CASE_TEMPLATE("a sleep ends when its signal is raised", Clock, platform::LinuxClock, tests::VirtualClock)
{
    const Clock clock {};
    platform::WakeSignal wake;
    std::atomic<bool> sleptToTheEnd { true };
    std::thread sleeper([&] { sleptToTheEnd = clock.sleep(1h, wake); });
    wake.raise();
    sleeper.join();
    CHECK_FALSE(sleptToTheEnd);
}

TEST_CASE_TEMPLATE(
    "a sleep does not begin once its signal was raised", Clock, platform::LinuxClock, tests::VirtualClock)
{
    const Clock clock {};
    platform::WakeSignal wake;
    wake.raise();
    CHECK_FALSE(clock.sleep(1h, wake));
}

TEST_CASE_TEMPLATE("a sleep of no length ends at once", Clock, platform::LinuxClock, tests::VirtualClock)
{
    const Clock clock {};
    platform::WakeSignal wake;
    CHECK(clock.sleep(0ns, wake));
    CHECK(clock.sleep(-1s, wake));
}

TEST_CASE("the real clock sleeps at least as long as it was told")
{
    const platform::LinuxClock clock;
    platform::WakeSignal wake;
    const auto start = clock.monotonic();
    CHECK(clock.sleep(3ms, wake));
    CHECK(clock.monotonic() - start >= 3ms);
}

TEST_CASE("virtual time stands still until it is moved, and wakes those whose time has come")
{
    tests::VirtualClock clock({ 100, 999'999'999 });
    platform::WakeSignal wake;
    std::atomic<int> awake { 0 };
    std::thread early([&] { awake += clock.sleep(5s, wake) ? 1 : 100; });
    std::thread late([&] { awake += clock.sleep(10s, wake) ? 1 : 100; });
    REQUIRE(clock.waitForSleepers(2));
    clock.advance(4s);
    CHECK(awake == 0);
    clock.advance(1s);
    early.join();
    CHECK(awake == 1);
    CHECK(clock.sleepers() == 1);
    clock.advance(5s);
    late.join();
    CHECK(awake == 2);
    CHECK(clock.now() == platform::Date { 110, 999'999'999 });
    clock.advance(1ns);
    CHECK(clock.now() == platform::Date { 111, 0 });
}
