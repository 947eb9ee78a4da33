#pragma once

#include "host/OBImage.h"
#include "platform/Snapshot.h"
#include "platform/Text.h"

/// What all instances of the source share: made when first needed, kept until an instance is torn down. Each slot owns
/// its own share of what it holds. Never destroyed with the process, whose end joins no thread.
struct SharedValues {
    platform::Snapshot<OBImageRef> smallAppIcon; ///< the root icon, 16 by 16 points
    platform::Snapshot<OBImageRef> projectIcon;
    platform::Snapshot<OBImageRef> emptyProjectIcon; ///< the project icon itself
    platform::Snapshot<OBImageRef> eventIcon;
    platform::Snapshot<OBImageRef> calendarIcon;
    platform::Snapshot<platform::Text> defaultProjectsPath;
    platform::Snapshot<platform::Text> defaultEventsPath;
};

SharedValues& sharedValues();
