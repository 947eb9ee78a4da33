#pragma once

#include "host/FrameworkCore.h"
#include "host/OBMediaManager.h"
#include "host/WorkGate.h"
#include "platform/Clock.h"
#include "platform/Snapshot.h"

#include <atomic>
#include <cstdint>
#include <memory>
#include <mutex>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

/// One application that listens to a manager.
struct ManagerObserver {
    OBExecutor executor;
    OBManagerCallbacks callbacks;
    std::atomic<bool> takenBack { false };
};

/// What the base class keeps for one manager: the installed tree, the loads that were asked for, who listens, and what
/// is at work.
///
/// Loads run one at a time on a thread that lives while there are loads to run. A request joins the load at work unless
/// that is being cancelled or is out of date already; then it gets the next one.
struct ManagerState {
    ManagerState(OBMediaManager& manager, const OBManagerContext& context);

    const std::shared_ptr<FrameworkCore> core;
    const std::shared_ptr<const OBBundle> bundle;

    platform::Snapshot<OBMediaGroupRef> root;
    platform::Snapshot<std::shared_ptr<OBScanObserver>> scanObserver;
    WorkGate gate;
    platform::WakeSignal ended; // raised when the manager ends

    /// How far the load is.
    struct Progress {
        std::atomic<bool> isLoading { false };
        std::atomic<std::uint64_t> foldersDone { 0 };
        std::atomic<std::uint64_t> itemsFound { 0 };
        std::atomic<std::uint64_t> itemsSkipped { 0 };
        platform::Snapshot<std::pair<platform::Text, std::chrono::nanoseconds>> pathAtWork;
        std::atomic<std::int64_t> lastTold { 0 }; // monotonic nanoseconds of the last report to observers

        void restart();
        OBLoadProgress now() const;
    };
    Progress progress;

    /// What a load job is to do.
    enum class Job {
        wholeLoad, // ask `canLoadData`, then `loadData`
        performOnly, // somebody called `loadData`; only its load is left to run
    };

    // Loading. Each of these takes the lock itself and calls nothing out while it holds it.
    void requestTree(const OBExecutor& executor, std::function<void(OBLoadResult)> completion);
    void requestLoad(Job job);
    void setNeedsReload(bool needed);
    void setAutoReload(bool enabled);
    void wasHandedOut();
    void end();
    bool firstLoadData() const;
    /// The base class's `loadData`.
    void loadDataCalled();
    /// The load thread: runs loads until none is asked for.
    void runLoads();

    std::shared_ptr<ManagerObserver> addObserver(OBExecutor executor, OBManagerCallbacks callbacks);
    void removeObserver(const std::shared_ptr<ManagerObserver>& observer);
    /// False for a tree that was installed before and has been replaced.
    bool publishRoot(const OBMediaGroupRef& group);

    // Reloads, and calls of the path watcher.
    void performReload(std::string_view part, const std::function<void()>& reload);
    bool performAlone(const std::function<void()>& call);
    bool holdsReports() const;
    bool isAtRest() const;
    /// Makes a call of the source; where that throws, one line on the console names the source and `name`.
    void callSource(std::string_view name, const std::function<void()>& call) const;
    /// Counts something of the source that is under way, until the answer is dropped.
    std::shared_ptr<void> countUnderWay();
    /// Notes what is being read from now on, and tells observers how far the load is, not too often.
    void beginPath(const platform::Text& path);

    void addNotification(platform::NotificationCenter& center, platform::NotificationCenter::Token token);
    void noteProblem(std::string_view path, platform::FileProblem problem);
    std::vector<OBLoadProblem> problems() const;

    std::atomic<double> loadThreadPriority { 0.5 };

private:
    struct Waiter {
        std::uint64_t load; // the number of the load whose end it waits for
        OBExecutor executor;
        std::function<void(OBLoadResult)> completion;
    };
    using Observers = std::vector<std::shared_ptr<ManagerObserver>>;

    void setWish(bool& wish, bool value); // a field that `wantsLoadByItself` asks
    bool wantsLoadByItself() const; // under _lock
    bool queueLoad(Job job); // under _lock; whether a thread is to be started
    void startLoadThread();
    OBLoadResult runLoad(Job job);
    bool callLoad(Job job);
    bool beginLoad(Job& job);
    void finishLoad(OBLoadResult result);
    void performLoad();
    void runReload(std::string_view part, const std::function<void()>& reload);
    class WorkEnd;
    void endWork();
    platform::Date changeTime() const;
    Observers observers() const;
    static void deliver(std::vector<Waiter> waiters, const OBLoadResult& result);

    OBMediaManager& _manager;
    const std::shared_ptr<std::atomic<std::size_t>> _underWay = std::make_shared<std::atomic<std::size_t>>(0);

    mutable std::mutex _lock; // guards what follows
    bool _ended = false;
    bool _handedOut = false;
    bool _needsReload = false;
    bool _autoReload = false;
    bool _firstLoadData = true;
    bool _threadRuns = false;
    bool _loadActive = false;
    bool _loadQueued = false;
    Job _queuedJob = Job::performOnly;
    std::uint64_t _loadNumber = 0; // of the load that began last
    std::vector<Waiter> _waiters;
    Observers _observers;
    std::vector<std::pair<platform::NotificationCenter*, platform::NotificationCenter::Token>> _notifications;
    std::vector<OBLoadProblem> _problems;
    std::vector<std::weak_ptr<OBMediaGroup>> _formerRoots; // those that somebody still holds
    std::vector<std::function<void()>> _postponed; // for the main thread, once nothing is at work
};
