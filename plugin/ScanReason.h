#pragma once

#include "plugin/ScanRules.h"

#include "platform/FileSystem.h"

#include <string>

/// Why `rule` keeps out `item`, which lies at `path`; what may not be looked at is told by that.
ScanReason scanReason(const platform::FileSystem& fileSystem, const ScanRule& rule, const platform::FolderItem& item,
    const std::string& path);

/// Why the item at `path` does not hold the marker that `rule` looks for.
ScanReason reasonOfMarker(const platform::FileSystem& fileSystem, const ScanRule& rule, const std::string& path);
