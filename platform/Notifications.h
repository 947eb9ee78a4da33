#pragma once

#include "platform/Text.h"
#include "platform/Value.h"

#include <cstdint>
#include <functional>
#include <string_view>

namespace platform {

/// Posted on the workspace's centre when a volume has been mounted; the user info holds its mount point (a text) under
/// `mountedVolumePathKey`.
inline constexpr std::string_view volumeMountedNotification = "VolumeMounted";
inline constexpr std::string_view mountedVolumePathKey = "DevicePath";

/// The names under which the observer of a metadata query hears of it: that it has found what was there, and that files
/// came into its result or left it.
inline constexpr std::string_view metadataQueryFinishedGatheringNotification = "MetadataQueryDidFinishGathering";
inline constexpr std::string_view metadataQueryUpdatedNotification = "MetadataQueryDidUpdate";

/// One notification: a name, the object it is about (an identity, never dereferenced) and further facts.
struct Notification {
    Text name;
    const void* object = nullptr;
    Value userInfo {};
};

/// Hands notifications to whoever asked for them. Any thread.
///
/// Observers are called on the thread that posts, in the order in which they were added, and never while the centre
/// holds a lock. Once `removeObserver` has returned no further call begins.
class NotificationCenter {
public:
    /// Names one observer; 0 names none.
    using Token = std::uint64_t;
    using Handler = std::function<void(const Notification&)>;

    virtual ~NotificationCenter() = default;

    /// Calls `handler` for every notification called `name`; of `object` only, unless that is null.
    virtual Token addObserver(std::string_view name, const void* object, Handler handler) = 0;
    virtual void removeObserver(Token token) = 0;
    virtual void post(const Notification& notification) = 0;
};

} // namespace platform
