#include "plugin/RepresentativeMovie.h"

#include "plugin/MontaroConstants.h"

#include "host/OBConstants.h"
#include "platform/Immortal.h"

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

bool areAllProduced(const OBMediaObjectList& movies)
{
    bool all = true;
    movies.visit([&](const OBMediaObject& movie) { return all = movie.hasProducedThumbnail(); });
    return all;
}

} // namespace

ChosenMovie chooseRepresentativeMovie(OBMediaManager& manager, const OBMediaGroup& project)
{
    const OBMediaObjectList movies = project.mediaObjects();
    // Thumbnails that are there already need no turn of the main thread.
    if (areAllProduced(movies))
        return walkMovies(manager, movies);
    manager.notePathAtWork(project.path());
    ChosenMovie chosen;
    manager.performOnMainThreadAndWait([&] { chosen = walkMovies(manager, movies); });
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
