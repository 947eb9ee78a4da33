#include "apps/ombrix/WatchedVolumes.h"

#include "platform/FileSystem.h"
#include "platform/PathText.h"
#include "platform/Volumes.h"

#include <algorithm>
#include <set>
#include <utility>

namespace ombrix {
namespace {

    std::string folderByName(const WatchedVolume& volume)
    {
        return platform::pathJoined("/Volumes", volume.name);
    }

    /// Those of `volumes` that `others` does not hold.
    std::vector<WatchedVolume> without(
        const std::vector<WatchedVolume>& volumes, const std::vector<WatchedVolume>& others)
    {
        std::vector<WatchedVolume> rest;
        for (const WatchedVolume& volume : volumes) {
            const auto isSame = [&](const WatchedVolume& other) { return other.path == volume.path; };
            if (std::none_of(others.begin(), others.end(), isSame))
                rest.push_back(volume);
        }
        return rest;
    }

} // namespace

WatchedVolumes::WatchedVolumes(const platform::Platform& platform)
    : _platform(platform)
    , _known(mounted())
{
}

VolumeChanges WatchedVolumes::look()
{
    const std::vector<WatchedVolume> before = std::exchange(_known, mounted());
    return { without(_known, before), without(before, _known) };
}

std::vector<WatchedVolume> WatchedVolumes::mounted() const
{
    std::vector<WatchedVolume> volumes;
    for (std::string& path : _platform.volumes.localVolumes()) {
        std::string name = _platform.volumes.displayName(path);
        volumes.push_back({ std::move(path), std::move(name) });
    }
    return volumes;
}

std::size_t countObjectsOn(const WatchedVolume& volume, const std::vector<OBTreeChange>& changes)
{
    const std::string byName = folderByName(volume);
    return static_cast<std::size_t>(std::count_if(changes.begin(), changes.end(), [&](const OBTreeChange& change) {
        return change.object
            && (platform::isSameOrBelow(change.path, volume.path) || platform::isSameOrBelow(change.path, byName));
    }));
}

std::vector<std::string> unsearchedFoldersOn(
    const WatchedVolume& volume, const std::vector<std::string>& searchFolders, const platform::FileSystem& fileSystem)
{
    std::set<std::string> folders;
    for (const std::string& searched : searchFolders)
        folders.insert(platform::pathJoined(folderByName(volume), platform::lastPathComponent(searched)));
    for (const std::string& searched : searchFolders)
        folders.erase(searched);
    std::erase_if(folders, [&](const std::string& folder) { return !fileSystem.exists(folder); });
    return { folders.begin(), folders.end() };
}

} // namespace ombrix
