#include "host/QueryFollowing.h"

#include "host/FrameworkCore.h"
#include "host/LiveQueryTable.h"
#include "host/OBMetadataQuery.h"
#include "platform/Notifications.h"
#include "platform/PathWatching.h"

#include <atomic>
#include <cstddef>

using platform::PathChange;

namespace {

/// Whether a change can have brought a file into the result or taken one out of it. Where it cannot be known any more
/// what was there, it can. Asks no disk: one that does not answer would keep the reports of all others waiting. So a
/// link that bears a movie's name counts as a movie.
bool mayChangeResult(const OBMetadataQuery& query, const PathChange& change)
{
    switch (change.kind) {
    case PathChange::Kind::appeared:
    case PathChange::Kind::found:
        return !change.isFolder && query.matchesByPath(change.path);
    case PathChange::Kind::disappeared:
        return change.isFolder ? change.heldMore : query.matchesByPath(change.path);
    case PathChange::Kind::contentChanged:
    case PathChange::Kind::arrivalEnded:
    case PathChange::Kind::attributesChanged:
        return false;
    default:
        return true;
    }
}

} // namespace

std::shared_ptr<void> followQuery(FrameworkCore& core, const std::shared_ptr<const OBMetadataQuery>& query,
    const std::vector<std::string>& scope, platform::Date since, const std::function<void(std::string_view name)>& tell)
{
    if (!query->asksOnlyForNamePathOrType()) {
        return LiveQueryTable::follow(core, query, scope, since,
            { .gathered = [tell] { tell(platform::metadataQueryFinishedGatheringNotification); },
                .came = [tell](std::string_view) { tell(platform::metadataQueryUpdatedNotification); },
                .went = [tell](std::string_view) { tell(platform::metadataQueryUpdatedNotification); } });
    }
    const auto finished = std::make_shared<std::atomic<std::size_t>>(scope.size());
    const auto stands = [finished, tell] {
        if (finished->fetch_sub(1) == 1)
            tell(platform::metadataQueryFinishedGatheringNotification);
    };
    if (scope.empty())
        tell(platform::metadataQueryFinishedGatheringNotification);
    const auto changed = [query, tell](const PathChange& change) {
        if (mayChangeResult(*query, change))
            tell(platform::metadataQueryUpdatedNotification);
    };
    const auto watches = std::make_shared<std::vector<std::shared_ptr<void>>>();
    for (const std::string& folder : scope)
        watches->push_back(core.platform().pathWatching.watch(folder, since, { changed, stands, nullptr }));
    return watches;
}
