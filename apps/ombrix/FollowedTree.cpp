#include "apps/ombrix/FollowedTree.h"

#include "host/OBSourceInspection.h"
#include "platform/Clock.h"
#include "platform/MainRunLoop.h"
#include "platform/PathWatching.h"

#include <utility>

namespace ombrix {
namespace {

    using namespace std::chrono_literals;
    using std::chrono::nanoseconds;

    constexpr auto betweenLooks = 100ms;
    /// Longer than what is written to a file without closing it goes unheard.
    constexpr auto quietTime = 1500ms;
    /// Longer than folders that are polled go unlooked at.
    constexpr auto quietTimeWithPolling = 11s;
    constexpr auto settlingAtMost = 60s;

    /// The source's word for the half of the tree that has nothing to do with the order of events.
    constexpr std::string_view projectsHalf = "projects";

} // namespace

FollowedTree::FollowedTree(OBMediaHost& host, std::shared_ptr<OBMediaManager> manager)
    : _host(host)
    , _manager(std::move(manager))
    , _platform(_manager->platform())
{
}

void FollowedTree::start(std::function<void(const OBLoadResult&)> loaded)
{
    const OBExecutor here = [&loop = _platform.mainRunLoop](std::function<void()> call) { loop.post(std::move(call)); };
    OBManagerCallbacks callbacks;
    callbacks.published = [this](const OBPublication& publication) { note(publication); };
    _progress.emplace(_manager);
    _following = _host.followChanges();
    _observing = _manager->observe(here, std::move(callbacks));
    _manager->requestRootMediaGroup(
        here, [this, self = shared_from_this(), call = std::move(loaded)](const auto& result) {
            _progress.reset();
            call(result);
        });
}

void FollowedTree::note(const OBPublication& publication)
{
    ++_publications;
    if (OBSourceInspection* inspection = _manager->inspection(); inspection && publication.part != projectsHalf)
        _scannedNewestFirst = inspection->mostRecentEventFirst();
}

void FollowedTree::settle(std::function<void(bool)> settled)
{
    _settled = std::move(settled);
    const nanoseconds now = _platform.clock.monotonic();
    look(now, now);
}

void FollowedTree::look(nanoseconds since, nanoseconds quietSince)
{
    const nanoseconds now = _platform.clock.monotonic();
    if (!_manager->isAtRest() || std::exchange(_publicationsSeen, _publications) != _publications)
        quietSince = now;
    const bool isPolled = _platform.pathWatching.state().polledFolders > 0;
    const nanoseconds wanted = isPolled ? nanoseconds(quietTimeWithPolling) : nanoseconds(quietTime);
    const bool isQuiet = now - quietSince >= wanted;
    if (isQuiet || now - since >= settlingAtMost)
        return std::exchange(_settled, nullptr)(isQuiet);
    _platform.mainRunLoop.performAfterDelay(betweenLooks, platform::RunLoopModes::common,
        [self = shared_from_this(), since, quietSince] { self->look(since, quietSince); });
}

} // namespace ombrix
