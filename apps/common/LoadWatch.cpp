#include "apps/common/LoadWatch.h"

#include "apps/common/DisplayWidth.h"
#include "apps/common/HostileNames.h"
#include "apps/common/HumanText.h"
#include "apps/common/StandardError.h"
#include "apps/common/Terminal.h"
#include "platform/Clock.h"
#include "platform/PathText.h"
#include "platform/ThreadSafety.h"
#include "platform/Threads.h"
#include "platform/Volumes.h"

#include <algorithm>
#include <set>
#include <string>
#include <utility>

#include <unistd.h>

namespace apps {
namespace {

    using namespace std::chrono_literals;

    constexpr auto untilFirstLine = 300ms;
    constexpr auto betweenLines = 100ms;
    constexpr auto patience = 3s;
    constexpr std::string_view volumesFolder = "/Volumes";

    /// Laid out: escapes are marked.
    std::string waitingLine(const OBLoadProgress& progress, std::string_view place)
    {
        return "ombrix: waiting for " + escapedName(place) + " (" + escapedName(progress.pathAtWork) + ")";
    }

} // namespace

struct LoadWatch::Watching {
    explicit Watching(WatchedWork watched)
        : work(std::move(watched))
        , platform(work.platform)
        , isTerminal(apps::isTerminal(STDERR_FILENO))
        , started(platform.clock.monotonic())
    {
    }

    void run()
    {
        auto delay = std::chrono::nanoseconds(untilFirstLine);
        while (platform.clock.sleep(delay, ended)) {
            tell(work.progress());
            delay = betweenLines;
        }
    }

    void tell(const OBLoadProgress& progress)
    {
        if (!progress.isLoading)
            return;
        const std::chrono::nanoseconds now = platform.clock.monotonic();
        const std::string place = nameOfPlace(platform, progress.pathAtWork);
        const bool isStuck = !progress.pathAtWork.empty() && now - progress.pathAtWorkSince >= patience;
        platform::Locked guard(telling);
        if (ended.isRaised())
            return;
        if (isStuck && !isTerminal && placesNamed.insert(place).second)
            printError(withoutMarks(waitingLine(progress, place)));
        if (!isTerminal)
            return;
        const int columns = std::min(longestProgress, sizeOfTerminal(STDERR_FILENO).columns - 1);
        showProgress(isStuck ? waitingProgress(progress, place, now - progress.pathAtWorkSince, columns)
                             : progressLine(progress, place, now - started, columns, work.item));
    }

    void end()
    {
        platform::Locked guard(telling);
        ended.raise();
        eraseProgress();
    }

    const WatchedWork work;
    const platform::Platform& platform;
    const bool isTerminal;
    const std::chrono::nanoseconds started;
    platform::WakeSignal ended;
    platform::Mutex telling; // held while something is shown, so that nothing is once the watch has ended
    std::set<std::string> placesNamed GUARDED_BY(telling);
};

LoadWatch::LoadWatch(const std::shared_ptr<OBMediaManager>& manager)
    : LoadWatch(WatchedWork { manager->platform(), [manager] { return manager->loadProgress(); } })
{
}

LoadWatch::LoadWatch(WatchedWork work)
    : _watching(std::make_shared<Watching>(std::move(work)))
{
    _watching->platform.threads.startDetached("load watch", [watching = _watching] { watching->run(); });
}

LoadWatch::~LoadWatch()
{
    _watching->end();
}

std::string nameOfPlace(const platform::Platform& platform, std::string_view path)
{
    if (platform::isSameOrBelow(path, volumesFolder)) {
        const std::string_view rest = platform::pathRelativeTo(path, volumesFolder);
        return std::string(rest.substr(0, rest.find('/')));
    }
    std::string longest = "/";
    for (std::string& volume : platform.volumes.localVolumes()) {
        if (volume.size() > longest.size() && platform::isSameOrBelow(path, volume))
            longest = std::move(volume);
    }
    return std::string(platform::lastPathComponent(longest == "/" ? path : longest));
}

std::string progressLine(const OBLoadProgress& progress, std::string_view place, std::chrono::nanoseconds elapsed,
    int columns, std::string_view item)
{
    const std::string facts = "  " + quantityText(progress.foldersDone, "folder") + "  "
        + quantityText(progress.itemsFound, item) + "  " + durationText(elapsed) + "  Ctrl-C cancels";
    const std::string start = "scanning ";
    const int room = columns - displayWidth(facts) - displayWidth(start);
    return withoutMarks(cutAtEnd(start + cutInMiddle(escapedName(place), room > 8 ? room : 8) + facts, columns));
}

std::string waitingProgress(
    const OBLoadProgress& progress, std::string_view place, std::chrono::nanoseconds waited, int columns)
{
    return withoutMarks(cutAtEnd(waitingLine(progress, place) + "  " + durationText(waited), columns));
}

} // namespace apps
