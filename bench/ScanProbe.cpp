#include "apps/common/Machine.h"
#include "apps/common/Memory.h"
#include "host/OBMediaHost.h"
#include "platform/MainRunLoop.h"
#include "platform/Movies.h"

#include <charconv>
#include <chrono>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <ctime>
#include <fstream>
#include <functional>
#include <optional>
#include <string>
#include <string_view>
#include <utility>

// The product's side of the scan's ratios: one load in one process, through what any application may call, from the
// request until the tree has arrived. Only the load counts; neither the start of the process nor its end does.
//
// With --without-headers every movie is answered as one without a header: no file is opened, no thread waits for
// another, and nothing is made that follows from a header. With --cancel-after the load is cancelled on its way.

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
    return { base.fileSystem, base.pathWatching, base.volumes, base.workspace, base.preferences, base.metadataIndex,
        movies, base.notifications, base.workspaceNotifications, base.clock, base.calendar, base.threads, mainRunLoop,
        base.console, base.bundles, base.languages };
}

double secondsOf(clockid_t clock)
{
    struct timespec now { };
    ::clock_gettime(clock, &now);
    return double(now.tv_sec) + double(now.tv_nsec) / 1e9;
}

struct Options {
    std::string machine;
    bool withoutHeaders = false;
    std::optional<std::chrono::milliseconds> cancelAfter;
};

struct Load {
    OBLoadResult result;
    double start = 0;
    double processor = 0;
    double wall = 0;
    std::optional<double> cancelled; // seconds from the start until the cancel; absent when the load was faster
};

/// Runs the main loop on this thread until the tree has arrived.
Load load(OBMediaManager& manager, platform::MainRunLoop& mainRunLoop, const Options& options)
{
    Load done;
    if (options.cancelAfter) {
        mainRunLoop.performAfterDelay(*options.cancelAfter, platform::RunLoopModes::common, [&] {
            done.cancelled = secondsOf(CLOCK_MONOTONIC) - done.start;
            manager.cancelLoad();
        });
    }
    done.start = secondsOf(CLOCK_MONOTONIC);
    const double processor = secondsOf(CLOCK_PROCESS_CPUTIME_ID);
    manager.requestRootMediaGroup([&mainRunLoop](std::function<void()> call) { mainRunLoop.post(std::move(call)); },
        [&](OBLoadResult result) {
            done.processor = secondsOf(CLOCK_PROCESS_CPUTIME_ID) - processor;
            done.wall = secondsOf(CLOCK_MONOTONIC) - done.start;
            done.result = std::move(result);
            mainRunLoop.quit();
        });
    mainRunLoop.run();
    return done;
}

/// The most memory this process has held; absent where the kernel does not tell.
///
/// Not what getrusage says: that begins with the memory of whoever started this process.
std::optional<std::uint64_t> peakBytes()
{
    constexpr std::string_view peak = "VmHWM:";
    std::ifstream status("/proc/self/status");
    for (std::string line; std::getline(status, line);) {
        if (line.starts_with(peak))
            return std::strtoull(line.c_str() + peak.size(), nullptr, 10) * 1024;
    }
    return std::nullopt;
}

struct Count {
    std::uint64_t projects = 0;
    std::uint64_t movies = 0;
    std::uint64_t events = 0;
    std::uint64_t clips = 0;
};

void countBelow(const OBMediaGroup& group, Count& count)
{
    for (const OBMediaGroupRef& child : group.childGroups()) {
        const OBTypeIdentifierRef type = child->typeIdentifier();
        if (type == OBMontaroProjectGroupTypeIdentifier) {
            ++count.projects;
            count.movies += child->ownMediaObjects().size();
        } else if (type == OBMontaroEventGroupTypeIdentifier) {
            ++count.events;
            count.clips += child->ownMediaObjects().size();
        }
        countBelow(*child, count);
    }
}

int fail(std::string_view problem)
{
    std::fprintf(stderr, "scan_probe: %.*s\n", static_cast<int>(problem.size()), problem.data());
    return 1;
}

