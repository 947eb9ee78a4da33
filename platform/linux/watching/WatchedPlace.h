#pragma once

#include "platform/Value.h"

#include <cstdint>
#include <functional>
#include <string>
#include <string_view>
#include <vector>

namespace platform {

class FileSystem;

/// An entry that decides where a path leads: a change of `name` in `folder`, a real path, may lead it elsewhere.
struct PlaceStep {
    std::string folder;
    std::string name;

    friend bool operator==(const PlaceStep&, const PlaceStep&) = default;
};

/// Where a path leads on disk, and by what way.
struct WatchedPlace {
    enum class Kind : std::uint8_t { missing, folder, other };

    std::string path {}; ///< the real path
    /// The real path; where nothing is there, that of the nearest folder above it that is.
    std::string reached {};
    Kind kind = Kind::missing;
    std::uint64_t device = 0;
    std::uint64_t inode = 0;
    /// When what decides about the place last changed: the item, where it is no folder, and the links on the way; where
    /// nothing is there, the folder that could hold the next step.
    Date changed {};
    std::vector<PlaceStep> steps {}; ///< those near "/" first, each once
    /// The last step leads to where the asker may not look, so the way has not been followed further.
    bool endsEarly = false;

    bool isSamePlace(const WatchedPlace& other) const
    {
        return path == other.path && kind == other.kind && device == other.device && inode == other.inode
            && endsEarly == other.endsEarly;
    }
};

/// Whether one may look at a real path; null is anywhere.
using MayLook = std::function<bool(std::string_view realPath)>;

/// Follows `path` as `files` does, and looks only where `mayLook` lets it.
WatchedPlace placeOfPath(const FileSystem& files, std::string_view path, const MayLook& mayLook);

} // namespace platform
