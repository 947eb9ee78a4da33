#pragma once

#include "platform/FileSystem.h"
#include "tests/support/simulated/SimulatedDisk.h"

namespace tests {

/// What a simulated disk answers, by itself: links to volumes are added by who uses it.
class SimulatedFileSystem : public platform::FileSystem {
public:
    /// `disk` outlives this object.
    explicit SimulatedFileSystem(const SimulatedDisk& disk)
        : _disk(disk)
    {
    }

    static constexpr const char* home = "/Users/ann";

    std::optional<std::string> homeFolder() const override { return home; }
    platform::FolderListing itemsInFolder(
        std::string_view folder, const platform::ListingRequest& request) const override;
    std::optional<platform::ItemStatus> status(std::string_view path) const override;
    std::optional<platform::ItemStatus> linkStatus(std::string_view path) const override;
    std::optional<std::string> linkTarget(std::string_view path) const override;
    platform::ItemFlags itemFlags(std::string_view path) const override;
    std::string resolvedPath(std::string_view path) const override;
    platform::OpenResult openPlainFile(std::string_view path, platform::PathKnowledge known) const override;

private:
    platform::FolderItem listed(const SimulatedDisk::Item& item, const platform::ListingRequest& request,
        const std::string& folder, platform::FolderListing& listing) const;
    void lookInside(platform::FolderItem& listed, const std::string& path, const platform::ListingRequest& request,
        platform::FolderListing& listing) const;

    const SimulatedDisk& _disk;
};

} // namespace tests
