#include "platform/common/LinkedFileSystem.h"

// The disk is asked first, for calls that meet no link on the way: a listing that refuses links tells so at no cost.
// Only a path that does lead through a link is walked here, component by component. Surprise: without named links a
// path that the kernel follows to its end is right, for what is really on disk wins over a volume's link.

#include "platform/PathText.h"
#include "platform/common/HiddenNames.h"
#include "platform/common/LexicalPath.h"

#include <algorithm>
#include <cstddef>
#include <utility>
#include <vector>

namespace platform {

namespace {

    /// Whether the text alone tells which components the path has.
    bool isPlainlySpelled(std::string_view path)
    {
        return isLexicallyNormalised(path) && !hasDotComponent(path);
    }

    bool contains(const std::vector<std::string>& names, std::string_view name)
    {
        return std::find(names.begin(), names.end(), name) != names.end();
    }

    /// What was added directly in a folder, and one level below it under the name that a listing asks for.
    struct AddedNames {
        std::vector<std::string> links;
        std::vector<std::string> holders;

        bool isEmpty() const { return links.empty() && holders.empty(); }
    };

    AddedNames addedNames(const LinkTable& table, std::string_view folder, std::string_view marker)
    {
        if (!table.mayApplyTo(folder))
            return {};
        return { table.namesInFolder(folder),
            marker.empty() ? std::vector<std::string>() : table.namesOfHolders(folder, marker) };
    }

    std::optional<ItemStatus> askStatus(const FileSystem& real, const std::string& path)
    {
        return real.status(path);
    }
    std::optional<ItemStatus> noStatus(FileProblem)
    {
        return std::nullopt;
    }
    OpenResult askOpen(const FileSystem& real, const std::string& path)
    {
        return real.openPlainFile(path);
    }
    OpenResult notOpened(FileProblem problem)
    {
        return { nullptr, problem };
    }

