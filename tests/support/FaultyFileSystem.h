#pragma once

#include "platform/FileSystem.h"

#include <functional>

namespace tests {

/// Passes every call on to another file system, except those that a test breaks.
///
/// A test sets the hooks before other threads come in; a hook is called before the call is passed on, on the thread
/// that asks. It may block, count, or change the disk.
class FaultyFileSystem : public platform::FileSystem {
public:
    /// `real` outlives this object.
    explicit FaultyFileSystem(const platform::FileSystem& real)
        : _real(real)
    {
    }

    /// The problem with which listing this folder fails; `none` lets the call through.
    std::function<platform::FileProblem(std::string_view folder)> whenListing {};
    /// The problem with which opening this file fails; `none` lets the call through.
    std::function<platform::FileProblem(std::string_view path)> whenOpening {};
    /// False makes the item at the path missing for `status` and `linkStatus`.
    std::function<bool(std::string_view path)> whenAskedForStatus {};
    /// Called before any call about a path.
    std::function<void(std::string_view path)> onEachCall {};

    std::optional<std::string> homeFolder() const override { return _real.homeFolder(); }
    platform::FolderListing itemsInFolder(
        std::string_view folder, const platform::ListingRequest& request) const override;
    std::optional<platform::ItemStatus> status(std::string_view path) const override;
    std::optional<platform::ItemStatus> linkStatus(std::string_view path) const override;
    std::optional<std::string> linkTarget(std::string_view path) const override;
    platform::ItemFlags itemFlags(std::string_view path) const override;
    std::string resolvedPath(std::string_view path) const override;
    platform::OpenResult openPlainFile(
        std::string_view path, platform::PathKnowledge known = platform::PathKnowledge::none) const override;

private:
    void tell(std::string_view path) const;
    bool isThere(std::string_view path) const;

    const platform::FileSystem& _real;
};

} // namespace tests
