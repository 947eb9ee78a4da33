#include "platform/common/LinkTable.h"

#include "platform/FileSystem.h"
#include "platform/PathText.h"
#include "platform/Volumes.h"
#include "platform/common/LexicalPath.h"

#include <algorithm>
#include <cstddef>
#include <utility>

namespace platform {

namespace {

    constexpr std::string_view volumesFolder = "/Volumes";

    std::map<std::string, std::string, std::less<>> mapOfLinks(const std::vector<AddedLink>& links)
    {
        std::map<std::string, std::string, std::less<>> map;
        for (const AddedLink& link : links)
            map.emplace(link.path, link.target);
        return map;
    }

    /// Where the volume called `name` is linked; absent for a name that no path can spell.
    std::optional<std::string> pathForVolumeName(std::string_view name)
    {
        if (name.empty() || hasDotComponent(name))
            return std::nullopt;
        std::string path = lexicallyNormalised(pathJoined(volumesFolder, name));
        if (path.size() <= volumesFolder.size())
            return std::nullopt;
        return path;
    }

    void appendLinks(std::vector<AddedLink>& links, const std::vector<std::string>& mountPoints, const Volumes& volumes)
    {
        for (const std::string& mountPoint : mountPoints) {
            std::optional<std::string> path = pathForVolumeName(volumes.displayName(mountPoint));
            const bool isTaken = path && std::any_of(links.begin(), links.end(), [&path](const AddedLink& link) {
                return link.path == *path;
            });
            if (path && !isTaken)
                links.push_back({ std::move(*path), mountPoint });
        }
    }

} // namespace

LinkTable::LinkTable(const std::vector<AddedLink>& links, const Volumes& volumes, const FileSystem& real)
    : _links(mapOfLinks(links))
    , _volumes(volumes)
    , _real(real)
{
}

bool LinkTable::mayApplyTo(std::string_view path) const noexcept
{
    return hasNamedLinks() || isSameOrBelow(path, volumesFolder);
}

std::optional<AddedLink> LinkTable::linkAtOrAbove(std::string_view path) const
{
    for (std::string_view above = path; !_links.empty() && above.size() > 1;
         above = pathByRemovingLastComponent(above)) {
        if (const auto found = _links.find(above); found != _links.end())
            return AddedLink { found->first, found->second };
    }
    return volumeLinkAtOrAbove(path);
}

std::optional<AddedLink> LinkTable::volumeLinkAtOrAbove(std::string_view path) const
{
    if (path.size() <= volumesFolder.size() || !isSameOrBelow(path, volumesFolder))
        return std::nullopt;
    const AddedLink* longest = nullptr;
    const std::shared_ptr<const VolumeLinks> volumes = volumeLinks();
    for (const AddedLink& link : volumes->links) {
        const bool isLonger = !longest || link.path.size() > longest->path.size();
        if (isLonger && isSameOrBelow(path, link.path) && isInEffect(link))
            longest = &link;
    }
    return longest ? std::optional(*longest) : std::nullopt;
}

bool LinkTable::isInEffect(const AddedLink& volumeLink) const
{
    if (volumeLink.path == volumeLink.target)
        return false;
    const std::optional<ItemStatus> real = _real.status(volumeLink.path);
    return !real || real->kind != ItemKind::folder;
}

std::vector<std::string> LinkTable::namesInFolder(std::string_view folder) const
{
    std::vector<std::string> names;
    forEachNamedLinkBelow(folder, [&names](std::string_view relativePath) {
        if (relativePath.find('/') == std::string_view::npos)
            names.emplace_back(relativePath);
    });
    if (!isSameOrBelow(folder, volumesFolder))
        return names;
    const std::shared_ptr<const VolumeLinks> volumes = volumeLinks();
    for (const AddedLink& link : volumes->links) {
        if (pathByRemovingLastComponent(link.path) == folder && isInEffect(link))
            names.emplace_back(lastPathComponent(link.path));
    }
    return names;
}

bool LinkTable::hasNamedLinkBelow(std::string_view folder) const
{
    bool isThere = false;
    forEachNamedLinkBelow(folder, [&isThere](std::string_view) { isThere = true; });
    return isThere;
}

std::vector<std::string> LinkTable::namesOfHolders(std::string_view folder, std::string_view entry) const
{
    std::vector<std::string> names;
    forEachNamedLinkBelow(folder, [&names, entry](std::string_view relativePath) {
        const std::size_t slash = relativePath.find('/');
        if (slash != std::string_view::npos && relativePath.substr(slash + 1) == entry)
            names.emplace_back(relativePath.substr(0, slash));
    });
    return names;
}

template <class Take> void LinkTable::forEachNamedLinkBelow(std::string_view folder, const Take& take) const
{
    if (_links.empty())
        return;
    const std::string start = folder == "/" ? "/" : std::string(folder) + "/";
    for (auto link = _links.lower_bound(start); link != _links.end(); ++link) {
        const std::string_view path = link->first;
        if (path.substr(0, start.size()) != start)
            return;
        take(path.substr(start.size()));
    }
}

std::shared_ptr<const LinkTable::VolumeLinks> LinkTable::volumeLinks() const
{
    const std::uint64_t generation = _volumes.generation();
    {
        Locked guard(_lock);
        if (_volumeLinks && generation != 0 && _volumeLinks->generation == generation)
            return _volumeLinks;
    }
    // A change while the names are read gives the number of before, so that the next question reads them again.
    auto fresh = std::make_shared<VolumeLinks>();
    fresh->generation = generation;
    appendLinks(fresh->links, _volumes.localVolumes(), _volumes);
    appendLinks(fresh->links, _volumes.removableMedia(), _volumes);
    Locked guard(_lock);
    _volumeLinks = fresh;
    return fresh;
}

} // namespace platform
