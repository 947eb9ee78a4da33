#pragma once

#include <chrono>
#include <thread>

namespace tests {

/// How long a test waits for what has to happen; only a failure waits that long.
inline constexpr std::chrono::minutes longestWait { 1 };

/// Waits until `isSo`, which other threads bring about and nothing tells of. False when it did not become so.
template <class Condition> bool waitUntil(const Condition& isSo)
{
    const auto end = std::chrono::steady_clock::now() + longestWait;
    while (!isSo()) {
        if (std::chrono::steady_clock::now() > end)
            return false;
        std::this_thread::yield();
    }
    return true;
}

/// Lets other threads go on where they should not, if they would.
inline void giveOthersTheirTurn()
{
    for (int turn = 0; turn < 1000; ++turn)
        std::this_thread::yield();
}

} // namespace tests