    bool isFound(const std::optional<ItemStatus>& status)
    {
        return status.has_value();
    }
    bool isFound(const OpenResult& result)
    {
        // These two are answers about an item that was found.
        return result.file || result.problem == FileProblem::notAPlainFile || result.problem == FileProblem::readError;
    }

} // namespace

/// A folder as it was asked for and as it lies on disk.
struct LinkedFileSystem::Folder {
    std::string_view spelled;
    std::string_view real;
};

LinkedFileSystem::LinkedFileSystem(const FileSystem& real, const LinkTable& table)
    : _real(real)
    , _table(table)
{
}

std::optional<std::string> LinkedFileSystem::homeFolder() const
{
    return _real.homeFolder();
}

/// Where `path` leads, every link looked at.
LinkedPlace LinkedFileSystem::placeOf(std::string_view path, LastLink last) const
{
    return placeAfterAllLinks(_real, _table, path, last);
}

/// Where `path` leads as far as its text tells: links on disk are not looked at.
LinkedPlace LinkedFileSystem::substitutedPlaceOf(std::string_view path, LastLink last) const
{
    return placeAfterAddedLinks(_real, _table, path, last);
}

/// What the disk answers about the place where `path` leads.
template <class Answer>
Answer LinkedFileSystem::askFollowingLinks(
    std::string_view path, Answer (*ask)(const FileSystem&, const std::string&), Answer (*failure)(FileProblem)) const
{
    if (!_table.hasNamedLinks()) {
        const std::string asked = substitutedPlaceOf(path, LastLink::followed).path;
        Answer answer = ask(_real, asked);
        if (isFound(answer))
            return answer;
        const LinkedPlace place = placeOf(path, LastLink::followed);
        if (place.problem != FileProblem::none || place.path == asked)
            return answer;
        return ask(_real, place.path);
    }
    const LinkedPlace place = placeOf(path, LastLink::followed);
    return place.problem == FileProblem::none ? ask(_real, place.path) : failure(place.problem);
}

/// Where `path` leads, its last component left alone. Real links before it are looked at only where they matter.
LinkedPlace LinkedFileSystem::placeOfItem(std::string_view path) const
{
    if (!_table.hasNamedLinks()) {
        LinkedPlace place = substitutedPlaceOf(path, LastLink::kept);
        if (place.link || _real.linkStatus(place.path))
            return place;
    }
    return placeOf(path, LastLink::kept);
}

FolderListing LinkedFileSystem::itemsInFolder(std::string_view folder, const ListingRequest& request) const
{
    if (request.links == LinkPolicy::stop)
        return listingThatStops(folder, request);
    // Beside the folder as it is spelled, no matter where it lies.
    if (!request.markerBeside.empty() && (_table.hasNamedLinks() || _table.mayApplyTo(folder)))
        return listingBesideMarker(folder, request);
    ListingRequest stopping = request;
    stopping.links = LinkPolicy::stop;
    stopping.followsMarkers = !_table.hasNamedLinks();
    LinkedPlace place = substitutedPlaceOf(folder, LastLink::followed);
    if (place.problem != FileProblem::none)
        return FolderListing(place.problem);
    // What named links change inside the items is told by listing each by itself.
    if (_table.hasNamedLinks() && (place.path != folder || _table.hasNamedLinkBelow(folder)))
        stopping.subfolder = {};
    FolderListing listing = _real.itemsInFolder(place.path, stopping);
    bool isUnsettled = listing.problem() == FileProblem::linkOnTheWay;
    const bool pathIsReal = !isUnsettled && place.path == folder && isPlainlySpelled(folder);
    if (listing.problem() != FileProblem::none && !request.markerBeside.empty())
        return listingBesideMarker(folder, request);
    if (isUnsettled && !_table.hasNamedLinks()) {
        place.path = _real.resolvedPath(place.path);
        listing = _real.itemsInFolder(place.path, stopping);
        isUnsettled = listing.problem() == FileProblem::linkOnTheWay || listing.problem() == FileProblem::missing;
    }
    if (isUnsettled || (listing.problem() != FileProblem::none && !isPlainlySpelled(folder)))
        listing = listingOfWalkedFolder(folder, stopping, place);
    listing.setPathIsReal(pathIsReal);
    if (!pathIsReal && isPlainlySpelled(place.path))
        listing.setOtherRealPath(place.path);
    if (!listing.empty())
        lookThroughLinks(listing, { pathWithoutTrailingSlashes(folder), place.path }, request);
    return listing;
}

/// The same where what holds `folder` has to be asked for by its path; first, so that nothing is listed in vain.
FolderListing LinkedFileSystem::listingBesideMarker(std::string_view folder, const ListingRequest& request) const
{
    const std::string_view holder = pathByRemovingLastComponent(folder);
    if (!exists(pathJoined(holder, request.markerBeside))) {
        FolderListing nothing;
        nothing.setHolder({});
        return nothing;
    }
    ListingRequest rest = request;
    rest.markerBeside = {};
    FolderListing listing = itemsInFolder(folder, rest);
    if (const auto status = this->status(holder))
        listing.setHolder({ true, status->modificationDate });
    return listing;
}

/// The listing of `folder` after every link on the way was looked at; `place` becomes where that leads.
FolderListing LinkedFileSystem::listingOfWalkedFolder(
    std::string_view folder, const ListingRequest& request, LinkedPlace& place) const
{
    place = placeOf(folder, LastLink::followed);
    if (place.problem != FileProblem::none)
        return FolderListing(place.problem);
    ListingRequest there = request;
    if (_table.hasNamedLinks())
        there.subfolder = {};
    return _real.itemsInFolder(place.path, there);
}

/// The listing of `folder` for a caller who wants no link followed.
FolderListing LinkedFileSystem::listingThatStops(std::string_view folder, const ListingRequest& request) const
{
    const std::string path = lexicallyNormalised(folder);
    if (_table.mayApplyTo(path) && _table.linkAtOrAbove(path))
        return FolderListing(FileProblem::linkOnTheWay);
    ListingRequest there = request;
    if (_table.hasNamedLinks())
        there.markerBeside = {};
    if (_table.hasNamedLinkBelow(path))
        there.subfolder = {};
    FolderListing listing = _real.itemsInFolder(path, there);
    const std::vector<std::string> added = _table.namesInFolder(path);
    for (std::size_t index = 0; !added.empty() && index < listing.size(); ++index) {
        const FolderItem item = listing[index];
        if (contains(added, item.name))
            listing.setItem(index, { item.name, ItemKind::symbolicLink, { item.flags.invisible, false, false } });
    }
    return listing;
}

/// Completes a listing in which no link was followed.
void LinkedFileSystem::lookThroughLinks(
    FolderListing& listing, const Folder& folder, const ListingRequest& request) const
{
    const AddedNames asSpelled = addedNames(_table, folder.spelled, request.marker);
    const AddedNames onDisk
        = folder.real == folder.spelled ? AddedNames {} : addedNames(_table, folder.real, request.marker);
    if (asSpelled.isEmpty() && onDisk.isEmpty() && !listing.hasLinks())
        return;
    bool hiddenNamesAreLinked
        = contains(asSpelled.links, HiddenNames::fileName) || contains(onDisk.links, HiddenNames::fileName);
    for (std::size_t index = 0; index < listing.size(); ++index) {
        FolderItem item = listing[index];
        const bool isAddedAsSpelled = contains(asSpelled.links, item.name);
        if (isAddedAsSpelled || contains(onDisk.links, item.name)) {
            item.kind = ItemKind::symbolicLink;
            item.flags.container = item.flags.package = false;
            item.facts.reset();
        }
        const bool holdsAsSpelled = contains(asSpelled.holders, item.name);
        if (item.kind == ItemKind::symbolicLink)
            hiddenNamesAreLinked = hiddenNamesAreLinked || item.name == HiddenNames::fileName;
        else if (item.marker != MarkerAnswer::link && !holdsAsSpelled && !contains(onDisk.holders, item.name))
            continue;
        const bool useSpelling = isAddedAsSpelled || holdsAsSpelled;
        if (!request.marker.empty())
            lookInside(item, pathJoined(useSpelling ? folder.spelled : folder.real, item.name), request);
        listing.setItem(index, item);
    }
    if (hiddenNamesAreLinked)
        applyHiddenNames(listing, contains(asSpelled.links, HiddenNames::fileName) ? folder.spelled : folder.real);
}

/// Answers anew for the item at `path` what `request` asks of its inside.
void LinkedFileSystem::lookInside(FolderItem& item, const std::string& path, const ListingRequest& request) const
{
    item.marker = exists(pathJoined(path, request.marker)) ? MarkerAnswer::present : MarkerAnswer::absent;
    item.modificationDate.reset();
    item.subfolder.reset();
    if (item.marker == MarkerAnswer::absent || !request.datesOfHolders)
        return;
    if (const std::optional<ItemStatus> holder = status(path))
        item.modificationDate = holder->modificationDate;
}

/// Tells visibility anew in a folder whose list of hidden names is a link.
void LinkedFileSystem::applyHiddenNames(FolderListing& listing, std::string_view folder) const
{
    const OpenResult list = openPlainFile(pathJoined(folder, HiddenNames::fileName));
    (list.file ? HiddenNames(*list.file) : HiddenNames()).applyTo(listing);
}

std::optional<ItemStatus> LinkedFileSystem::status(std::string_view path) const
{
    return askFollowingLinks(path, askStatus, noStatus);
}

std::optional<ItemStatus> LinkedFileSystem::linkStatus(std::string_view path) const
{
    const LinkedPlace place = placeOfItem(path);
    if (place.problem != FileProblem::none)
        return std::nullopt;
    if (!place.link)
        return _real.linkStatus(place.path);
    // An added link has no dates of its own.
    ItemStatus link = status(place.path).value_or(ItemStatus {});
    link.kind = ItemKind::symbolicLink;
    link.size = place.link->target.size();
    return link;
}

std::optional<std::string> LinkedFileSystem::linkTarget(std::string_view path) const
{
    const LinkedPlace place = placeOfItem(path);
    if (place.problem != FileProblem::none)
        return std::nullopt;
    return place.link ? place.link->target : _real.linkTarget(place.path);
}

ItemFlags LinkedFileSystem::itemFlags(std::string_view path) const
{
    const LinkedPlace place = placeOfItem(path);
    if (place.problem != FileProblem::none)
        return {};
    ItemFlags flags = _real.itemFlags(place.path);
    if (place.link)
        flags.container = flags.package = false;
    else if (!_real.linkStatus(place.path))
        return {};
    if (!flags.invisible)
        flags.invisible = isHidden(place);
    return flags;
}

/// Whether the item at `place` is hidden by its name, or by a list that only an added link leads to.
bool LinkedFileSystem::isHidden(const LinkedPlace& place) const
{
    const std::string list = pathJoined(pathByRemovingLastComponent(place.path), HiddenNames::fileName);
    const std::optional<ItemStatus> listStatus = linkStatus(list);
    const bool isListTold = listStatus && (place.link || listStatus->kind == ItemKind::symbolicLink);
    const OpenResult opened = isListTold ? openPlainFile(list) : OpenResult {};
    return (opened.file ? HiddenNames(*opened.file) : HiddenNames()).hide(lastPathComponent(place.path));
}

std::string LinkedFileSystem::resolvedPath(std::string_view path) const
{
    if (path.empty() || path.front() != '/')
        return _real.resolvedPath(path);
    if (!_table.hasNamedLinks()) {
        const LinkedPlace place = substitutedPlaceOf(path, LastLink::followed);
        if (place.problem == FileProblem::none && _real.status(place.path))
            return _real.resolvedPath(place.path);
    }
    return placeOf(path, LastLink::followed).path;
}

OpenResult LinkedFileSystem::openPlainFile(std::string_view path, PathKnowledge known) const
{
    // What was seen to hold no link need not be walked: the disk refuses, and follows nothing, if that has changed.
    if (known == PathKnowledge::realPlainFile && !(_table.mayApplyTo(path) && _table.linkAtOrAbove(path))) {
        OpenResult result = _real.openPlainFile(path, known);
        if (result.file)
            return result;
    }
    return askFollowingLinks(path, askOpen, notOpened);
}

} // namespace platform
