#include "tests/support/simulated/SimulatedFileSystem.h"

#include "platform/PathText.h"
#include "platform/common/HiddenNames.h"

#include <algorithm>
#include <array>
#include <cstring>
#include <memory>
#include <utility>

namespace tests {

using platform::FileProblem;
using platform::FolderItem;
using platform::FolderListing;
using platform::ItemKind;
using platform::ItemStatus;
using platform::LinkPolicy;
using platform::MarkerAnswer;
using Links = SimulatedDisk::Links;

namespace {

    class File : public platform::OpenFile {
    public:
        File(std::string text, const ItemStatus& status)
            : _text(std::move(text))
            , _status(status)
        {
        }
        ItemStatus status() const override { return _status; }
        std::size_t read(std::uint64_t offset, std::span<std::byte> buffer) const override
        {
            const std::size_t start = std::min<std::size_t>(offset, _text.size());
            const std::size_t count = std::min(buffer.size(), _text.size() - start);
            std::memcpy(buffer.data(), _text.data() + start, count);
            return count;
        }

    private:
        const std::string _text;
        const ItemStatus _status;
    };

    ItemStatus statusOf(const SimulatedDisk::Item& item)
    {
        return { item.kind, item.text.size(), item.modified, std::min(item.born, item.modified) };
    }

    bool isPackageName(std::string_view name)
    {
        constexpr std::array<std::string_view, 5> extensions { "app", "bundle", "framework", "plugin", "obplugin" };
        return std::find(extensions.begin(), extensions.end(), platform::extensionOfName(name)) != extensions.end();
    }

