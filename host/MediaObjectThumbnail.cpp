// The picture of a media object, and what comes with it.
//
// The one surprise: a picture lies in the block of its object and keeps that alive; so an object that keeps one of its
// own block must not own it, or neither would ever go.

#include "host/FrameworkCore.h"
#include "host/MediaObjectParts.h"
#include "host/OBConstants.h"
#include "platform/Immortal.h"
#include "platform/MainRunLoop.h"
#include "platform/Platform.h"

#include <optional>
#include <utility>

using platform::Locked;
using platform::Text;
using platform::Value;

namespace {

struct ThumbnailName {
    Text text = "thumbnail";
};

} // namespace

Text OBMediaObject::MovieThumbnail::name() const
{
    static platform::Immortal<ThumbnailName> name;
    return name->text;
}

OBImageRef OBMediaObject::thumbnailImage()
{
    if (!hasProducedThumbnail()) {
        if (const auto core = FrameworkCore::current())
            core->platform().mainRunLoop.performAndWait([&] { produceThumbnail(core->platform()); });
    }
    return thumbnailIfProduced();
}

void OBMediaObject::setThumbnailImage(const OBImageRef& image)
{
    std::optional<OBImageRef> set = withoutCycle(image);
    Locked guard(_lock);
    _thumbnailProduced = true;
    if (*set == imageOfMovie())
        set.reset(); // its own shows where none was set
    if (set || _own)
        std::swap(own().thumbnail, set);
}

OBImageRef OBMediaObject::thumbnailIfProduced() const
{
    Locked guard(_lock);
    return _own && _own->thumbnail ? handedOut(*_own->thumbnail) : imageOfMovie();
}

bool OBMediaObject::hasProducedThumbnail() const
{
    Locked guard(_lock);
    return _thumbnailProduced;
}

/// Runs on the main thread alone, so that no movie is read twice.
void OBMediaObject::produceThumbnail(const platform::Platform& platform)
{
    Text file;
    auto known = platform::PathKnowledge::none;
    {
        Locked guard(_lock);
        if (_thumbnailProduced)
            return;
        file = pathLocked();
        known = _pathIsReal ? platform::PathKnowledge::realPlainFile : platform::PathKnowledge::none;
    }
    const auto header = file ? platform.movies.headerOfMovie(file, known) : std::nullopt;

    Locked guard(_lock);
    if (header)
        _movie = std::make_unique<MovieThumbnail>(*header, *this, _own ? file : Text());
    _thumbnailProduced = true;
}

Value OBMediaObject::attributeOfMovie(std::string_view key) const
{
    if (!_movie)
        return {};
    if (key == OBMediaObjectResolutionKey && _movie->resolution())
        return *_movie->resolution();
    return key == OBMediaObjectDurationKey && _movie->duration() ? Value(*_movie->duration()) : Value();
}

OBImageRef OBMediaObject::imageOfMovie() const
{
    return _movie && _movie->hasPicture() ? OBImageRef(_origin.block(), _movie.get()) : nullptr;
}

/// `image` as this object may keep it: without a share in it where it lies in the same block.
OBImageRef OBMediaObject::withoutCycle(const OBImageRef& image) const
{
    const std::shared_ptr<const void> block = _origin.block();
    const bool isOfBlock = image && !image.owner_before(block) && !block.owner_before(image);
    return isOfBlock ? OBImageRef(OBImageRef(), image.get()) : image;
}

/// What is kept so, with a share in it.
OBImageRef OBMediaObject::handedOut(const OBImageRef& kept) const
{
    return kept && kept.use_count() == 0 ? OBImageRef(_origin.block(), kept.get()) : kept;
}
