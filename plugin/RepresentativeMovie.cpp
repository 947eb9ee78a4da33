#include "plugin/RepresentativeMovie.h"

#include "plugin/MontaroConstants.h"

#include "host/OBConstants.h"
#include "platform/Clock.h"
#include "platform/Platform.h"

#include <chrono>
#include <utility>

using platform::Text;
using platform::Value;

namespace {

/// Walks on whatever thread it is called on; on the main thread the thumbnails are produced here and now.
ChosenMovie walkMovies(const OBMediaManager& manager, const OBMediaObjectList& movies)
{
    ChosenMovie chosen;
    for (std::size_t index = 0; index < movies.size(); ++index) {
        if (manager.isCancelLoadRequestPending())
            break;
        OBMediaObjectRef movie = movies[index];
        movie->thumbnailImage();
        const Value resolution = movie->attributeForKey(OBMediaObjectResolutionKey);
        if (!resolution.size())
            continue;
        if (!chosen.movie || resolution.size()->width > chosen.width)
            chosen = { std::move(movie), resolution.size()->width };
    }
    return chosen;
}

/// Reading the movies of a project takes less time than passing a turn there and back, so a turn serves several.
std::vector<ChosenMovie> walkProjects(OBMediaManager& manager, std::span<const OBMediaGroupRef> projects)
{
    constexpr std::chrono::milliseconds turnAtMost { 1 }; // nobody sees or feels the main thread stop for so long
    const platform::Clock& clock = manager.platform().clock;
    const std::chrono::nanoseconds end = clock.monotonic() + turnAtMost;
    std::vector<ChosenMovie> chosen;
    for (const OBMediaGroupRef& project : projects) {
        if (!chosen.empty() && (manager.isCancelLoadRequestPending() || clock.monotonic() >= end))
            break;
        manager.notePathAtWork(project->path());
        chosen.push_back(walkMovies(manager, project->mediaObjects()));
    }
    return chosen;
}

bool areAllProduced(const OBMediaObjectList& movies)
{
    bool all = true;
    movies.visit([&](const OBMediaObject& movie) { return all = movie.hasProducedThumbnail(); });
    return all;
}

} // namespace

std::vector<ChosenMovie> chooseRepresentativeMovies(OBMediaManager& manager, std::span<const OBMediaGroupRef> projects)
{
    std::vector<ChosenMovie> chosen;
    // Thumbnails that are there already need no turn of the main thread.
    if (const OBMediaObjectList movies = projects.front()->mediaObjects(); areAllProduced(movies)) {
        chosen.push_back(walkMovies(manager, movies));
        return chosen;
    }
    manager.performOnMainThreadAndWait([&] { chosen = walkProjects(manager, projects); });
    if (chosen.empty())
        chosen.emplace_back(); // the main loop has ended
    return chosen;
}

std::shared_ptr<const OBMediaObjectKind> representativeKind(const OBMediaManager& manager, const Text& formatVersion)
{
    auto kind = std::make_shared<OBMediaObjectKind>();
    kind->mediaType = OBMediaTypeMovie;
    kind->mediaSourceType = OBMediaSourceTypePlugin;
    kind->sourcePluginIdentifier = manager.pluginIdentifier();
    kind->groupPathKey = OBMontaroProjectPathKey;
    if (formatVersion)
        kind->attributes.emplace_back(OBMontaroProjectFormatVersion, formatVersion);
    kind->attributes.emplace_back(OBMontaroProjectRepresentative, true);
    return kind;
}

OBMediaObjectRef makeRepresentative(
    const std::shared_ptr<const OBMediaObjectKind>& kind, const OBMediaGroup& group, const ChosenMovie& chosen)
{
    return OBMediaObject::representative(kind, group.name(), group.URL().path, chosen.movie);
}
