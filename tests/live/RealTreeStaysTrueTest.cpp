#include "host/OBMediaManagerClass.h"
#include "tests/live/LiveTree.h"
#include "tests/live/NumberFromEnvironment.h"
#include "tests/live/RealLiveMachine.h"
#include "tests/support/OwnMounts.h"

#include <doctest/doctest.h>

#include <cstdint>
#include <string>
#include <vector>

#include <sys/wait.h>
#include <unistd.h>

extern "C" const OBMediaManagerClass* OBPluginMediaManagerClass();

namespace {

constexpr std::uint64_t usualSeeds = 12;
/// A long time in which loads and reloads meet changes; then a few at a time, of which each has to be noticed.
constexpr int operationsBetween[] = { 30, 1, 2, 1 };
constexpr unsigned secondsAtMost = 500;
constexpr const char* noMounts = "skipped: nothing is mounted, for this system lets nobody have mounts of his own";

/// What differs in the end; empty when nothing does.
std::string differenceOnRealDisk(std::uint64_t seed, bool mayMount)
{
    tests::RealLiveMachine machine(seed, reinterpret_cast<void*>(&OBPluginMediaManagerClass), mayMount);
    tests::LiveTree tree(machine);
    for (const int operations : operationsBetween) {
        const std::string difference = tree.differenceAfter(operations);
        if (!difference.empty())
            return tree.history() + difference;
    }
    return {};
}

/// A process of its own that tries one seed: the framework has one host a process.
class SeedProcess {
public:
    explicit SeedProcess(std::uint64_t seed)
        : _seed(seed)
    {
        int ends[2] {};
        REQUIRE(pipe(ends) == 0);
        _child = fork();
        REQUIRE(_child != -1);
        if (_child == 0) {
            close(ends[0]);
            run(ends[1]);
        }
        close(ends[1]);
        _answer = ends[0];
    }

    std::uint64_t seed() const { return _seed; }

    /// Waits for the end; the difference that was found, or how it failed.
    std::string difference()
    {
        std::string text;
        char piece[4096];
        for (ssize_t count = 0; (count = read(_answer, piece, sizeof piece)) > 0;)
            text.append(piece, static_cast<std::size_t>(count));
        close(_answer);
        int status = 0;
        while (waitpid(_child, &status, 0) == -1) { }
        if (!WIFEXITED(status))
            text += "ended by signal " + std::to_string(WTERMSIG(status));
        else if (WEXITSTATUS(status) != 0)
            text += "ended with " + std::to_string(WEXITSTATUS(status));
        return text;
    }

private:
    [[noreturn]] void run(int answer) const
    {
        alarm(secondsAtMost);
        const bool mayMount = tests::enterOwnMounts();
        tests::giveUpReadingEverything();
        const std::string difference = differenceOnRealDisk(_seed, mayMount);
        for (std::size_t done = 0; done < difference.size();) {
            const ssize_t count = write(answer, difference.data() + done, difference.size() - done);
            if (count <= 0)
                break;
            done += static_cast<std::size_t>(count);
        }
        _exit(0);
    }

    std::uint64_t _seed;
    pid_t _child = -1;
    int _answer = -1;
};

bool mountsAreAllowed()
{
    const pid_t child = fork();
    if (child == 0)
        _exit(tests::enterOwnMounts() ? 0 : 1);
    int status = 1;
    while (waitpid(child, &status, 0) == -1) { }
    return WIFEXITED(status) && WEXITSTATUS(status) == 0;
}

} // namespace

// OMBRIX_FIRST_SEED and OMBRIX_SEEDS choose others, and how many, all at once. What happens is the seed's, when is not.
TEST_CASE("a tree left open on real disks equals a fresh load, whatever happened to them in between")
{
    const std::uint64_t first = tests::numberFromEnvironment("OMBRIX_FIRST_SEED", 1);
    const std::uint64_t count = tests::numberFromEnvironment("OMBRIX_SEEDS", usualSeeds);
    if (!mountsAreAllowed())
        MESSAGE(noMounts);
    std::vector<SeedProcess> processes;
    for (std::uint64_t seed = first; seed != first + count; ++seed)
        processes.emplace_back(seed);
    for (SeedProcess& process : processes) {
        const std::string difference = process.difference();
        CHECK_MESSAGE(difference.empty(), "seed ", process.seed(), ", again with OMBRIX_FIRST_SEED=", process.seed(),
            " OMBRIX_SEEDS=1\n", difference);
    }
}
