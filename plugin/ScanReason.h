#pragma once

#include "plugin/ScanRules.h"

#include "platform/FileSystem.h"

#include <string>
#include <string_view>

/// Why `rule` keeps out `item`, which lies at `path`; what may not be looked at is told by that.
ScanReason scanReason(const platform::FileSystem& fileSystem, const ScanRule& rule, const platform::FolderItem& item,
    const std::string& path);

/// What permits reading `path`, as a command for a shell.
std::string remedyOfPermission(const platform::FileSystem& fileSystem, std::string_view path);

/// Why `path`, in `folder`, is nothing by itself: the folder passes `rule`, one for a marker, and no rule speaks of
/// `path`.
ScanReason reasonInside(
    const platform::FileSystem& fileSystem, const ScanRule& rule, std::string_view folder, std::string_view path);

/// Why the item at `path` does not hold the marker that `rule` looks for.
ScanReason reasonOfMarker(const platform::FileSystem& fileSystem, const ScanRule& rule, const std::string& path);
