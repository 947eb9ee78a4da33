#pragma once

#include "platform/formats/BoxReader.h"

#include <optional>

namespace platform {

/// Which way a matrix of a movie or a track turns the picture.
struct MovieMatrix {
    /// Nearer a quarter turn, to either side, than none or a half.
    bool turnsByQuarter = false;

    /// From the 36 bytes that a header stores.
    static MovieMatrix fromBytes(const std::byte* bytes) noexcept;
};

/// What a track's boxes tell.
struct MovieTrack {
    bool isVideo = false;
    /// Of a video track: as its header and the shape of its pixels have it, and turned as its matrix says; absent when
    /// it has no area.
    std::optional<Size> size;
};

/// Reads the boxes of a track (ISO base media file format, 8.3 to 8.5 and 12.1); absent when one of them is broken.
/// The tables of samples are stepped over.
std::optional<MovieTrack> readMovieTrack(BoxReader& reader, FileRange track);

} // namespace platform
