#pragma once

#include "host/OBMediaObjectOrigin.h"
#include "platform/Movies.h"

#include <optional>
#include <utility>

// What hangs on a media object where it has it.

/// The fields of an object made by itself, or of one that was changed after it was made together with others.
struct OBMediaObject::OwnFields {
    int mediaType = 0;
    int mediaSourceType = 0;
    platform::Text name {};
    platform::Text path {};
    platform::Text sourcePluginIdentifier {};
    OBImageRef icon {};
    std::optional<OBImageRef> thumbnail {}; // set by somebody, in place of the produced one, be it null
    OBMarvexPropertiesRef marvexProperties {};
    platform::Value::Dictionary attributes {};
    std::optional<platform::FileFacts> facts {};
};

/// What a movie's header told, and the picture that stands for the movie. Belongs to its object, so whoever shares the
/// picture shares the block in which the object lies.
class OBMediaObject::MovieThumbnail final : public OBImage {
public:
    /// `file` is absent where the object's origin tells it.
    MovieThumbnail(const platform::MovieHeader& header, const OBMediaObject& object, platform::Text file)
        : OBImage(header.resolution.value_or(platform::Size {}))
        , _hasResolution(header.resolution.has_value())
        , _hasDuration(header.duration.has_value())
        , _object(object)
        , _file(std::move(file))
        , _resolution(header.resolution.value_or(platform::Size {}))
        , _duration(header.duration.value_or(0))
    {
    }

    bool hasPicture() const { return _hasResolution; }
    std::optional<platform::Size> resolution() const
    {
        return _hasResolution ? std::optional(_resolution) : std::nullopt;
    }
    std::optional<double> duration() const { return _hasDuration ? std::optional(_duration) : std::nullopt; }
    platform::Text file() const { return _file ? _file : _object._origin.pathOfObject(_object); }

    platform::Text name() const override;
    OBPixelSource pixelSource() const override { return { OBPixelSource::Kind::movieFile, file() }; }

private:
    const bool _hasResolution;
    const bool _hasDuration;
    const OBMediaObject& _object;
    const platform::Text _file;
    const platform::Size _resolution;
    const double _duration;
};
