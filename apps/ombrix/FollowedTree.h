#pragma once

#include "apps/common/LoadWatch.h"
#include "host/OBMediaHost.h"
#include "host/OBMediaManager.h"
#include "platform/Platform.h"

#include <chrono>
#include <cstdint>
#include <functional>
#include <memory>
#include <optional>

namespace ombrix {

/// A tree that is loaded and followed on the main loop, until nothing more is heard of.
///
/// The thread that makes it runs the main loop afterwards, and every call comes there.
class FollowedTree : public std::enable_shared_from_this<FollowedTree> {
public:
    FollowedTree(OBMediaHost& host, std::shared_ptr<OBMediaManager> manager);

    /// Follows changes and loads; `loaded` is called once with how that ended.
    void start(std::function<void(const OBLoadResult&)> loaded);
    /// Calls `settled` once nothing is at work and nothing has been heard for a short time; with false where that has
    /// not come to be within a minute.
    void settle(std::function<void(bool isQuiet)> settled);

    /// How many trees have been published.
    std::uint64_t publications() const { return _publications; }
    /// Whether the newest events came first when the events were scanned last; absent where the source has no order.
    std::optional<bool> scannedNewestFirst() const { return _scannedNewestFirst; }
    OBMediaManager& manager() const { return *_manager; }

private:
    void note(const OBPublication& publication);
    void look(std::chrono::nanoseconds since, std::chrono::nanoseconds quietSince);

    OBMediaHost& _host;
    const std::shared_ptr<OBMediaManager> _manager;
    const platform::Platform& _platform;
    std::optional<apps::LoadWatch> _progress {};
    OBObservation _following {};
    OBObservation _observing {};
    std::uint64_t _publications = 0;
    std::uint64_t _publicationsSeen = 0;
    std::optional<bool> _scannedNewestFirst {};
    std::function<void(bool)> _settled {};
};

} // namespace ombrix
