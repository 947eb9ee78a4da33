#pragma once

#include "platform/PathWatching.h"
#include "platform/ThreadSafety.h"
#include "platform/linux/Descriptor.h"
#include "platform/linux/watching/PollingReport.h"
#include "platform/linux/watching/RootHistory.h"

#include <cstdint>
#include <memory>
#include <string>
#include <thread>
#include <unordered_set>
#include <vector>

namespace platform {

/// A watched path as it was asked for.
struct PathWatch {
    std::uint64_t number = 0;
    std::string path;
    Date since;
    PathWatchHandlers handlers;
};

/// A watch that a thread is to follow from now on.
struct AddedWatch {
    std::shared_ptr<const PathWatch> watch;
    RootHistory history {}; ///< with the threads that have followed it
};

/// What a watcher's thread has to do besides reading events.
struct WatchingTasks {
    std::vector<AddedWatch> added {};
    std::vector<std::uint64_t> removed {};
    std::vector<PollingReport> reports {};
    bool reportsWereLost = false; ///< of changes, which were too many
};

/// What others ask of a watcher's thread, and the gate through which that thread calls handlers. Any thread.
///
/// No lock is held while a handler runs, so that a handler may begin and end watches.
class WatchingQueue {
public:
    WatchingQueue();

    /// Readable while there are tasks.
    int descriptor() const noexcept { return _wake.number(); }

    /// False once the thread has ended.
    bool add(AddedWatch added);
    /// No handler of it is called from now on. Waits for one that is being called by another thread.
    void remove(std::uint64_t number);
    /// Lets the thread, which asks for it, have no part in the watch any more.
    void forget(std::uint64_t number);
    /// Has the thread see to its tasks, and to what is mounted.
    void noteMounts();
    void report(std::vector<PollingReport> reports);
    /// Ends the thread whatever is still watched. Waits for a handler that is being called by another thread.
    void end();

    WatchingTasks take();
    /// Whether nothing is watched any more; if so, nothing is accepted from now on.
    bool endIfUnused();
    /// Calls `handler`, which belongs to `watch`, unless that has been removed.
    template <class Handler> void call(const PathWatch& watch, const Handler& handler)
    {
        if (!beginCall(watch.number))
            return;
        handler();
        endCall();
    }

private:
    bool beginCall(std::uint64_t number);
    void endCall();
    void wake() REQUIRES(_lock);
    void waitForHandlerOf(std::uint64_t number) REQUIRES(_lock);

    const Descriptor _wake;
    Mutex _lock;
    Condition _handlerHasReturned;
    std::unordered_set<std::uint64_t> _watches GUARDED_BY(_lock);
    WatchingTasks _tasks GUARDED_BY(_lock);
    bool _hasEnded GUARDED_BY(_lock) = false;
    std::uint64_t _called GUARDED_BY(_lock) = 0; ///< the watch of which a handler runs, or 0
    std::thread::id _caller GUARDED_BY(_lock);
};

} // namespace platform
