// What applications hear of one manager: its trees, and how far its load is.

#include "host/CurrentWork.h"
#include "host/ManagerState.h"

#include <algorithm>

namespace {

/// Observers hear of progress at most ten times a second.
constexpr std::chrono::nanoseconds progressInterval = std::chrono::milliseconds(100);

} // namespace

void ManagerState::Progress::restart()
{
    isLoading = true;
    foldersDone = 0;
    itemsFound = 0;
    itemsSkipped = 0;
    pathAtWork.store({});
}

OBLoadProgress ManagerState::Progress::now() const
{
    const auto [path, since] = pathAtWork.load();
    return { isLoading, foldersDone, itemsFound, itemsSkipped, path, since };
}

std::shared_ptr<ManagerObserver> ManagerState::addObserver(OBExecutor executor, OBManagerCallbacks callbacks)
{
    auto observer = std::make_shared<ManagerObserver>();
    observer->executor = std::move(executor);
    observer->callbacks = std::move(callbacks);
    bool start = false;
    {
        std::lock_guard guard(_lock);
        if (_ended)
            return observer;
        _observers.push_back(observer);
        start = wantsLoadByItself() && queueLoad(Job::wholeLoad);
    }
    if (start)
        startLoadThread();
    return observer;
}

void ManagerState::removeObserver(const std::shared_ptr<ManagerObserver>& observer)
{
    observer->takenBack = true;
    std::lock_guard guard(_lock);
    std::erase(_observers, observer);
}

ManagerState::Observers ManagerState::observers() const
{
    std::lock_guard guard(_lock);
    return _observers;
}

bool ManagerState::publishRoot(const OBMediaGroupRef& group)
{
    Observers listening;
    {
        std::lock_guard guard(_lock);
        std::erase_if(_formerRoots, [](const std::weak_ptr<OBMediaGroup>& former) { return former.expired(); });
        const auto isGroup = [&](const std::weak_ptr<OBMediaGroup>& former) { return former.lock() == group; };
        if (std::any_of(_formerRoots.begin(), _formerRoots.end(), isGroup))
            return false;
        if (const OBMediaGroupRef before = root.exchange(group); before && before != group)
            _formerRoots.push_back(before);
        listening = _observers;
    }
    for (const auto& observer : listening) {
        if (!observer->callbacks.rootPublished && !observer->callbacks.published)
            continue;
        const auto tell = [observer, manager = _manager.weak_from_this(),
                              publication = CurrentWork::publicationOf(core->platform(), group)] {
            // Two threads may hand over in another order than they published in: what is out of date is not told.
            const auto alive = manager.lock();
            if (!alive || alive->rootMediaGroup() != publication.rootMediaGroup)
                return;
            if (!observer->takenBack && observer->callbacks.rootPublished)
                observer->callbacks.rootPublished(publication.rootMediaGroup);
            if (!observer->takenBack && observer->callbacks.published)
                observer->callbacks.published(publication);
        };
        observer->executor(tell);
    }
    return true;
}

void ManagerState::beginPath(const platform::Text& path)
{
    const std::chrono::nanoseconds time = core->platform().clock.monotonic();
    progress.pathAtWork.store({ path, time });
    const std::int64_t now = time.count();
    std::int64_t last = progress.lastTold;
    if (now - last < progressInterval.count() || !progress.lastTold.compare_exchange_strong(last, now))
        return;
    for (const auto& observer : observers()) {
        if (observer->callbacks.progressed) {
            observer->executor([observer, state = progress.now()] {
                if (!observer->takenBack)
                    observer->callbacks.progressed(state);
            });
        }
    }
}
