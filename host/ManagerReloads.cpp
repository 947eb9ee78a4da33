// Reloads of one manager, and the calls that the path watcher makes to it.
//
// The one surprise: the main thread never waits for work on another thread, which may be waiting for the main thread.
// So there a reload, and a call of the watcher, runs alone: at once when nothing is at work, else once nothing is.

#include "host/CurrentWork.h"
#include "host/ManagerState.h"
#include "platform/MainRunLoop.h"
#include "platform/PathWatching.h"

#include <utility>

namespace {

/// The manager that this thread, the main thread, works for alone.
thread_local const ManagerState* aloneOnThisThread = nullptr;

/// Marks this thread as working for a manager alone.
class Alone {
public:
    explicit Alone(const ManagerState& manager)
        : _outer(std::exchange(aloneOnThisThread, &manager))
    {
    }
    ~Alone() { aloneOnThisThread = _outer; }
    Alone(const Alone&) = delete;
    Alone& operator=(const Alone&) = delete;

private:
    const ManagerState* const _outer;
};

} // namespace

/// Ends a piece of work, also one that ends by an error which its caller survives.
class ManagerState::WorkEnd {
public:
    explicit WorkEnd(ManagerState& manager)
        : _manager(manager)
    {
    }
    ~WorkEnd() { _manager.endWork(); }
    WorkEnd(const WorkEnd&) = delete;
    WorkEnd& operator=(const WorkEnd&) = delete;

private:
    ManagerState& _manager;
};

platform::Date ManagerState::changeTime() const
{
    return core->platform().pathWatching.timeOfChangesNow();
}

void ManagerState::performReload(std::string_view part, const std::function<void()>& reload)
{
    if (aloneOnThisThread == this) {
        runReload(part, reload);
    } else if (!core->platform().mainRunLoop.isMainThread()) {
        if (!gate.begin(changeTime()))
            return;
        const WorkEnd end(*this);
        runReload(part, reload);
    } else if (!performAlone([&] { runReload(part, reload); })) {
        const auto again = [this, manager = _manager.shared_from_this(), cause = WorkCause::current(),
                               name = std::string(part), reload] {
            const WorkCause kept(cause);
            callSource("reload", [&] { performReload(name, reload); });
        };
        {
            std::lock_guard guard(_lock);
            if (_ended)
                return;
            _postponed.push_back(again);
        }
        // What was at work may have ended before the reload stood in the queue.
        if (gate.beginAlone(changeTime()))
            endWork();
    }
}

bool ManagerState::performAlone(const std::function<void()>& call)
{
    if (!gate.beginAlone(changeTime()))
        return false;
    const WorkEnd end(*this);
    const Alone alone(*this);
    call();
    return true;
}

void ManagerState::runReload(std::string_view part, const std::function<void()>& reload)
{
    const CurrentWork work(core->platform(), part);
    reload();
}

/// What had to wait for the end of all work goes on.
void ManagerState::endWork()
{
    if (!gate.end())
        return;
    std::vector<std::function<void()>> postponed;
    {
        std::lock_guard guard(_lock);
        postponed = std::exchange(_postponed, {});
    }
    for (std::function<void()>& call : postponed)
        core->platform().mainRunLoop.post(std::move(call));
    core->pathWatcher().resumeReports(&_manager);
}

/// While a load runs, what changes is told once its tree is installed; while a cancel is pending, once that has ended.
bool ManagerState::holdsReports() const
{
    std::lock_guard guard(_lock);
    return _loadActive || gate.isCancelPending();
}

bool ManagerState::isAtRest() const
{
    {
        std::lock_guard guard(_lock);
        if (_threadRuns || _loadQueued || !_postponed.empty())
            return false;
    }
    return *_underWay == 0 && gate.isIdle() && core->pathWatcher().isAtRest(&_manager);
}

std::shared_ptr<void> ManagerState::countUnderWay()
{
    ++*_underWay;
    return { nullptr, [count = _underWay](void*) { --*count; } };
}
