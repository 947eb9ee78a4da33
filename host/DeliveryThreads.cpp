#include "host/DeliveryThreads.h"

#include "host/FrameworkCore.h"

#include <chrono>
#include <utility>

using platform::Locked;

namespace {

constexpr std::chrono::seconds idleTime { 1 };

} // namespace

void DeliveryThreads::run(std::function<void()> job)
{
    Idle waiting;
    {
        Locked guard(_lock);
        _jobs.push_back(std::move(job));
        if (!_idle.empty()) {
            waiting = std::move(_idle.back());
            _idle.pop_back();
        }
    }
    if (waiting)
        waiting->raise();
    else if (!_core.startThread("ob-watch", [this] { work(); }))
        _core.logOnce("changes are told late: the system gives no thread", nullptr);
}

void DeliveryThreads::setReused(bool reused)
{
    std::vector<Idle> waiting;
    {
        Locked guard(_lock);
        _reused = reused;
        if (!reused)
            waiting = std::exchange(_idle, {});
    }
    for (const Idle& idle : waiting)
        idle->raise();
}

void DeliveryThreads::work()
{
    while (const std::function<void()> job = nextJob())
        job();
}

/// The job that has waited longest, after a while if need be; null when the thread is to end.
std::function<void()> DeliveryThreads::nextJob()
{
    const auto mine = std::make_shared<platform::WakeSignal>();
    {
        Locked guard(_lock);
        if (std::function<void()> job = firstJob(); job || !_reused)
            return job;
        _idle.push_back(mine);
    }
    _core.platform().clock.sleep(idleTime, *mine);
    Locked guard(_lock);
    std::erase(_idle, mine);
    return firstJob();
}

std::function<void()> DeliveryThreads::firstJob()
{
    if (_jobs.empty())
        return nullptr;
    std::function<void()> job = std::move(_jobs.front());
    _jobs.pop_front();
    return job;
}
