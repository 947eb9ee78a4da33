#pragma once

#include "platform/linux/watching/FolderFollowing.h"
#include "platform/linux/watching/PollingReport.h"
#include "platform/linux/watching/WatchingContext.h"

#include <cstdint>
#include <memory>
#include <optional>
#include <set>
#include <string>
#include <vector>

namespace platform {

/// Finds out where watched paths lead, and follows what they lead to, as far as that is this thread's. The watcher's
/// thread.
class RootPlacing {
public:
    RootPlacing(WatchingContext& context, FolderFollowing& following)
        : _context(context)
        , _following(following)
    {
    }

    void begin(AddedWatch added);
    void end(std::uint64_t watch);
    /// Follows the paths again on whose way something has changed.
    void followNoted();
    /// Follows all paths again, looks through what they lead to, and says that nothing of it is known any more.
    void followAllAnew();
    void take(const PollingReport& report);
    /// Says what is mounted now, and looks through what was mounted or unmounted, at `points`.
    void takeMounts(PolledMounts mounts, const std::vector<std::string>& points);

private:
    void follow(WatchedRoot& root);
    WatchedPlace placeOf(const WatchedRoot& root) const;
    std::optional<std::string> otherThread(const WatchedPlace& place) const;
    std::set<std::string> devicesBefore(const WatchedPlace& place, const std::string& device) const;
    void handOver(WatchedRoot& root, const WatchedPlace& place, const std::string& device);
    bool watchWay(WatchedRoot& root, WatchedPlace& place);
    bool watchSteps(WatchedRoot& root, const WatchedPlace& place);
    void settleSteps(const std::vector<WatchedFolders::Number>& folders);
    void pollWay(WatchedRoot& root, const WatchedPlace& place);
    void arrive(WatchedRoot& root, WatchedPlace place);
    FolderFollowing::Look lookThroughPlace(WatchedRoot& root, Date since);
    void lead(WatchedRoot& root, WatchedFolders::Number folder);

    WatchingContext& _context;
    FolderFollowing& _following;
};

} // namespace platform
