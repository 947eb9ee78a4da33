#pragma once

#include "platform/FileSystem.h"
#include "platform/Value.h"

#include <optional>
#include <string_view>

namespace platform {

/// What a movie's header tells (ISO base media file format, QuickTime file format).
struct MovieHeader {
    /// The first video track as it is shown, in pixels: shape of the pixels and rotation applied, fractions kept.
    /// Absent without a video track.
    std::optional<Size> resolution;
    /// Seconds.
    std::optional<double> duration;
};

/// Reads movies. Any thread; may block while a disk does not answer. None throws.
class Movies {
public:
    virtual ~Movies() = default;

    /// The header of the movie at `path`, links followed; absent when there is no plain file, when the file is no
    /// movie, is cut short within its header, or lies about its sizes. Time and memory are bounded whatever the file
    /// holds.
    virtual std::optional<MovieHeader> headerOfMovie(
        std::string_view path, PathKnowledge known = PathKnowledge::none) const = 0;
};

} // namespace platform
