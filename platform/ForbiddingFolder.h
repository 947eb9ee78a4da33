#pragma once

#include "platform/FileSystem.h"
#include "platform/PathText.h"

#include <string>
#include <string_view>

namespace platform {

/// The folder that keeps `path` out of reach; `path` itself where none does.
inline std::string folderThatForbids(const FileSystem& fileSystem, std::string_view path)
{
    while (path.size() > 1 && fileSystem.isOutOfReach(path))
        path = pathByRemovingLastComponent(path);
    return std::string(path);
}

} // namespace platform
