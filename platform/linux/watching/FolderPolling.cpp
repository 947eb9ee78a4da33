#include "platform/linux/watching/FolderPolling.h"

#include "platform/Threads.h"
#include "platform/linux/SignalsHeld.h"
#include "platform/linux/watching/PathRange.h"

#include <atomic>
#include <utility>

namespace platform {

/// What is polled on one device. Its thread alone touches the folders; others leave orders.
class FolderPolling::Device : public std::enable_shared_from_this<FolderPolling::Device> {
public:
    using Order = std::function<void(PolledFolders&)>;

    explicit Device(Parts parts)
        : _parts(std::move(parts))
        , _folders(_parts.files, [this] { return _isEnded.load(); })
    {
    }

    void order(Order order) EXCLUDES(_lock);
    void end() EXCLUDES(_lock)
    {
        Locked guard(_lock);
        _isEnded = true;
        _wake->raise();
    }

private:
    void startThread() REQUIRES(_lock);
    void run();
    void work();
    std::shared_ptr<WakeSignal> nextWake();
    void tellReports();
    void countFolders(std::uint64_t count);

    const Parts _parts;
    std::atomic<bool> _isEnded { false };
    PolledFolders _folders; ///< the device's thread only
    std::uint64_t _folderCount = 0; ///< likewise: as it was added to the sum
    std::chrono::nanoseconds _nextRound {}; ///< likewise
    Mutex _lock;
    std::vector<Order> _orders GUARDED_BY(_lock) {};
    std::shared_ptr<WakeSignal> _wake GUARDED_BY(_lock) = std::make_shared<WakeSignal>();
    bool _hasThread GUARDED_BY(_lock) = false;
};

void FolderPolling::Device::order(Order order)
{
    Locked guard(_lock);
    _orders.push_back(std::move(order));
    _wake->raise();
    if (!_hasThread)
        startThread();
}

// Where the system gives no thread, the next order tries again.
void FolderPolling::Device::startThread()
{
    _parts.counts->threads.add();
    const SignalsHeld inherited;
    _hasThread = _parts.threads.startDetached("polling", [device = shared_from_this()] { device->run(); });
    if (!_hasThread)
        _parts.counts->threads.remove();
}

void FolderPolling::Device::run()
{
    const std::shared_ptr<WatchingCounts> counts = _parts.counts;
    _nextRound = _parts.clock.monotonic() + _parts.interval;
    while (const std::shared_ptr<WakeSignal> wake = nextWake()) {
        if (!wake->isRaised())
            _parts.clock.sleep(_nextRound - _parts.clock.monotonic(), *wake);
        work();
    }
    countFolders(0);
    counts->threads.remove();
}

// Null when there is nothing more to do, and the thread has to end.
std::shared_ptr<WakeSignal> FolderPolling::Device::nextWake()
{
    Locked guard(_lock);
    if (_isEnded || (_orders.empty() && _folders.isEmpty())) {
        _hasThread = false;
        return nullptr;
    }
    if (_orders.empty())
        _wake = std::make_shared<WakeSignal>();
    return _wake;
}

void FolderPolling::Device::work()
{
    std::vector<Order> orders;
    {
        Locked guard(_lock);
        orders.swap(_orders);
    }
    for (const Order& each : orders) {
        if (!_isEnded)
            each(_folders);
        tellReports();
    }
    if (_parts.clock.monotonic() >= _nextRound) {
        _folders.lookAtAll();
        _nextRound = _parts.clock.monotonic() + _parts.interval;
        tellReports();
    }
}

void FolderPolling::Device::countFolders(std::uint64_t count)
{
    _parts.counts->polledFolders += count - _folderCount;
    _folderCount = count;
}

void FolderPolling::Device::tellReports()
{
    countFolders(_folders.folderCount());
    std::vector<PollingReport> reports = _folders.takeReports();
    if (!reports.empty() && !_isEnded)
        _parts.report(std::move(reports));
}

FolderPolling::FolderPolling(Parts parts)
    : _parts(std::move(parts))
{
}

FolderPolling::~FolderPolling()
{
    for (const auto& [name, device] : _devices)
        device->end();
}

FolderPolling::Device& FolderPolling::deviceNamed(const std::string& name)
{
    std::shared_ptr<Device>& device = _devices[name];
    if (!device)
        device = std::make_shared<Device>(_parts);
    return *device;
}

void FolderPolling::add(const std::string& device, PolledArea area)
{
    removeBelow(area.path);
    _areas[area.path] = device;
    deviceNamed(device).order([area = std::move(area)](PolledFolders& folders) { folders.add(area); });
}

void FolderPolling::removeBelow(const std::string& path)
{
    eraseSameOrBelow(_areas, path, [this](const auto& area) {
        deviceNamed(area.second).order([gone = area.first](PolledFolders& folders) { folders.removeBelow(gone); });
    });
}

void FolderPolling::addPath(const std::string& device, std::uint64_t watch, const std::string& path)
{
    removePath(watch);
    _paths[watch] = device;
    deviceNamed(device).order([watch, path](PolledFolders& folders) { folders.addPath(watch, path); });
}

void FolderPolling::removePath(std::uint64_t watch)
{
    const auto found = _paths.find(watch);
    if (found == _paths.end())
        return;
    deviceNamed(found->second).order([watch](PolledFolders& folders) { folders.removePath(watch); });
    _paths.erase(found);
}

} // namespace platform
