#pragma once

#include "platform/FileSystem.h"
#include "platform/Movies.h"

#include <optional>

namespace platform {

/// The header of the movie in `file`; absent when the file is no movie, is cut short, or lies about its sizes.
///
/// The duration is the movie header's (`mvhd`), else the one for fragments (`mehd`), else the sum of the segment
/// indexes (`sidx`) that begin before the first fragment; a duration of 0 or of all ones counts as unknown. Only
/// headers of boxes and the few boxes that tell something are read, never tables of samples, media data or fragments:
/// one to three reads for a usual movie. Media data that reaches beyond the end of the file is a movie cut short.
std::optional<MovieHeader> readMovieHeader(const OpenFile& file);

} // namespace platform
