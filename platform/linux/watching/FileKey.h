#pragma once

#include "platform/linux/watching/WatchedFolders.h"

#include <cstddef>
#include <functional>
#include <string>

namespace platform {

/// An entry of a watched folder.
struct FileKey {
    WatchedFolders::Number folder = WatchedFolders::none;
    std::string name;

    friend bool operator==(const FileKey&, const FileKey&) = default;
};

struct FileKeyHash {
    std::size_t operator()(const FileKey& key) const { return std::hash<std::string>()(key.name) * 31 + key.folder; }
};

} // namespace platform
