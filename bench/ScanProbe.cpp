#include "apps/common/Machine.h"
#include "apps/common/Memory.h"
#include "host/OBMediaHost.h"
#include "platform/MainRunLoop.h"
#include "platform/Movies.h"

#include <chrono>
#include <cstdint>
#include <cstdio>
#include <cstring>
#include <ctime>
#include <functional>
#include <optional>
#include <string>
#include <string_view>
#include <utility>

// The product's side of the scan's ratios: one load in one process, through what any application may call, from the
// request until the tree has arrived. Only the load counts; neither the start of the process nor its end does.
//
// With --without-headers every movie is answered as one without a header: no file is opened, no thread waits for another,
// and nothing is made that follows from a header.

namespace {

/// Movies that tell nothing, without a look at the file.
class SilentMovies final : public platform::Movies {
public:
    std::optional<platform::MovieHeader> headerOfMovie(std::string_view, platform::PathKnowledge) const override
    {
        return std::nullopt;
    }
};

/// A main thread wherever the caller is. What is to run later, runs on the real one.
class MainThreadEverywhere final : public platform::MainRunLoop {
public:
    explicit MainThreadEverywhere(platform::MainRunLoop& loop)
        : _loop(loop)
    {
    }

    void run() override { _loop.run(); }
    void runModal() override { _loop.runModal(); }
    void endModal() override { _loop.endModal(); }
    void quit() override { _loop.quit(); }
    bool isMainThread() const override { return true; }
    void post(std::function<void()> call) override { _loop.post(std::move(call)); }
    bool performAndWait(const std::function<void()>& call) override
    {
        call();
        return true;
    }
    void performAfterDelay(
        std::chrono::nanoseconds delay, platform::RunLoopModes modes, std::function<void()> call) override
    {
        _loop.performAfterDelay(delay, modes, std::move(call));
    }

private:
    platform::MainRunLoop& _loop;
};

platform::Platform withRoles(
    const platform::Platform& base, platform::Movies& movies, platform::MainRunLoop& mainRunLoop)
{
    return { base.fileSystem, base.volumes, base.workspace, base.preferences, base.metadataIndex, movies,
        base.notifications, base.workspaceNotifications, base.clock, base.threads, mainRunLoop, base.console,
        base.bundles, base.languages };
}

double secondsOf(clockid_t clock)
{
    struct timespec now { };
    ::clock_gettime(clock, &now);
    return double(now.tv_sec) + double(now.tv_nsec) / 1e9;
}

struct Load {
    OBLoadResult result;
    double processor = 0;
    double wall = 0;
};

/// Runs the main loop on this thread until the tree has arrived.
Load load(OBMediaManager& manager, platform::MainRunLoop& mainRunLoop)
{
    Load done;
    const double wall = secondsOf(CLOCK_MONOTONIC);
    const double processor = secondsOf(CLOCK_PROCESS_CPUTIME_ID);
    manager.requestRootMediaGroup([&mainRunLoop](std::function<void()> call) { mainRunLoop.post(std::move(call)); },
        [&](OBLoadResult result) {
            done.processor = secondsOf(CLOCK_PROCESS_CPUTIME_ID) - processor;
            done.wall = secondsOf(CLOCK_MONOTONIC) - wall;
            done.result = std::move(result);
            mainRunLoop.quit();
        });
    mainRunLoop.run();
    return done;
}

struct Count {
    std::uint64_t projects = 0;
    std::uint64_t movies = 0;
};

void countBelow(const OBMediaGroup& group, Count& count)
{
    for (const OBMediaGroupRef& child : group.childGroups()) {
        if (child->typeIdentifier() == OBMontaroProjectGroupTypeIdentifier) {
            ++count.projects;
            count.movies += child->ownMediaObjects().size();
        }
        countBelow(*child, count);
    }
}

int fail(std::string_view problem)
{
    std::fprintf(stderr, "scan_probe: %.*s\n", static_cast<int>(problem.size()), problem.data());
    return 1;
}

int measure(const platform::Platform& platform)
{
    constexpr std::chrono::seconds patience { 10 };
    OBMediaHost host(platform, {});
    OBManagerResult made = host.createManager("org.ombrix.OBMontaroPlugin");
    if (!made.manager)
        return fail(made.problem);
    const Load done = load(*made.manager, platform.mainRunLoop);
    made.manager.reset();
    if (done.result.outcome != OBLoadOutcome::loaded || !done.result.rootMediaGroup)
        return fail("the load brought no tree");
    Count count;
    countBelow(*done.result.rootMediaGroup, count);
    std::printf("{\"projects\": %ju, \"movies\": %ju, \"cpuSeconds\": %.6f, \"wallSeconds\": %.6f}\n",
        std::uintmax_t { count.projects }, std::uintmax_t { count.movies }, done.processor, done.wall);
    return host.waitForThreads(patience) ? 0 : fail("a thread does not end");
}

} // namespace

int main(int argc, char** argv)
{
    const bool withoutHeaders = argc == 4 && std::strcmp(argv[3], "--without-headers") == 0;
    if ((argc != 3 && !withoutHeaders) || std::strcmp(argv[1], "--machine") != 0) {
        std::fprintf(stderr, "usage: scan_probe --machine FILE [--without-headers]\n");
        return 2;
    }
    apps::takeMemoryInLargeSteps();
    const apps::MachineResult opened = apps::chooseMachine(std::string(argv[2]));
    if (!opened.machine)
        return fail(opened.problem);
    const platform::Platform& machine = opened.machine->platform();
    if (!withoutHeaders)
        return measure(machine);
    SilentMovies movies;
    MainThreadEverywhere mainThread(machine.mainRunLoop);
    return measure(withRoles(machine, movies, mainThread));
}
