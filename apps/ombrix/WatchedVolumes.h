#pragma once

#include "host/OBTreeChanges.h"
#include "platform/Platform.h"

#include <cstddef>
#include <string>
#include <vector>

namespace ombrix {

/// A mounted volume, as people call it.
struct WatchedVolume {
    std::string path; ///< its mount point
    std::string name;
};

/// Volumes that came and went between two looks.
struct VolumeChanges {
    std::vector<WatchedVolume> came;
    std::vector<WatchedVolume> went;
};

/// The volumes that are mounted, and which have come or gone since the last look: a volume that is gone cannot be asked
/// for its name any more. One thread at a time.
class WatchedVolumes {
public:
    /// Takes the first look.
    explicit WatchedVolumes(const platform::Platform& platform);

    VolumeChanges look();

private:
    std::vector<WatchedVolume> mounted() const;

    const platform::Platform& _platform;
    std::vector<WatchedVolume> _known;
};

/// How many of the media objects lie on the volume, by its mount point or by its name below /Volumes.
std::size_t countObjectsOn(const WatchedVolume& volume, const std::vector<OBTreeChange>& changes);

/// The folders of the volume, by its name below /Volumes, that are called like one of `searchFolders` and exist, and
/// yet are none of them.
std::vector<std::string> unsearchedFoldersOn(
    const WatchedVolume& volume, const std::vector<std::string>& searchFolders, const platform::FileSystem& fileSystem);

} // namespace ombrix
