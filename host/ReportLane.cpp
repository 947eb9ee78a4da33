#include "host/ReportLane.h"

#include "host/FrameworkCore.h"
#include "host/OBPathWatcher.h"
#include "host/SourceCall.h"
#include "host/WorkCause.h"
#include "platform/Clock.h"
#include "platform/Console.h"
#include "platform/MainRunLoop.h"

#include <algorithm>
#include <utility>
#include <vector>

using platform::Locked;

namespace {

constexpr std::size_t mostWorkers = 2; // one at work, one that sleeps or waits
constexpr std::size_t mostPending = 256;

/// The lanes whose calls this thread makes, innermost last: a call may run a loop in which others are made.
thread_local std::vector<const ReportLane*> callingOnThisThread;

} // namespace

ReportLane::ReportLane(
    FrameworkCore& core, OBPathWatcherObserver& observer, std::string everything, std::string cause, Deliver deliver)
    : _core(core)
    , _observer(observer)
    , _keepsItselfAlive(observer.lifeDuringCalls() != nullptr)
    , _life(observer.lifeDuringCalls())
    , _everything(std::move(everything))
    , _cause(std::move(cause))
    , _deliver(std::move(deliver))
{
}

void ReportLane::add(const std::string& report)
{
    {
        Locked guard(_lock);
        const auto isEqual = [&](const Pending& other) { return other.report == report || other.standsForAll; };
        if (_closed || std::any_of(_pending.begin(), _pending.end(), isEqual))
            return;
        const platform::Date now = _core.platform().clock.now();
        if (_pending.size() == mostPending) {
            const platform::Date first = _pending.front().heardAt;
            _pending.clear();
            _pending.push_back({ _everything, first, true });
        } else {
            _pending.push_back({ report, now });
        }
    }
    start();
}

void ReportLane::resume()
{
    {
        Locked guard(_lock);
        ++_resumes;
    }
    start();
}

/// Gets another thread to deliver, where one is of use.
void ReportLane::start()
{
    {
        Locked guard(_lock);
        if (_closed || _pending.empty() || _workers == mostWorkers)
            return;
        ++_workers;
    }
    const auto job = [lane = shared_from_this()] { lane->work(); };
    if (_core.pathWatcher().callsOnMainThread())
        _core.platform().mainRunLoop.post(job);
    else
        _core.deliveryThreads().run(job);
}

void ReportLane::work()
{
    for (;;) {
        std::uint64_t resumes = 0;
        {
            Locked guard(_lock);
            resumes = _resumes;
        }
        const Delivery delivery = deliverOne();
        if (delivery == Delivery::done)
            continue;
        Locked guard(_lock);
        if (_closed || _pending.empty() || (delivery == Delivery::notNow && _resumes == resumes)) {
            --_workers;
            return;
        }
    }
}

ReportLane::Delivery ReportLane::deliverOne()
{
    const std::shared_ptr<void> life = _life.lock();
    {
        Locked guard(_lock);
        if (_keepsItselfAlive && !life)
            _pending.clear();
        if (_closed || _pending.empty())
            return Delivery::nothingToDo;
        ++_calls; // the observer stays valid from here on
    }
    bool delivered = false;
    const auto deliver = [&] { delivered = deliverFirst(); };
    bool accepted = true;
    if (_core.pathWatcher().callsOnMainThread())
        accepted = _observer.performAlone(deliver);
    else if (_observer.holdsReports())
        accepted = false;
    else
        deliver();
    {
        Locked guard(_lock);
        --_calls;
    }
    _callEnded.notifyAll();
    if (!accepted)
        return Delivery::notNow;
    return delivered ? Delivery::done : Delivery::nothingToDo;
}

bool ReportLane::deliverFirst()
{
    Pending first;
    if (!takeFirst(first))
        return false;
    const WorkCause cause({ _cause.empty() ? "changed: " + first.report : _cause, first.heardAt });
    callingOnThisThread.push_back(this);
    const std::string error = errorThrownBy([&] { _deliver(first.report); });
    callingOnThisThread.pop_back();
    if (!error.empty())
        _core.platform().console.log(first.report + ": error while this change was told: " + error);
    return true;
}

bool ReportLane::takeFirst(Pending& first)
{
    Locked guard(_lock);
    if (_closed || _pending.empty())
        return false;
    first = std::move(_pending.front());
    _pending.pop_front();
    return true;
}

bool ReportLane::isAtRest() const
{
    Locked guard(_lock);
    return _pending.empty() && _calls == 0;
}

void ReportLane::close()
{
    Locked guard(_lock);
    _closed = true;
    _pending.clear();
}

void ReportLane::waitForCalls()
{
    Locked guard(_lock);
    const auto own = static_cast<std::size_t>(std::count(callingOnThisThread.begin(), callingOnThisThread.end(), this));
    while (!_keepsItselfAlive && _calls > own)
        _callEnded.wait(_lock);
}
