#include "platform/described/DescribedVolumes.h"

#include "platform/FileSystem.h"
#include "platform/PathText.h"
#include "platform/common/FileSystemTypeName.h"

#include <algorithm>
#include <span>

namespace platform {

namespace {

    std::vector<DescribedVolume> joined(std::vector<DescribedVolume> first, const std::vector<DescribedVolume>& second)
    {
        first.insert(first.end(), second.begin(), second.end());
        return first;
    }

    std::vector<std::string> pathsOf(std::span<const DescribedVolume> volumes)
    {
        std::vector<std::string> paths;
        for (const DescribedVolume& volume : volumes)
            paths.push_back(volume.path);
        return paths;
    }

} // namespace

DescribedVolumes::DescribedVolumes(const MachineDescription& description, const FileSystem& files, const Volumes& base)
    : _volumes(joined(description.localVolumes, description.removableMedia))
    , _localCount(description.localVolumes.size())
    , _files(files)
    , _base(base)
{
}

std::vector<std::string> DescribedVolumes::localVolumes() const
{
    return pathsOf(std::span(_volumes).first(_localCount));
}

std::vector<std::string> DescribedVolumes::removableMedia() const
{
    return pathsOf(std::span(_volumes).subspan(_localCount));
}

std::string DescribedVolumes::displayName(std::string_view path) const
{
    path = pathWithoutTrailingSlashes(path);
    const auto volume = std::find_if(
        _volumes.begin(), _volumes.end(), [path](const DescribedVolume& candidate) { return candidate.path == path; });
    return volume == _volumes.end() ? std::string(lastPathComponent(path)) : volume->displayName;
}

std::optional<std::string> DescribedVolumes::fileSystemType(std::string_view path) const
{
    if (!_files.exists(path))
        return std::nullopt;
    const std::string realPath = _files.resolvedPath(path);
    if (const std::optional<std::string> type = describedTypeOfRealPath(realPath))
        return std::string(shortFileSystemTypeName(*type));
    return _base.fileSystemType(realPath);
}

/// The type of the volume that holds `realPath`, as written. Where the description lists one volume twice, the first
/// type counts.
std::optional<std::string> DescribedVolumes::describedTypeOfRealPath(std::string_view realPath) const
{
    std::optional<std::string> type;
    std::size_t longest = 0;
    for (const DescribedVolume& volume : _volumes) {
        const std::string mountPoint = _files.resolvedPath(volume.path);
        if (mountPoint.size() < longest || !isSameOrBelow(realPath, mountPoint))
            continue;
        if (mountPoint.size() > longest)
            type.reset();
        longest = mountPoint.size();
        if (!type)
            type = volume.fileSystem;
    }
    return type;
}

} // namespace platform
