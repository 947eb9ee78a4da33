// Loads of one manager: who asked, which load answers whom, and who is told.
//
// The one surprise: `loadData` is an operation that plug-ins override and that must end up in the base class, which is
// where the load runs. So the load thread calls `loadData`, and the base operation knows by a mark of the thread that
// it is being called from there.

#include "host/ManagerState.h"

#include "host/CurrentWork.h"
#include "platform/Notifications.h"
#include "platform/Threads.h"

#include <algorithm>
#include <cmath>

namespace {

/// Observers hear of progress at most ten times a second.
constexpr std::chrono::nanoseconds progressInterval = std::chrono::milliseconds(100);

/// The manager whose load runs on this thread.
thread_local const ManagerState* loadingOnThisThread = nullptr;

/// 0.5 and above is a normal thread, like what is no number; below, linearly to the nicest at 0.0.
int niceForPriority(double priority)
{
    constexpr int nicest = 19;
    return priority < 0.5 ? static_cast<int>(std::lround((0.5 - std::max(priority, 0.0)) / 0.5 * nicest)) : 0;
}

} // namespace

ManagerState::ManagerState(OBMediaManager& manager, const OBManagerContext& context)
    : core(context._core)
    , bundle(context._bundle)
    , _manager(manager)
{
}

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

void ManagerState::requestTree(const OBExecutor& executor, std::function<void(OBLoadResult)> completion)
{
    OBLoadResult ready;
    bool start = false;
    {
        std::lock_guard guard(_lock);
        ready.rootMediaGroup = root.load();
        if (_ended) {
            ready = { OBLoadOutcome::ended, nullptr };
        } else {
            const bool joins = _loadActive && !_needsReload && !gate.isCancelPending();
            if (joins || _needsReload || !ready.rootMediaGroup || _loadActive || _loadQueued) {
                _waiters.push_back({ joins ? _loadNumber : _loadNumber + 1, executor, std::move(completion) });
                start = !joins && queueLoad(Job::wholeLoad);
                completion = nullptr;
            }
        }
    }
    if (start)
        startLoadThread();
    if (completion)
        executor([call = std::move(completion), result = std::move(ready)] { call(result); });
}

void ManagerState::requestLoad(Job job)
{
    bool start = false;
    {
        std::lock_guard guard(_lock);
        start = !_ended && queueLoad(job);
    }
    if (start)
        startLoadThread();
}

void ManagerState::setNeedsReload(bool needed)
{
    bool start = false;
    {
        std::lock_guard guard(_lock);
        _needsReload = needed;
        start = wantsLoadByItself() && queueLoad(Job::wholeLoad);
    }
    if (start)
        startLoadThread();
}

void ManagerState::setAutoReload(bool enabled)
{
    bool start = false;
    {
        std::lock_guard guard(_lock);
        _autoReload = enabled;
        start = wantsLoadByItself() && queueLoad(Job::wholeLoad);
    }
    if (start)
        startLoadThread();
}

void ManagerState::wasHandedOut()
{
    bool start = false;
    {
        std::lock_guard guard(_lock);
        _handedOut = true;
        start = _loadQueued && !std::exchange(_threadRuns, true);
    }
    if (start)
        startLoadThread();
}

bool ManagerState::wantsLoadByItself() const
{
    return _needsReload && _autoReload && _handedOut && !_ended && !_observers.empty();
}

bool ManagerState::queueLoad(Job job)
{
    if (!_loadQueued || job == Job::wholeLoad)
        _queuedJob = job;
    _loadQueued = true;
    return _handedOut && !std::exchange(_threadRuns, true);
}

void ManagerState::startLoadThread()
{
    const auto manager = _manager.shared_from_this();
    if (core->startThread("ob-load", [this, manager] { runLoads(); }))
        return;
    {
        std::lock_guard guard(_lock);
        _threadRuns = false;
        _loadQueued = false;
        ++_loadNumber;
    }
    core->log("a load could not start: the system gives no thread", 1, &_manager);
    finishLoad(OBLoadOutcome::unavailable);
}

void ManagerState::runLoads()
{
    Job job {};
    while (beginLoad(job))
        finishLoad(runLoad(job));
}

/// Takes the next load from the queue; false, and the thread is to end, when there is none.
bool ManagerState::beginLoad(Job& job)
{
    const bool open = gate.begin(changeTime());
    std::unique_lock guard(_lock);
    if (!open || _ended || !_loadQueued) {
        _threadRuns = false;
        guard.unlock();
        if (open)
            endWork();
        return false;
    }
    job = _queuedJob;
    _loadQueued = false;
    _loadActive = true;
    _needsReload = false;
    _problems.clear();
    ++_loadNumber;
    return true;
}

