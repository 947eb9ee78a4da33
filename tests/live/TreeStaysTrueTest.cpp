#include "tests/live/LiveTree.h"

#include <doctest/doctest.h>

#include <cstdint>
#include <cstdlib>
#include <string>

namespace {

std::uint64_t numberFromEnvironment(const char* name, std::uint64_t otherwise)
{
    const char* const text = std::getenv(name);
    return text ? std::strtoull(text, nullptr, 10) : otherwise;
}

constexpr std::uint64_t usualSeeds = 200;
constexpr int comparisons = 8;
constexpr int operationsBetween = 12;

} // namespace

// OMBRIX_FIRST_SEED and OMBRIX_SEEDS choose others, and how many.
TEST_CASE("a tree left open equals a fresh load, whatever happened to the disks in between"
    * doctest::skip(!tests::simulatesLocks))
{
    const std::uint64_t first = numberFromEnvironment("OMBRIX_FIRST_SEED", 1);
    const std::uint64_t count = numberFromEnvironment("OMBRIX_SEEDS", usualSeeds);
    // What a process does once is done before, so that a seed replays exactly by itself.
    tests::LiveTree(0).differenceAfter(operationsBetween);
    for (std::uint64_t seed = first; seed != first + count; ++seed) {
        tests::LiveTree tree(seed);
        std::string difference;
        for (int comparison = 0; comparison < comparisons && difference.empty(); ++comparison) {
            difference = tree.differenceAfter(1 + (comparison * 7) % operationsBetween);
        }
        REQUIRE_MESSAGE(difference.empty(), "seed ", seed, ", again with OMBRIX_FIRST_SEED=", seed, " OMBRIX_SEEDS=1\n",
            tree.history(), difference);
    }
}
