#include "platform/linux/watching/DeviceWatchers.h"

#include "platform/Threads.h"
#include "platform/linux/SignalsHeld.h"
#include "platform/linux/watching/PathWatcher.h"

#include <utility>

namespace platform {

DeviceWatchers::DeviceWatchers(WatcherRoles roles, std::shared_ptr<WatchingCounts> counts)
    : _roles(std::move(roles))
    , _counts(std::move(counts))
    , _mountsSeen(_roles.volumes)
{
}

void DeviceWatchers::add(const std::shared_ptr<const PathWatch>& watch)
{
    Locked guard(_lock);
    giveTo(first, { watch, {} });
}

void DeviceWatchers::remove(std::uint64_t number)
{
    Queue queue;
    {
        Locked guard(_lock);
        if (auto removed = _queueOfWatch.extract(number))
            queue = std::move(removed.mapped());
    }
    // The handler that it waits for may begin or end another watch.
    if (queue)
        queue->remove(number);
}

void DeviceWatchers::handOver(
    const std::shared_ptr<const PathWatch>& watch, const std::string& device, RootHistory history)
{
    Locked guard(_lock);
    const auto known = _queueOfWatch.find(watch->number);
    if (known == _queueOfWatch.end() || _hasEnded)
        return;
    known->second->forget(watch->number);
    giveTo(device, { watch, std::move(history) });
}

void DeviceWatchers::end()
{
    std::map<std::string, Queue> queues;
    {
        Locked guard(_lock);
        _hasEnded = true;
        queues = _queues;
    }
    for (const auto& [device, queue] : queues)
        queue->end();
}

void DeviceWatchers::giveTo(const std::string& device, const AddedWatch& added)
{
    Queue& queue = _queues[device];
    if (!queue || !queue->add(added)) {
        queue = std::make_shared<WatchingQueue>();
        queue->add(added);
        if (!startThread(device, queue))
            queue->end();
    }
    _queueOfWatch[added.watch->number] = queue;
}

bool DeviceWatchers::startThread(const std::string& device, const Queue& queue)
{
    _counts->threads.add();
    const SignalsHeld inherited;
    const bool isStarted = _roles.threads.startDetached("watching", [all = shared_from_this(), device, queue] {
        PathWatcher(*all, device, queue).run();
        all->threadEnds(device, queue);
    });
    if (!isStarted)
        _counts->threads.remove();
    return isStarted;
}

void DeviceWatchers::threadEnds(const std::string& device, const Queue& queue)
{
    {
        Locked guard(_lock);
        // Another one may have begun since.
        if (const auto known = _queues.find(device); known != _queues.end() && known->second == queue)
            _queues.erase(known);
    }
    // What the roles belong to may go from here on.
    _counts->threads.remove();
}

} // namespace platform
