#include "host/OBMediaManagerClass.h"
#include "tests/live/LiveTree.h"
#include "tests/live/NumberFromEnvironment.h"
#include "tests/live/SimulatedLiveMachine.h"

#include <doctest/doctest.h>

#include <cstdint>
#include <string>

extern "C" const OBMediaManagerClass* OBPluginMediaManagerClass();

namespace {

constexpr std::uint64_t usualSeeds = 200;
constexpr int comparisons = 8;
constexpr int operationsBetween = 12;

/// A tree that is left open on a simulated machine.
struct SimulatedTree {
    explicit SimulatedTree(std::uint64_t seed)
        : machine(seed, reinterpret_cast<void*>(&OBPluginMediaManagerClass), OMBRIX_PLUGIN_FOLDER "/Montaro.obplugin")
    {
    }

    tests::SimulatedLiveMachine machine;
    tests::LiveTree tree { machine };
};

} // namespace

// OMBRIX_FIRST_SEED and OMBRIX_SEEDS choose others, and how many.
TEST_CASE("a tree left open equals a fresh load, whatever happened to the disks in between"
    * doctest::skip(!tests::simulatesLocks))
{
    const std::uint64_t first = tests::numberFromEnvironment("OMBRIX_FIRST_SEED", 1);
    const std::uint64_t count = tests::numberFromEnvironment("OMBRIX_SEEDS", usualSeeds);
    // What a process does once is done before, so that a seed replays exactly by itself.
    SimulatedTree(0).tree.differenceAfter(operationsBetween);
    for (std::uint64_t seed = first; seed != first + count; ++seed) {
        SimulatedTree simulated(seed);
        std::string difference;
        for (int comparison = 0; comparison < comparisons && difference.empty(); ++comparison) {
            difference = simulated.tree.differenceAfter(1 + (comparison * 7) % operationsBetween);
        }
        REQUIRE_MESSAGE(difference.empty(), "seed ", seed, ", again with OMBRIX_FIRST_SEED=", seed, " OMBRIX_SEEDS=1\n",
            simulated.tree.history(), difference);
    }
}