int reportLoad(const Load& done)
{
    const std::optional<std::uint64_t> peak = peakBytes();
    if (!peak)
        return fail("the kernel does not tell how much memory was held");
    if (done.result.outcome != OBLoadOutcome::loaded || !done.result.rootMediaGroup)
        return fail("the load brought no tree");
    Count count;
    countBelow(*done.result.rootMediaGroup, count);
    std::printf("{\"projects\": %ju, \"movies\": %ju, \"events\": %ju, \"clips\": %ju, \"mediaObjects\": %zu, "
                "\"cpuSeconds\": %.6f, \"wallSeconds\": %.6f, \"peakBytes\": %ju}\n",
        std::uintmax_t { count.projects }, std::uintmax_t { count.movies }, std::uintmax_t { count.events },
        std::uintmax_t { count.clips }, done.result.rootMediaGroup->mediaObjects().size(), done.processor, done.wall,
        std::uintmax_t { *peak });
    return 0;
}

/// How long after the cancel the load had ended, and then its threads, while the manager is still there.
int reportCancel(const Load& done, OBMediaHost& host)
{
    constexpr std::chrono::seconds soon { 1 };
    if (!done.cancelled || done.result.outcome != OBLoadOutcome::cancelled)
        return fail("the load ended before it was cancelled");
    host.waitForThreads(soon);
    const double cancelled = done.start + *done.cancelled;
    const double threadsEnded = secondsOf(CLOCK_MONOTONIC) - cancelled;
    std::printf("{\"cancelledAfterSeconds\": %.6f, \"loadEndedSeconds\": %.6f, \"threadsEndedSeconds\": %.6f, "
                "\"threads\": %zu}\n",
        *done.cancelled, done.wall - *done.cancelled, threadsEnded, host.threadCount());
    return 0;
}

int measure(const platform::Platform& platform, const Options& options)
{
    constexpr std::chrono::seconds patience { 10 };
    OBMediaHost host(platform, {});
    OBManagerResult made = host.createManager("org.ombrix.OBMontaroPlugin");
    if (!made.manager)
        return fail(made.problem);
    const Load done = load(*made.manager, platform.mainRunLoop, options);
    const int status = options.cancelAfter ? reportCancel(done, host) : reportLoad(done);
    made.manager.reset();
    return host.waitForThreads(patience) ? status : fail("a thread does not end");
}

std::optional<std::chrono::milliseconds> millisecondsFrom(std::string_view text)
{
    unsigned count = 0;
    const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), count);
    if (error != std::errc() || end != text.data() + text.size())
        return std::nullopt;
    return std::chrono::milliseconds(count);
}

/// Absent when the arguments cannot be understood.
std::optional<Options> optionsFrom(int argc, char** argv)
{
    Options options;
    for (int index = 1; index < argc; ++index) {
        const std::string_view name = argv[index];
        const char* value = index + 1 < argc ? argv[index + 1] : "";
        if (name == "--without-headers") {
            options.withoutHeaders = true;
        } else if (name == "--machine") {
            options.machine = value;
            ++index;
        } else if (name == "--cancel-after" && millisecondsFrom(value)) {
            options.cancelAfter = millisecondsFrom(value);
            ++index;
        } else {
            return std::nullopt;
        }
    }
    return options.machine.empty() ? std::nullopt : std::optional(std::move(options));
}

} // namespace

int main(int argc, char** argv)
{
    const std::optional<Options> options = optionsFrom(argc, argv);
    if (!options) {
        std::fprintf(stderr, "usage: scan_probe --machine FILE [--without-headers] [--cancel-after MILLISECONDS]\n");
        return 2;
    }
    apps::takeMemoryInLargeSteps();
    const apps::MachineResult opened = apps::chooseMachine(options->machine);
    if (!opened.machine)
        return fail(opened.problem);
    const platform::Platform& machine = opened.machine->platform();
    if (!options->withoutHeaders)
        return measure(machine, *options);
    SilentMovies movies;
    MainThreadEverywhere mainThread(machine.mainRunLoop);
    return measure(withRoles(machine, movies, mainThread), *options);
}
