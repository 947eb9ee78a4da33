#pragma once

#include "platform/MetadataIndex.h"

namespace platform {

class FileSystem;
class Movies;

/// The content type of every file with a movie's extension.
inline constexpr std::string_view movieContentType = "org.ombrix.movie";

/// Whether `name` has the extension of a movie: mov, m4v, mp4 or 3gp, in capital or small letters.
bool isMovieName(std::string_view name);

/// Attributes read from the files themselves when they are asked for.
class FileMetadataIndex : public MetadataIndex {
public:
    /// Both outlive this object.
    FileMetadataIndex(const FileSystem& files, const Movies& movies);

    Value attributesOfFile(std::string_view path) const override;

private:
    const FileSystem& _files;
    const Movies& _movies;
};

} // namespace platform
