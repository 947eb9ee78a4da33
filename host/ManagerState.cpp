// Loads of one manager: who asked, which load answers whom, and who is told.
//
// The one surprise: `loadData` is an operation that plug-ins override and that must end up in the base class, which is
// where the load runs. So the load thread calls `loadData`, and the base operation knows by a mark of the thread that
// it is being called from there.

#include "host/ManagerState.h"

#include "host/CurrentWork.h"
#include "host/SourceCall.h"
#include "platform/Console.h"
#include "platform/Notifications.h"
#include "platform/Threads.h"

#include <algorithm>
#include <cmath>

namespace {

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
    setWish(_needsReload, needed);
}

void ManagerState::setAutoReload(bool enabled)
{
    setWish(_autoReload, enabled);
}

void ManagerState::setWish(bool& wish, bool value)
{
    bool start = false;
    {
        std::lock_guard guard(_lock);
        wish = value;
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
    finishLoad({ OBLoadOutcome::unavailable });
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
    const bool hasNext = open && !_ended && _loadQueued;
    // Who cancelled before this load was taken may have asked for it since: it is not the one that was meant.
    if (!hasNext || gate.isCancelPending()) {
        _threadRuns = hasNext;
        guard.unlock();
        if (open)
            endWork();
        return hasNext && beginLoad(job);
    }
    job = _queuedJob;
    _loadQueued = false;
    _loadActive = true;
    _needsReload = false;
    _problems.clear();
    ++_loadNumber;
    return true;
}

OBLoadResult ManagerState::runLoad(Job job)
{
    progress.restart();
    core->platform().threads.setNiceOfCurrentThread(niceForPriority(loadThreadPriority));
    loadingOnThisThread = this;
    OBLoadResult result;
    bool canLoad = true;
    result.problem = errorThrownBy([&] { canLoad = callLoad(job); });
    loadingOnThisThread = nullptr;
    if (!result.problem.empty()) {
        result.outcome = OBLoadOutcome::failed;
        core->log("the load failed: " + result.problem, 1, &_manager);
    } else if (gate.isCancelPending()) {
        result.outcome = OBLoadOutcome::cancelled;
    } else if (!canLoad) {
        result.outcome = OBLoadOutcome::unavailable;
    }
    return result;
}

bool ManagerState::callLoad(Job job)
{
    if (job == Job::performOnly) {
        performLoad();
        return true;
    }
    const bool canLoad = _manager.canLoadData();
    if (canLoad)
        _manager.loadData();
    return canLoad;
}

void ManagerState::callSource(std::string_view name, const std::function<void()>& call) const
{
    const std::string error = errorThrownBy(call);
    if (!error.empty())
        core->platform().console.log(bundle->identifier().string() + ": error in " + std::string(name) + ": " + error);
}

void ManagerState::finishLoad(OBLoadResult result)
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
        _needsReload = _needsReload || result.outcome != OBLoadOutcome::loaded;
        const auto later = std::stable_partition(
            _waiters.begin(), _waiters.end(), [this](const Waiter& waiter) { return waiter.load <= _loadNumber; });
        answered.assign(std::make_move_iterator(_waiters.begin()), std::make_move_iterator(later));
        _waiters.erase(_waiters.begin(), later);
        listening = _observers;
    }
    if (wasActive)
        endWork();
    core->pathWatcher().resumeReports(&_manager);
    result.rootMediaGroup = root.load();
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
    // Also of a load that throws: what the first one sets up stands.
    const std::shared_ptr<void> wasFirst(nullptr, [this](void*) {
        std::lock_guard guard(_lock);
        _firstLoadData = false;
    });
    if (loadingOnThisThread == this)
        performLoad();
    else
        requestLoad(Job::performOnly);
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
    deliver(std::move(waiting), { OBLoadOutcome::ended });
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
