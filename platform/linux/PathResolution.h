#pragma once

#include <optional>
#include <string>
#include <string_view>

namespace platform {

/// The target text of the link `path`, relative to the open folder `folder` (or AT_FDCWD); absent when it is none.
std::optional<std::string> readLink(int folder, const char* path);

/// What `FileSystem::resolvedPath` answers for the links on disk. Paths may be longer than the kernel takes.
std::string pathWithLinksResolved(std::string_view path);

} // namespace platform
