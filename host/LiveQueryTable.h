#pragma once

#include "host/OBLiveQuery.h"
#include "platform/ThreadSafety.h"
#include "platform/Value.h"

#include <atomic>
#include <cstddef>
#include <deque>
#include <memory>
#include <set>
#include <string>
#include <string_view>
#include <vector>

class FrameworkCore;
class OBMetadataQuery;

/// The files that match a query, kept as they come and go.
///
/// A change costs the paths that it concerns; only where it is not known any more what is below a folder is that
/// folder walked again. One thread at a time works through the changes, in their order.
class LiveQueryTable : public std::enable_shared_from_this<LiveQueryTable> {
public:
    /// Follows the query until the answer is destroyed. `core` outlives the answer.
    static std::shared_ptr<void> follow(FrameworkCore& core, const std::shared_ptr<const OBMetadataQuery>& query,
        const std::vector<std::string>& scope, platform::Date since, OBLiveQueryHandlers handlers);

    LiveQueryTable(FrameworkCore& core, std::shared_ptr<const OBMetadataQuery> query,
        const std::vector<std::string>& scope, OBLiveQueryHandlers handlers);

private:
    using Paths = std::set<std::string, std::less<>>;

    /// One folder of the scope, each with a result of its own: a file is answered once for each.
    struct Scope {
        std::string folder;
        Paths matching {};
        bool isGathered = false;
    };
    /// Something to look at: `anythingChanged` walks, everything else looks at what it names.
    struct Task {
        std::size_t scope;
        platform::PathChange change;
        bool gathers = false; ///< looks at everything for the first time
    };

    void watch(std::size_t scope, platform::Date since);
    void add(Task task);
    void work();
    bool takeFirst(Task& first);
    void perform(const Task& task);
    void lookAtFile(Scope& scope, const std::string& path);
    void lookAtFolder(Scope& scope, const std::string& path);
    void walk(Scope& scope, const std::string& path);
    static Paths matchingAtOrBelow(const Scope& scope, const std::string& path);
    void forget(Scope& scope, const std::string& path);
    void replace(Scope& scope, const Paths& before, const Paths& now);
    void tellGathered();

    FrameworkCore& _core;
    const std::shared_ptr<const OBMetadataQuery> _query;
    const OBLiveQueryHandlers _handlers;
    std::vector<Scope> _scopes; // the working thread's
    std::vector<std::shared_ptr<void>> _watches;
    std::atomic<bool> _takenBack { false };

    platform::Mutex _lock;
    std::deque<Task> _tasks GUARDED_BY(_lock);
    bool _works GUARDED_BY(_lock) = false;
};
