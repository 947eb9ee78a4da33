#pragma once

#include "host/OBMediaManager.h"
#include "host/OBMediaObjectList.h"
#include "platform/Text.h"

#include <memory>
#include <span>
#include <vector>

/// The movie that stands for a project; none when no movie of the project's has a resolution.
struct ChosenMovie {
    OBMediaObjectRef movie;
    double width = 0;
};

/// The first of the widest movies of the first of `projects`, and of as many after it as one turn of the main thread
/// has time for; at least one answer. Heights play no part; movies without a resolution are never chosen.
///
/// Has the main thread produce each movie's thumbnail. Where a walk took long, the main thread gets back to its other
/// work first. A pending cancel, asked before each movie, ends the walk with what was chosen so far; asked before each
/// further project, it ends the answer.
std::vector<ChosenMovie> chooseRepresentativeMovies(OBMediaManager& manager, std::span<const OBMediaGroupRef> projects);

/// What all objects of a list that show projects by a movie have in common. `formatVersion` is left out when absent.
std::shared_ptr<const OBMediaObjectKind> representativeKind(
    const OBMediaManager& manager, const platform::Text& formatVersion);

/// The media object that shows the project `group` by the movie that was chosen for it.
OBMediaObjectRef makeRepresentative(
    const std::shared_ptr<const OBMediaObjectKind>& kind, const OBMediaGroup& group, const ChosenMovie& chosen);
