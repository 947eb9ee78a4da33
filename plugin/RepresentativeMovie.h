#pragma once

#include "host/OBMediaManager.h"
#include "host/OBMediaObjectList.h"
#include "platform/Value.h"

/// The movie that stands for a project, and its resolution; no movie when none of the project's has a resolution.
struct ChosenMovie {
    OBMediaObjectRef movie;
    platform::Value resolution;
};

/// The first of the widest movies of `project`. Heights play no part; movies without a resolution are never chosen. Has
/// the main thread produce each movie's thumbnail, in one turn; a pending cancel, asked before each, ends the walk with
/// what was chosen so far.
ChosenMovie chooseRepresentativeMovie(OBMediaManager& manager, const OBMediaGroup& project);

/// The media object that shows the project `group` by the movie that was chosen for it. `formatVersion` is left out
/// when absent.
OBMediaObjectRef makeRepresentative(
    OBMediaManager& manager, const OBMediaGroup& group, const ChosenMovie& chosen, const platform::Text& formatVersion);
