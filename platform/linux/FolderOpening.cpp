#include "platform/linux/FolderOpening.h"

#include "platform/linux/ItemReading.h"
#include "platform/linux/OpenWithoutLinks.h"
#include "platform/linux/SystemPath.h"

#include <cerrno>
#include <optional>
#include <string>

#include <fcntl.h>
#include <sys/stat.h>

namespace platform {

namespace {

    constexpr int listingFlags = O_RDONLY | O_DIRECTORY | O_CLOEXEC;

    OpenedFolder opened(int number)
    {
        OpenedFolder folder;
        if (number >= 0)
            folder.descriptor = Descriptor(number);
        else
            folder.problem = problemOfError(errno);
        return folder;
    }

    OpenedFolder failed(FileProblem problem)
    {
        OpenedFolder folder;
        folder.problem = problem;
        return folder;
    }

    OpenedFolder openFollowing(int parent, const char* path, int flags)
    {
        return opened(uninterrupted([&] { return openat(parent, path, flags); }));
    }

    // Absent when this kernel or its sandbox does not know the call.
    std::optional<OpenedFolder> openFolderWithoutLinks(int parent, const char* path)
    {
        const int number = openWithoutLinks(parent, path, listingFlags);
        if (number == -1 && (errno == ENOSYS || errno == EPERM))
            return std::nullopt;
        OpenedFolder folder = opened(number);
        if (folder.problem == FileProblem::linksInCircles)
            folder.problem = FileProblem::linkOnTheWay;
        return folder;
    }

    FileProblem problemOfStep(int parent, const char* name)
    {
        const auto status = readItemStatus(parent, name, AT_SYMLINK_NOFOLLOW);
        if (!status)
            return problemOfError(errno);
        if (status->kind == ItemKind::symbolicLink)
            return FileProblem::linkOnTheWay;
        return status->kind == ItemKind::folder ? FileProblem::none : FileProblem::notAFolder;
    }

} // namespace

OpenedFolder openFolder(std::string_view path, LinkPolicy links)
{
    const SystemPath systemPath(path);
    if (!systemPath.isUsable())
        return failed(systemPath.problem());
    if (links == LinkPolicy::follow)
        return openFollowing(AT_FDCWD, systemPath.bytes(), listingFlags);
    if (auto folder = openFolderWithoutLinks(AT_FDCWD, systemPath.bytes()))
        return std::move(*folder);
    return openFolderStepByStep(path);
}

OpenedFolder openFolderIn(int parent, const char* path)
{
    auto folder = openFolderWithoutLinks(parent, path);
    return folder ? std::move(*folder) : failed(FileProblem::linkOnTheWay);
}

OpenedFolder openFolderStepByStep(std::string_view path)
{
    if (const SystemPath systemPath(path); !systemPath.isUsable())
        return failed(systemPath.problem());
    OpenedFolder folder = openFollowing(AT_FDCWD, "/", listingFlags);
    while (folder.problem == FileProblem::none) {
        path.remove_prefix(std::min(path.find_first_not_of('/'), path.size()));
        if (path.empty())
            break;
        const std::string name(path.substr(0, path.find('/')));
        path.remove_prefix(name.size());
        // Only the last one is read; of the others the permission to pass through is enough.
        const bool isLast = path.find_first_not_of('/') == std::string_view::npos;
        const int flags = (isLast ? listingFlags : O_PATH | O_DIRECTORY | O_CLOEXEC) | O_NOFOLLOW;
        const FileProblem problem = problemOfStep(folder.descriptor.number(), name.c_str());
        folder = problem == FileProblem::none ? openFollowing(folder.descriptor.number(), name.c_str(), flags)
                                              : failed(problem);
    }
    return folder;
}

} // namespace platform
