#include "plugin/RepresentativeMovie.h"

#include "plugin/MontaroConstants.h"

#include "host/OBConstants.h"
#include "platform/Clock.h"
#include "platform/Immortal.h"
#include "platform/Platform.h"

#include <chrono>
#include <utility>

using platform::Text;
using platform::Value;

namespace {

/// Made once, so that a library of many projects does not repeat them.
struct RepresentativeKeys {
    Text projectPath = OBMontaroProjectPathKey;
    Text resolution = OBMediaObjectResolutionKey;
    Text formatVersion = OBMontaroProjectFormatVersion;
    Text isRepresentative = OBMontaroProjectRepresentative;
};

/// Walks on whatever thread it is called on; on the main thread the thumbnails are produced here and now.
ChosenMovie walkMovies(const OBMediaManager& manager, const OBMediaObjectList& movies)
{
    ChosenMovie chosen;
    for (std::size_t index = 0; index < movies.size(); ++index) {
        if (manager.isCancelLoadRequestPending())
            break;
        OBMediaObjectRef movie = movies[index];
        movie->thumbnailImage();
        Value resolution = movie->attributeForKey(OBMediaObjectResolutionKey);
        if (!resolution.size())
            continue;
        if (!chosen.movie || resolution.size()->width > chosen.resolution.size()->width)
            chosen = { std::move(movie), std::move(resolution) };
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

OBMediaObjectRef makeRepresentative(
    OBMediaManager& manager, const OBMediaGroup& group, const ChosenMovie& chosen, const Text& formatVersion)
{
    static platform::Immortal<RepresentativeKeys> keys;
    OBMediaObjectRef representative = OBMediaObject::initWithMediaType_name(OBMediaTypeMovie, group.name());
    representative->setMediaSourceType(OBMediaSourceTypePlugin);
    representative->setSourcePluginIdentifier(manager.pluginIdentifier());
    representative->setPathOfObject(*chosen.movie);
    representative->setAttribute_forKey(group.URL().path, keys->projectPath);
    representative->setAttribute_forKey(chosen.resolution, keys->resolution);
    if (formatVersion)
        representative->setAttribute_forKey(formatVersion, keys->formatVersion);
    representative->setAttribute_forKey(true, keys->isRepresentative);
    representative->setIcon(chosen.movie->thumbnailImage());
    return representative;
}
