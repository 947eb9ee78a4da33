#include "platform/common/FileMovies.h"

#include "platform/FileSystem.h"
#include "platform/formats/MovieHeader.h"

namespace platform {

FileMovies::FileMovies(const FileSystem& files)
    : _files(files)
{
}

std::optional<MovieHeader> FileMovies::headerOfMovie(std::string_view path, PathKnowledge known) const
{
    const OpenResult opened = _files.openPlainFile(path, known);
    return opened.file ? readMovieHeader(*opened.file) : std::nullopt;
}

} // namespace platform
