#pragma once

#include "platform/MetadataIndex.h"

namespace platform {

class FileSystem;
class Movies;

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