OBLoadOutcome ManagerState::runLoad(Job job)
{
    progress.restart();
    core->platform().threads.setNiceOfCurrentThread(niceForPriority(loadThreadPriority));
    loadingOnThisThread = this;
    OBLoadOutcome outcome = OBLoadOutcome::loaded;
    if (job == Job::performOnly)
        performLoad();
    else if (_manager.canLoadData())
        _manager.loadData();
    else
        outcome = OBLoadOutcome::unavailable;
    loadingOnThisThread = nullptr;
    return gate.isCancelPending() ? OBLoadOutcome::cancelled : outcome;
}

void ManagerState::finishLoad(OBLoadOutcome outcome)
{
    progress.isLoading = false;
    progress.pathAtWork.store({});
    std::vector<Waiter> answered;
    Observers listening;
    bool wasActive = false;
    {
        std::lock_guard guard(_lock);
        wasActive = std::exchange(_loadActive, false);
        // Asked again, a load that gave no whole tree starts over; by itself it does not, or a cancel would never be
        // one.
        _needsReload = _needsReload || outcome != OBLoadOutcome::loaded;
        const auto later = std::stable_partition(
            _waiters.begin(), _waiters.end(), [this](const Waiter& waiter) { return waiter.load <= _loadNumber; });
        answered.assign(std::make_move_iterator(_waiters.begin()), std::make_move_iterator(later));
        _waiters.erase(_waiters.begin(), later);
        listening = _observers;
    }
    if (wasActive)
        endWork();
    core->pathWatcher().resumeReports(&_manager);
    const OBLoadResult result { outcome, root.load() };
    deliver(std::move(answered), result);
    for (const auto& observer : listening) {
        if (observer->callbacks.loadEnded) {
            observer->executor([observer, result] {
                if (!observer->takenBack)
                    observer->callbacks.loadEnded(result);
            });
        }
    }
}

void ManagerState::deliver(std::vector<Waiter> waiters, const OBLoadResult& result)
{
    for (Waiter& waiter : waiters)
        waiter.executor([call = std::move(waiter.completion), result] { call(result); });
}

bool ManagerState::firstLoadData() const
{
    std::lock_guard guard(_lock);
    return _firstLoadData;
}

void ManagerState::loadDataCalled()
{
    if (loadingOnThisThread == this)
        performLoad();
    else
        requestLoad(Job::performOnly);
    std::lock_guard guard(_lock);
    _firstLoadData = false;
}

void ManagerState::performLoad()
{
    // A source that asks for a load while it loads gets one afterwards.
    loadingOnThisThread = nullptr;
    const CurrentWork work(core->platform(), {});
    if (const OBMediaGroupRef group = _manager.performLoadData()) {
        _manager.setRootMediaGroup(group);
        _manager.rootMediaGroupInstalled(group);
    }
}

/// Nothing here waits: what is at work sees the cancel, what sleeps wakes, and each keeps the manager alive until it
/// returns.
void ManagerState::end()
{
    std::vector<Waiter> waiting;
    Observers listening;
    decltype(_notifications) notifications;
    decltype(_postponed) postponed; // they hold the manager
    {
        std::lock_guard guard(_lock);
        if (std::exchange(_ended, true))
            return;
        waiting = std::exchange(_waiters, {});
        listening = std::exchange(_observers, {});
        notifications = std::exchange(_notifications, {});
        postponed = std::exchange(_postponed, {});
    }
    gate.close();
    ended.raise();
    core->pathWatcher().removeObserver(&_manager);
    for (const auto& [center, token] : notifications)
        center->removeObserver(token);
    for (const auto& observer : listening)
        observer->takenBack = true;
    deliver(std::move(waiting), { OBLoadOutcome::ended, nullptr });
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

void ManagerState::addNotification(platform::NotificationCenter& center, platform::NotificationCenter::Token token)
{
    {
        std::lock_guard guard(_lock);
        if (!_ended) {
            _notifications.emplace_back(&center, token);
            return;
        }
    }
    center.removeObserver(token);
}

void ManagerState::noteProblem(std::string_view path, platform::FileProblem problem)
{
    std::lock_guard guard(_lock);
    _problems.push_back({ std::string(path), problem });
}

std::vector<OBLoadProblem> ManagerState::problems() const
{
    std::lock_guard guard(_lock);
    return _problems;
}
