#pragma once

#include "host/DeliveryThreads.h"
#include "host/OBLog.h"
#include "host/OBMediaBrowserImageManager.h"
#include "host/OBPathWatcher.h"
#include "host/VolumeNotices.h"
#include "platform/Platform.h"
#include "platform/Snapshot.h"
#include "platform/ThreadSafety.h"

#include <chrono>
#include <condition_variable>
#include <cstddef>
#include <functional>
#include <memory>
#include <mutex>
#include <set>
#include <string>
#include <string_view>

class OBMediaManager;

/// What the parts of the framework share: the platform, the shared objects, the log, and the threads that are counted.
///
/// The application's `OBMediaHost` makes it; managers and threads keep it alive until they have ended.
class FrameworkCore : public std::enable_shared_from_this<FrameworkCore> {
public:
    FrameworkCore(const platform::Platform& platform, OBLogSink logSink);

    /// The core behind the framework's class operations; null while there is no host.
    static std::shared_ptr<FrameworkCore> current();
    static void setCurrent(std::shared_ptr<FrameworkCore> core);

    const platform::Platform& platform() const { return _platform; }
    OBPathWatcher& pathWatcher() { return _pathWatcher; }
    DeliveryThreads& deliveryThreads() { return _deliveryThreads; }

    /// Applications that follow changes come and go; the first of them starts it.
    void beginFollowing(const OBFollowOptions& options);
    void endFollowing();

    OBMediaBrowserImageManager& imageManager() { return _imageManager; }

    void log(std::string_view message, int level, const OBMediaManager* sender) const;
    /// Logs no more: the application that reads the log has gone.
    void stopLogging() { _logSink.store(nullptr); }
    /// Logs at level 2 what has not been logged before.
    void logOnce(const std::string& message, const OBMediaManager* sender);

    /// Runs `body` on a thread of the platform, counted until it returns.
    bool startThread(const std::string& name, std::function<void()> body);
    std::size_t threadCount() const;
    /// Waits until no counted thread runs; false when `limit` has passed before.
    bool waitForThreads(std::chrono::nanoseconds limit);

private:
    void threadEnded();

    const platform::Platform _platform;
    platform::Snapshot<std::shared_ptr<const OBLogSink>> _logSink;
    OBPathWatcher _pathWatcher { this };
    DeliveryThreads _deliveryThreads { *this };
    VolumeNotices _volumeNotices { *this };
    OBMediaBrowserImageManager _imageManager;

    platform::Mutex _followersLock;
    std::size_t _followers GUARDED_BY(_followersLock) = 0;

    platform::Mutex _loggedLock;
    std::set<std::string, std::less<>> _logged GUARDED_BY(_loggedLock);

    mutable std::mutex _threadsLock;
    std::condition_variable _threadsChanged;
    std::size_t _threads = 0; // under _threadsLock
};
