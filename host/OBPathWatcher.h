#pragma once

#include "host/OBExport.h"
#include "platform/ThreadSafety.h"
#include "platform/Value.h"

#include <atomic>
#include <cstdint>
#include <functional>
#include <map>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <unordered_set>
#include <vector>

class FrameworkCore;
class OBMetadataQuery;
class ReportLane;

class PathsToStand;

namespace platform {
struct Notification;
struct WatchingProblem;
}

/// Hears of changes. The calls may come on any thread, two at once for each path and query.
class OB_EXPORT OBPathWatcherObserver {
public:
    virtual ~OBPathWatcherObserver();
    /// Something at or below a watched path changed. `path` is spelled as it was watched. `flags` are 0: what happened
    /// there is not told.
    virtual void watchedPathChanged_fileChangedEventFlags(std::string_view path, std::uint64_t flags);
    /// The result of a query changed, or it finished gathering: the notification's name tells which.
    virtual void watchedQueryChanged_queryScope(
        const platform::Notification& notification, const std::vector<std::string>& scope);

    // What the watcher asks of an observer; most have no need to answer.

    /// What keeps this object alive during a call. Null for an object that takes itself back before it ends.
    virtual std::shared_ptr<void> lifeDuringCalls();
    /// Whether reports have to wait, until `resumeReports`.
    virtual bool holdsReports() const;
    /// Makes a call on the main thread while nothing else of this object is at work; false, with nothing called, when
    /// something is: then not before `resumeReports`.
    virtual bool performAlone(const std::function<void()>& call);
    /// Since when changes matter to what is registered now; absent for now.
    virtual std::optional<platform::Date> changesMatterSince() const;
};

/// How an application wants to follow changes.
struct OBFollowOptions {
    /// Observers are called on the main thread, and then none while a load or reload of theirs is at work elsewhere,
    /// which in turn waits for the call. Otherwise they are called on threads of the framework, free to sleep.
    bool callsOnMainThread = false;
    // Told on threads that must not be kept.
    /// All paths registered so far are followed, after some were not. Not told of queries.
    std::function<void()> stands {};
    /// Why some folders are only looked at now and then.
    std::function<void(const platform::WatchingProblem&)> failed {};
};

/// The framework's one watcher of paths and metadata queries. Any thread.
///
/// Registering lists what is to be watched. Nothing is watched or gathered until an application follows changes
/// (`OBMediaHost::followChanges`).
class OB_EXPORT OBPathWatcher {
public:
    struct Query {
        std::string text;
        std::vector<std::string> scope;
        int runMode = 0;
    };

    OBPathWatcher();
    /// For the framework.
    explicit OBPathWatcher(FrameworkCore* core);
    ~OBPathWatcher();
    OBPathWatcher(const OBPathWatcher&) = delete;
    OBPathWatcher& operator=(const OBPathWatcher&) = delete;

    /// The watcher of the host; null while there is no host.
    static std::shared_ptr<OBPathWatcher> sharedPathWatcher();

    /// Whether `observer` does not watch exactly this path yet.
    bool watchPathIsUnique_observer(std::string_view path, const OBPathWatcherObserver* observer) const;
    /// Starts watching a file or folder, which need not exist. Watching it again changes nothing.
    void watchPath_observer(std::string_view path, OBPathWatcherObserver* observer);
    /// Starts a live metadata query over `scope`, taken as it stands now. The same observer registering the same text
    /// replaces its registration. A text that is no query is logged once and finds nothing.
    void watchQuery_observer_queryScope_queryRunMode(
        std::string_view query, OBPathWatcherObserver* observer, std::vector<std::string> scope, int runMode);

    /// Takes back everything that `observer` registered. No call begins any more, and calls under way on other threads
    /// have returned, unless the observer keeps itself alive during calls.
    void removeObserver(const OBPathWatcherObserver* observer);
    /// What made `observer` hold reports or refuse calls may have ended.
    void resumeReports(const OBPathWatcherObserver* observer);

    /// Whether no report waits for `observer`, and none is being told to it.
    bool isAtRest(const OBPathWatcherObserver* observer) const;

    /// What `observer` watches, in the order of registration.
    std::vector<std::string> pathsWatchedBy(const OBPathWatcherObserver* observer) const;
    std::vector<Query> queriesWatchedBy(const OBPathWatcherObserver* observer) const;

    /// For the framework: watches what is registered from now on, and ends that.
    void follow(const OBFollowOptions& options);
    void stopFollowing();
    bool callsOnMainThread() const { return _callsOnMainThread; }

    /// Whether each path that is to be followed is by now.
    bool pathsStand() const;

private:
    struct WatchedPath {
        std::string path;
        platform::Date since;
        std::shared_ptr<ReportLane> lane {};
        std::shared_ptr<void> watch {}; // taken back before the lane
    };
    struct WatchedQuery {
        Query query;
        platform::Date since;
        std::shared_ptr<ReportLane> lane {};
        std::shared_ptr<void> watch {};
    };
    struct Registrations {
        OBPathWatcherObserver* observer = nullptr;
        std::vector<WatchedPath> paths {};
        std::unordered_set<std::string> namesOfPaths {}; ///< the same, for one that is asked about
        std::vector<WatchedQuery> queries {};
    };
    using AllRegistrations = std::map<const OBPathWatcherObserver*, Registrations>;

    std::vector<std::shared_ptr<ReportLane>> lanesOf(const OBPathWatcherObserver* observer) const;
    Registrations& registrationsOf(OBPathWatcherObserver* observer) REQUIRES(_lock);
    void startPath(WatchedPath& path, OBPathWatcherObserver& observer) REQUIRES(_lock);
    std::string startQuery(WatchedQuery& query, OBPathWatcherObserver& observer) REQUIRES(_lock);
    platform::Date changesMatterSince(const OBPathWatcherObserver& observer) const;
    static std::vector<std::shared_ptr<ReportLane>> lanesIn(const Registrations& registrations);
    static void closeLanes(const Registrations& registrations);
    static void stop(Registrations& registrations);

    FrameworkCore* const _core;
    std::atomic<bool> _callsOnMainThread { false };
    mutable platform::Mutex _lock; // never taken while a report is told or delivered
    bool _follows GUARDED_BY(_lock) = false;
    OBFollowOptions _options GUARDED_BY(_lock);
    std::shared_ptr<PathsToStand> _toStand GUARDED_BY(_lock);
    AllRegistrations _registrations GUARDED_BY(_lock);
};
