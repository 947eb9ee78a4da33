#include "platform/linux/MountWatch.h"

#include "platform/linux/MountTable.h"
#include "platform/linux/SignalsHeld.h"

#include <array>
#include <system_error>
#include <utility>

#include <fcntl.h>
#include <poll.h>
#include <sys/eventfd.h>

namespace platform {

MountWatch::MountWatch(Descriptor table)
    : _table(std::move(table))
    , _ending(eventfd(0, EFD_CLOEXEC | EFD_NONBLOCK))
{
}

std::shared_ptr<MountWatch> MountWatch::open(const std::string& procFolder)
{
    Descriptor table = MountTable::open(procFolder);
    return table.isOpen() ? std::make_shared<MountWatch>(std::move(table)) : nullptr;
}

std::shared_ptr<void> MountWatch::add(const std::shared_ptr<MountWatch>& watch, const Changed& changed)
{
    const std::uint64_t number = watch->addTaker(changed);
    if (number == 0 || (number == 1 && !watch->startThread(watch)))
        return nullptr;
    return { watch.get(), [watch, number](void*) { watch->remove(number); } };
}

// 0 when the thread has ended.
std::uint64_t MountWatch::addTaker(const Changed& changed)
{
    Locked guard(_lock);
    if (_hasEnded)
        return 0;
    _takers.emplace(++_lastNumber, changed);
    return _lastNumber;
}

bool MountWatch::startThread(const std::shared_ptr<MountWatch>& self)
{
    const SignalsHeld inherited;
    try {
        std::thread([self] { self->run(); }).detach();
        return true;
    } catch (const std::system_error&) {
        Locked guard(_lock);
        _hasEnded = true;
        return false;
    }
}

void MountWatch::remove(std::uint64_t number)
{
    Locked guard(_lock);
    _takers.erase(number);
    if (_takers.empty()) {
        _hasEnded = true;
        const std::uint64_t one = 1;
        (void)uninterrupted([&] { return write(_ending.number(), &one, sizeof(one)); });
    }
    while (_called == number && _caller != std::this_thread::get_id())
        _takerHasReturned.wait(_lock);
}

void MountWatch::run()
{
    while (waitForChange())
        tellAll();
}

// False when the thread is to end.
bool MountWatch::waitForChange()
{
    // Mounts come in bursts, and each takes reading the whole table.
    constexpr int joinedMilliseconds = 50;
    std::array<pollfd, 2> sources { { { _ending.number(), POLLIN, 0 }, { _table.number(), POLLPRI, 0 } } };
    if (uninterrupted([&] { return poll(sources.data(), sources.size(), -1); }) < 0 || sources[0].revents != 0)
        return false;
    if (uninterrupted([&] { return poll(sources.data(), 1, joinedMilliseconds); }) != 0)
        return false;
    // What changed meanwhile is told by this call, too.
    (void)uninterrupted([&] { return poll(&sources[1], 1, 0); });
    return true;
}

void MountWatch::tellAll()
{
    std::uint64_t number = 0;
    for (Changed changed; beginCall(number, changed);) {
        changed();
        Locked guard(_lock);
        _called = 0;
        _takerHasReturned.notifyAll();
    }
}

// Takes the taker after `number`; false when there is none.
bool MountWatch::beginCall(std::uint64_t& number, Changed& changed)
{
    Locked guard(_lock);
    const auto next = _takers.upper_bound(number);
    if (next == _takers.end())
        return false;
    number = _called = next->first;
    _caller = std::this_thread::get_id();
    changed = next->second;
    return true;
}

} // namespace platform
