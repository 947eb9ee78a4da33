#pragma once

#include "platform/FileSystem.h"

namespace platform {

/// The file system as the kernel shows it: only links that are on disk. Any thread.
class LinuxFileSystem : public FileSystem {
public:
    /// HOME where it is absolute, else the user database's entry; read afresh at every call.
    std::optional<std::string> homeFolder() const override;
    FolderListing itemsInFolder(std::string_view folder, const ListingRequest& request) const override;
    std::optional<ItemStatus> status(std::string_view path) const override;
    std::optional<ItemStatus> linkStatus(std::string_view path) const override;
    std::optional<std::string> linkTarget(std::string_view path) const override;
    ItemFlags itemFlags(std::string_view path) const override;
    std::string resolvedPath(std::string_view path) const override;
    OpenResult openPlainFile(std::string_view path, PathKnowledge known = PathKnowledge::none) const override;
};

} // namespace platform
