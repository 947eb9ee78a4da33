#include "tests/support/FaultyFileSystem.h"

namespace tests {

using platform::FileProblem;

void FaultyFileSystem::tell(std::string_view path) const
{
    if (onEachCall)
        onEachCall(path);
}

bool FaultyFileSystem::isThere(std::string_view path) const
{
    return !whenAskedForStatus || whenAskedForStatus(path);
}

platform::FolderListing FaultyFileSystem::itemsInFolder(
    std::string_view folder, const platform::ListingRequest& request) const
{
    tell(folder);
    const FileProblem problem = whenListing ? whenListing(folder) : FileProblem::none;
    // Each folder is asked for by itself, so that each can fail.
    platform::ListingRequest alone = request;
    alone.subfolder = {};
    return problem == FileProblem::none ? _real.itemsInFolder(folder, alone) : platform::FolderListing(problem);
}

std::optional<platform::ItemStatus> FaultyFileSystem::status(std::string_view path) const
{
    tell(path);
    return isThere(path) ? _real.status(path) : std::nullopt;
}

std::optional<platform::ItemStatus> FaultyFileSystem::linkStatus(std::string_view path) const
{
    tell(path);
    return isThere(path) ? _real.linkStatus(path) : std::nullopt;
}

std::optional<std::string> FaultyFileSystem::linkTarget(std::string_view path) const
{
    tell(path);
    return _real.linkTarget(path);
}

platform::ItemFlags FaultyFileSystem::itemFlags(std::string_view path) const
{
    tell(path);
    return _real.itemFlags(path);
}

std::string FaultyFileSystem::resolvedPath(std::string_view path) const
{
    tell(path);
    return _real.resolvedPath(path);
}

platform::OpenResult FaultyFileSystem::openPlainFile(std::string_view path, platform::PathKnowledge known) const
{
    tell(path);
    const FileProblem problem = whenOpening ? whenOpening(path) : FileProblem::none;
    if (problem != FileProblem::none)
        return { nullptr, problem };
    return _real.openPlainFile(path, known);
}

} // namespace tests
