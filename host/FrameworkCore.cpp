#include "host/FrameworkCore.h"

#include "host/OBLog.h"
#include "host/WorkCause.h"
#include "platform/Immortal.h"
#include "platform/Snapshot.h"
#include "platform/Threads.h"

#include <utility>

namespace {

using CurrentCore = platform::Snapshot<std::shared_ptr<FrameworkCore>>;

CurrentCore& currentCore()
{
    static platform::Immortal<CurrentCore> core;
    return *core;
}

} // namespace

FrameworkCore::FrameworkCore(const platform::Platform& platform, OBLogSink logSink)
    : _platform(platform)
    , _logSink(logSink ? std::make_shared<const OBLogSink>(std::move(logSink)) : nullptr)
{
}

std::shared_ptr<FrameworkCore> FrameworkCore::current()
{
    return currentCore().load();
}

void FrameworkCore::setCurrent(std::shared_ptr<FrameworkCore> core)
{
    currentCore().store(std::move(core));
}

void FrameworkCore::log(std::string_view message, int level, const OBMediaManager* sender) const
{
    if (const auto sink = _logSink.load())
        (*sink)(message, level, sender);
}

void FrameworkCore::logOnce(const std::string& message, const OBMediaManager* sender)
{
    {
        platform::Locked guard(_loggedLock);
        if (!_logged.insert(message).second)
            return;
    }
    log(message, 2, sender);
}

bool FrameworkCore::startThread(const std::string& name, std::function<void()> body)
{
    {
        std::lock_guard guard(_threadsLock);
        ++_threads;
    }
    const auto run = [core = shared_from_this(), cause = WorkCause::current(), work = std::move(body)]() mutable {
        {
            const WorkCause inherited(std::move(cause));
            work();
        }
        work = nullptr; // what the body held is released before the thread counts as ended
        core->threadEnded();
    };
    const bool started = _platform.threads.startDetached(name, run);
    if (!started)
        threadEnded();
    return started;
}

void FrameworkCore::beginFollowing(const OBFollowOptions& options)
{
    platform::Locked guard(_followersLock);
    if (_followers++ != 0)
        return;
    _deliveryThreads.setReused(true);
    _pathWatcher.follow(options);
    _volumeNotices.start();
}

void FrameworkCore::endFollowing()
{
    platform::Locked guard(_followersLock);
    if (--_followers != 0)
        return;
    _volumeNotices.stop();
    _pathWatcher.stopFollowing();
    _deliveryThreads.setReused(false);
}

void FrameworkCore::threadEnded()
{
    {
        std::lock_guard guard(_threadsLock);
        --_threads;
    }
    _threadsChanged.notify_all();
}

std::size_t FrameworkCore::threadCount() const
{
    std::lock_guard guard(_threadsLock);
    return _threads;
}

bool FrameworkCore::waitForThreads(std::chrono::nanoseconds limit)
{
    std::unique_lock guard(_threadsLock);
    return _threadsChanged.wait_for(guard, limit, [this] { return _threads == 0; });
}

void OBLog(std::string_view message, int level, const OBMediaManager* sender)
{
    if (const auto core = FrameworkCore::current())
        core->log(message, level, sender);
}