    platform::ItemFlags flagsOf(const SimulatedDisk::Item& item)
    {
        const bool isFolder = item.kind == ItemKind::folder;
        return { item.name.starts_with('.'), isFolder, isFolder && isPackageName(item.name) };
    }

} // namespace

FolderListing SimulatedFileSystem::itemsInFolder(std::string_view folder, const platform::ListingRequest& request) const
{
    const bool stops = request.links == LinkPolicy::stop;
    const SimulatedDisk::Place place = _disk.placeOf(folder, stops ? Links::refused : Links::followed);
    if (!place.item)
        return FolderListing(place.problem);
    if (place.item->kind != ItemKind::folder)
        return FolderListing(FileProblem::notAFolder);
    if (!place.item->isOpen)
        return FolderListing(FileProblem::notPermitted);
    FolderListing listing;
    for (const auto& item : place.item->items)
        listing.append(listed(*item, request, place.path, listing));
    if (request.folderStatus)
        listing.setFolderStatus(statusOf(*place.item));
    listing.setPathIsReal(place.path == folder);
    if (place.path != folder)
        listing.setOtherRealPath(place.path);
    const std::string hidden = platform::pathJoined(place.path, platform::HiddenNames::fileName);
    const platform::OpenResult list
        = stops && linkTarget(hidden) ? platform::OpenResult {} : openPlainFile(hidden, platform::PathKnowledge::none);
    if (list.file)
        platform::HiddenNames(*list.file).applyTo(listing);
    return listing;
}

FolderItem SimulatedFileSystem::listed(const SimulatedDisk::Item& item, const platform::ListingRequest& request,
    const std::string& folder, FolderListing& listing) const
{
    FolderItem listedItem;
    listedItem.name = item.name;
    listedItem.kind = item.kind;
    listedItem.flags = flagsOf(item);
    if (request.fileFacts && item.kind == ItemKind::file && !listedItem.flags.invisible)
        listedItem.facts = platform::FileFacts { statusOf(item).creationDate, item.text.size() };
    const bool mayHold
        = item.kind == ItemKind::folder || (item.kind == ItemKind::symbolicLink && request.links == LinkPolicy::follow);
    if (!request.marker.empty() && mayHold)
        lookInside(listedItem, platform::pathJoined(folder, item.name), request, listing);
    return listedItem;
}

/// Answers what is asked of the inside of the item at `path`.
void SimulatedFileSystem::lookInside(
    FolderItem& item, const std::string& path, const platform::ListingRequest& request, FolderListing& listing) const
{
    const std::string marker = platform::pathJoined(path, request.marker);
    const bool isLink = linkTarget(marker).has_value();
    const bool stops = request.links == LinkPolicy::stop && isLink;
    if (stops && !(request.followsMarkers && exists(marker))) {
        item.marker = MarkerAnswer::link;
        return;
    }
    if (!exists(marker))
        return;
    item.marker = MarkerAnswer::present;
    if (const std::optional<ItemStatus> holder = status(path); holder && request.datesOfHolders)
        item.modificationDate = holder->modificationDate;
    if (request.subfolder.empty() || item.kind != ItemKind::folder)
        return;
    const SimulatedDisk::Place subfolder = _disk.placeOf(platform::pathJoined(path, request.subfolder), Links::refused);
    if (!subfolder.item && subfolder.problem != FileProblem::missing)
        return;
    if (subfolder.item && (subfolder.item->kind != ItemKind::folder || !subfolder.item->isOpen))
        return;
    for (std::size_t index = 0; subfolder.item && index < subfolder.item->items.size(); ++index)
        listing.appendToSubfolder(subfolder.item->items[index]->name, subfolder.item->items[index]->kind);
    item.subfolder = listing.takeSubfolder();
}

std::optional<ItemStatus> SimulatedFileSystem::status(std::string_view path) const
{
    const SimulatedDisk::Place place = _disk.placeOf(path);
    return place.item ? std::optional(statusOf(*place.item)) : std::nullopt;
}

std::optional<ItemStatus> SimulatedFileSystem::linkStatus(std::string_view path) const
{
    const SimulatedDisk::Place place = _disk.placeOf(path, Links::lastKept);
    return place.item ? std::optional(statusOf(*place.item)) : std::nullopt;
}

std::optional<std::string> SimulatedFileSystem::linkTarget(std::string_view path) const
{
    const SimulatedDisk::Place place = _disk.placeOf(path, Links::lastKept);
    const bool isLink = place.item && place.item->kind == ItemKind::symbolicLink;
    return isLink ? std::optional(place.item->text) : std::nullopt;
}

platform::ItemFlags SimulatedFileSystem::itemFlags(std::string_view path) const
{
    const SimulatedDisk::Place place = _disk.placeOf(path, Links::lastKept);
    if (!place.item || !place.item->parent)
        return {};
    platform::ItemFlags flags = flagsOf(*place.item);
    const std::string hidden = platform::pathJoined(place.item->parent->path(), platform::HiddenNames::fileName);
    if (const platform::OpenResult list = openPlainFile(hidden, platform::PathKnowledge::none); list.file)
        flags.invisible = platform::HiddenNames(*list.file).hide(place.item->name);
    return flags;
}

std::string SimulatedFileSystem::resolvedPath(std::string_view path) const
{
    SimulatedDisk::Place place = _disk.placeOf(path);
    if (place.problem != FileProblem::linksInCircles)
        return place.path;
    const std::string folder = resolvedPath(platform::pathByRemovingLastComponent(path));
    return platform::pathJoined(folder, platform::lastPathComponent(path));
}

platform::OpenResult SimulatedFileSystem::openPlainFile(std::string_view path, platform::PathKnowledge known) const
{
    const bool isReal = known == platform::PathKnowledge::realPlainFile;
    const SimulatedDisk::Place place = _disk.placeOf(path, isReal ? Links::refused : Links::followed);
    if (!place.item)
        return { nullptr, place.problem };
    if (place.item->kind != ItemKind::file)
        return { nullptr, FileProblem::notAPlainFile };
    if (!place.item->isOpen)
        return { nullptr, FileProblem::notPermitted };
    return { std::make_unique<File>(place.item->text, statusOf(*place.item)), FileProblem::none };
}

} // namespace tests
