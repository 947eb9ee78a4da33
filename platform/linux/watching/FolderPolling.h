#pragma once

#include "platform/Clock.h"
#include "platform/ThreadSafety.h"
#include "platform/linux/watching/PolledFolders.h"
#include "platform/linux/watching/WatchingCounts.h"

#include <chrono>
#include <cstdint>
#include <functional>
#include <map>
#include <memory>
#include <string>
#include <vector>

namespace platform {

class FileSystem;
class Threads;

/// Looks in intervals at the change times of folders, and at where paths lead. Each device has a thread of its own: one
/// that does not answer keeps no other from being looked at. There is no thread for a device on which nothing is
/// polled. One thread at a time may ask.
class FolderPolling {
public:
    struct Parts {
        const FileSystem& files;
        const Clock& clock;
        Threads& threads;
        std::shared_ptr<WatchingCounts> counts;
        std::chrono::nanoseconds interval;
        /// Takes what was found, on the threads of the devices, no lock held.
        std::function<void(std::vector<PollingReport>)> report;
    };

    explicit FolderPolling(Parts parts);
    /// Ends the threads, and waits for none.
    ~FolderPolling();
    FolderPolling(const FolderPolling&) = delete;
    FolderPolling& operator=(const FolderPolling&) = delete;

    /// Begins with a look, and reports that it has been made.
    void add(const std::string& device, PolledArea area);
    void removeBelow(const std::string& path);
    /// Reports where `path` leads, now and whenever that has changed.
    void addPath(const std::string& device, std::uint64_t watch, const std::string& path);
    void removePath(std::uint64_t watch);

    /// Whether nothing has been added that was not removed by the same path.
    bool isIdle() const { return _areas.empty(); }

private:
    class Device;

    Device& deviceNamed(const std::string& name);

    const Parts _parts;
    std::map<std::string, std::shared_ptr<Device>> _devices {};
    std::map<std::string, std::string> _areas {}; ///< their devices by their paths
    std::map<std::uint64_t, std::string> _paths {}; ///< likewise, by the watch
};

} // namespace platform
