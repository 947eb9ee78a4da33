#pragma once

#include "platform/FileSystem.h"

#include <optional>
#include <string_view>

namespace platform {

/// What the error number of a failed system call means to whoever asked.
FileProblem problemOfError(int error);

/// Facts about `path` as statx(2) tells them, relative to the open folder `folder` (or AT_FDCWD); `flags` are its own,
/// such as AT_SYMLINK_NOFOLLOW. Absent when the call fails; errno then says why.
std::optional<ItemStatus> readItemStatus(int folder, const char* path, int flags);

/// The flags that an item called `name` has by itself, before the `.hidden` of its folder is asked.
ItemFlags flagsOfItem(std::string_view name, ItemKind kind);

} // namespace platform
