#pragma once

#include "host/OBExport.h"
#include "platform/ThreadSafety.h"

#include <cstdint>
#include <map>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

namespace platform {
struct Notification;
}

/// Hears of changes. The calls may come on any thread.
class OB_EXPORT OBPathWatcherObserver {
public:
    virtual ~OBPathWatcherObserver();
    /// Something at or below a watched path changed. `path` is spelled as it was watched.
    virtual void watchedPathChanged_fileChangedEventFlags(std::string_view path, std::uint64_t flags);
    /// The result of a query changed, or it finished gathering: the notification's name tells which.
    virtual void watchedQueryChanged_queryScope(
        const platform::Notification& notification, const std::vector<std::string>& scope);
};

/// The framework's one watcher of paths and metadata queries. Any thread.
///
/// Registering lists what is to be watched; it costs the same whether or not an application follows changes.
class OB_EXPORT OBPathWatcher {
public:
    struct Query {
        std::string text;
        std::vector<std::string> scope;
        int runMode = 0;
    };

    /// The watcher of the host; null while there is no host.
    static std::shared_ptr<OBPathWatcher> sharedPathWatcher();

    /// Whether `observer` does not watch exactly this path yet.
    bool watchPathIsUnique_observer(std::string_view path, const OBPathWatcherObserver* observer) const;
    /// Starts watching a file or folder, which need not exist. Watching it again changes nothing.
    void watchPath_observer(std::string_view path, OBPathWatcherObserver* observer);
    /// Starts a live metadata query over `scope`, taken as it stands now. The same observer registering the same text
    /// replaces its registration.
    void watchQuery_observer_queryScope_queryRunMode(
        std::string_view query, OBPathWatcherObserver* observer, std::vector<std::string> scope, int runMode);

    /// Takes back everything that `observer` registered.
    void removeObserver(const OBPathWatcherObserver* observer);

    /// What `observer` watches, in the order of registration.
    std::vector<std::string> pathsWatchedBy(const OBPathWatcherObserver* observer) const;
    std::vector<Query> queriesWatchedBy(const OBPathWatcherObserver* observer) const;

private:
    struct Registrations {
        std::vector<std::string> paths;
        std::vector<Query> queries;
    };

    mutable platform::Mutex _lock;
    std::map<const OBPathWatcherObserver*, Registrations> _registrations GUARDED_BY(_lock);
};
