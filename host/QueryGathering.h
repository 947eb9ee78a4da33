#pragma once

#include "host/OBMetadataQuery.h"
#include "host/QueryExpression.h"

#include <cstddef>
#include <optional>
#include <string>
#include <vector>

/// One walk through a scope for the files that an expression matches.
class QueryGathering {
public:
    struct Callers {
        const std::function<void(std::string_view path)>& take;
        const std::function<bool()>& isCancelled;
        const OBGatherObserver& observer;
    };

    /// Everything that is handed over outlives this object.
    QueryGathering(const QueryExpression& expression, const platform::Platform& platform, std::string_view scope,
        const Callers& callers);

    /// False when it was cancelled.
    bool run();

private:
    /// A folder of which some items have had their turn.
    struct Level {
        platform::FolderListing listing;
        std::size_t next = 0;
        std::size_t pathLength = 0;
    };

    bool walk();
    void takeScope(const platform::ItemStatus& status);
    void takeFile();
    void enterFolder();
    bool leadsElsewhere(const platform::FolderListing& listing) const;
    void noteProblem(platform::FileProblem problem) const;
    bool isCancelled() const { return _callers.isCancelled && _callers.isCancelled(); }
    bool isScope() const { return _levels.empty(); }

    const QueryExpression& _expression;
    const platform::Platform& _platform;
    const Callers& _callers;
    const bool _readsFiles;
    std::string _path; // of what is at work
    const std::size_t _scopeLength;
    std::string _realScope {}; // where it is another than the scope
    platform::ListingRequest _request {};
    std::vector<Level> _levels {};
};
