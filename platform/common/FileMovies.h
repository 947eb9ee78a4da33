#pragma once

#include "platform/Movies.h"

namespace platform {

class FileSystem;

/// Movies as the files of a file system hold them.
class FileMovies : public Movies {
public:
    /// `files` outlives this object.
    explicit FileMovies(const FileSystem& files);

    std::optional<MovieHeader> headerOfMovie(
        std::string_view path, PathKnowledge known = PathKnowledge::none) const override;

private:
    const FileSystem& _files;
};

} // namespace platform
