#pragma once

#include "platform/FileSystem.h"
#include "platform/common/LinkTable.h"
#include "platform/common/LinkedPlace.h"

#include <optional>
#include <string>
#include <string_view>

namespace platform {

/// A file system with links that the machine adds to those on disk.
///
/// Every operation answers as if the links of the table were symbolic links: what lies below one is served from its
/// target, under the spelling that the caller used; the target of every link, added or real, may lead through further
/// ones; a link itself has a link's kind and flags, also where a real item stands at its path. No listing shows a link
/// to which nothing real corresponds. Links in circles end after as many hops as the kernel allows.
///
/// It keeps nothing between calls but what the table keeps. Where nothing was added on the way, a call costs what it
/// costs without this class.
class LinkedFileSystem : public FileSystem {
public:
    /// `real` answers for the disk alone. Both outlive this object.
    LinkedFileSystem(const FileSystem& real, const LinkTable& table);

    std::optional<std::string> homeFolder() const override;
    FolderListing itemsInFolder(std::string_view folder, const ListingRequest& request) const override;
    std::optional<ItemStatus> status(std::string_view path) const override;
    std::optional<ItemStatus> linkStatus(std::string_view path) const override;
    std::optional<std::string> linkTarget(std::string_view path) const override;
    ItemFlags itemFlags(std::string_view path) const override;
    std::string resolvedPath(std::string_view path) const override;
    OpenResult openPlainFile(std::string_view path, PathKnowledge known = PathKnowledge::none) const override;
    const FileSystem& withoutAddedLinks() const override { return _real.withoutAddedLinks(); }

private:
    struct Folder;

    LinkedPlace placeOf(std::string_view path, LastLink last) const;
    LinkedPlace substitutedPlaceOf(std::string_view path, LastLink last) const;
    LinkedPlace placeOfItem(std::string_view path) const;
    template <class Answer>
    Answer askFollowingLinks(std::string_view path, Answer (*ask)(const FileSystem&, const std::string&),
        Answer (*failure)(FileProblem)) const;
    FolderListing listingBesideMarker(std::string_view folder, const ListingRequest& request) const;
    FolderListing listingOfWalkedFolder(
        std::string_view folder, const ListingRequest& request, LinkedPlace& place) const;
    FolderListing listingThatStops(std::string_view folder, const ListingRequest& request) const;
    void lookThroughLinks(FolderListing& listing, const Folder& folder, const ListingRequest& request) const;
    void lookInside(FolderItem& item, const std::string& path, const ListingRequest& request) const;
    void applyHiddenNames(FolderListing& listing, std::string_view folder) const;
    bool isHidden(const LinkedPlace& place) const;

    const FileSystem& _real;
    const LinkTable& _table;
};

} // namespace platform
