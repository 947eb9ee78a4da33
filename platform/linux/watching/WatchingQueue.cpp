#include "platform/linux/watching/WatchingQueue.h"

#include <utility>

#include <sys/eventfd.h>

namespace platform {

WatchingQueue::WatchingQueue()
    : _wake(eventfd(0, EFD_CLOEXEC | EFD_NONBLOCK))
{
}

bool WatchingQueue::add(AddedWatch added)
{
    Locked guard(_lock);
    if (_hasEnded)
        return false;
    _watches.insert(added.watch->number);
    _tasks.added.push_back(std::move(added));
    wake();
    return true;
}

void WatchingQueue::remove(std::uint64_t number)
{
    Locked guard(_lock);
    _watches.erase(number);
    _tasks.removed.push_back(number);
    wake();
    waitForHandlerOf(number);
}

void WatchingQueue::forget(std::uint64_t number)
{
    Locked guard(_lock);
    _watches.erase(number);
}

void WatchingQueue::waitForHandlerOf(std::uint64_t number)
{
    while (_called == number && _caller != std::this_thread::get_id())
        _handlerHasReturned.wait(_lock);
}

void WatchingQueue::noteMounts()
{
    Locked guard(_lock);
    wake();
}

void WatchingQueue::report(std::vector<PollingReport> reports)
{
    Locked guard(_lock);
    if (_hasEnded)
        return;
    // A thread that hangs at one disk must not have the others' reports pile up.
    constexpr std::size_t changesAtMost = 10'000;
    for (PollingReport& each : reports) {
        if (each.change && _tasks.reports.size() >= changesAtMost)
            _tasks.reportsWereLost = true;
        else
            _tasks.reports.push_back(std::move(each));
    }
    wake();
}

void WatchingQueue::end()
{
    Locked guard(_lock);
    _watches.clear();
    _hasEnded = true;
    wake();
    if (_called != 0)
        waitForHandlerOf(_called);
}

WatchingTasks WatchingQueue::take()
{
    Locked guard(_lock);
    std::uint64_t count = 0;
    (void)uninterrupted([&] { return read(_wake.number(), &count, sizeof(count)); });
    return std::exchange(_tasks, {});
}

bool WatchingQueue::endIfUnused()
{
    Locked guard(_lock);
    _hasEnded = _hasEnded || _watches.empty();
    return _hasEnded;
}

void WatchingQueue::wake()
{
    const std::uint64_t one = 1;
    (void)uninterrupted([&] { return write(_wake.number(), &one, sizeof(one)); });
}

bool WatchingQueue::beginCall(std::uint64_t number)
{
    Locked guard(_lock);
    if (_watches.find(number) == _watches.end())
        return false;
    _called = number;
    _caller = std::this_thread::get_id();
    return true;
}

void WatchingQueue::endCall()
{
    Locked guard(_lock);
    _called = 0;
    _handlerHasReturned.notifyAll();
}

} // namespace platform
