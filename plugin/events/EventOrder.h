#pragma once

#include "host/OBMediaGroup.h"
#include "platform/Value.h"

#include <vector>

/// What the order of events looks at, read from a group once, so that sorting reads no attribute over and over.
struct EventOrderKey {
    explicit EventOrderKey(const OBMediaGroup& event);

    platform::Value year; ///< an integer, or null
    platform::Value oldestClip; ///< dates, or null
    platform::Value newestClip;
    platform::Text name;
};

/// -1 when the receiver comes first, +1 when the other does, 0 when neither does.
int compareOldestFirst(const EventOrderKey& receiver, const EventOrderKey& other);
int compareNewestFirst(const EventOrderKey& receiver, const EventOrderKey& other);

/// The events in the order that the editor's user chose.
std::vector<OBMediaGroupRef> eventsInOrder(const std::vector<OBMediaGroupRef>& events, bool newestFirst);
