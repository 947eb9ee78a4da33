#pragma once

#include "platform/Value.h"

#include <string_view>

namespace platform {

/// The attributes that a file can be searched by. Any thread; may block. None throws.
class MetadataIndex {
public:
    virtual ~MetadataIndex() = default;

    /// A dictionary of the attributes of the file at `path`, links followed: kMDItemFSName, kMDItemFSSize (bytes),
    /// kMDItemContentType, kMDItemFSContentChangeDate, kMDItemFSCreationDate, kMDItemDurationSeconds,
    /// kMDItemPixelWidth, kMDItemPixelHeight, kMDItemPath. What the file does not have is left out; null when nothing
    /// exists there. Opens plain files with a movie's extension only.
    virtual Value attributesOfFile(std::string_view path) const = 0;
};

} // namespace platform
