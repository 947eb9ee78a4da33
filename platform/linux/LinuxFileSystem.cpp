#include "platform/linux/LinuxFileSystem.h"

#include "platform/PathText.h"
#include "platform/common/LexicalPath.h"
#include "platform/linux/Descriptor.h"
#include "platform/linux/FolderOpening.h"
#include "platform/linux/FolderReading.h"
#include "platform/linux/HiddenNamesReading.h"
#include "platform/linux/ItemReading.h"
#include "platform/linux/PathResolution.h"
#include "platform/linux/PlainFile.h"
#include "platform/linux/SeenPlainFile.h"
#include "platform/linux/SystemPath.h"

#include <algorithm>
#include <cerrno>
#include <cstdlib>
#include <vector>

#include <fcntl.h>
#include <linux/limits.h>
#include <pwd.h>
#include <unistd.h>

namespace platform {

namespace {

    bool isAbsolute(const char* path)
    {
        return path && path[0] == '/';
    }

    std::optional<std::string> homeInUserDatabase()
    {
        constexpr std::size_t sizeAtMost = 1 << 20;
        for (std::vector<char> buffer(4096); buffer.size() <= sizeAtMost; buffer.resize(buffer.size() * 4)) {
            passwd entry {};
            passwd* found = nullptr;
            const int error = getpwuid_r(getuid(), &entry, buffer.data(), buffer.size(), &found);
            if (error == EINTR || error == ERANGE)
                continue;
            if (error != 0 || !found || !isAbsolute(found->pw_dir))
                break;
            return found->pw_dir;
        }
        return std::nullopt;
    }

    std::optional<ItemStatus> statusAt(std::string_view path, int flags)
    {
        const SystemPath systemPath(path);
        if (!systemPath.isUsable())
            return std::nullopt;
        return readItemStatus(AT_FDCWD, systemPath.bytes(), flags);
    }

    class LinuxOpenFile : public OpenFile {
    public:
        explicit LinuxOpenFile(OpenedFile file)
            : _file(std::move(file))
        {
        }
        ItemStatus status() const override { return _file.status; }
        std::size_t read(std::uint64_t offset, std::span<std::byte> buffer) const override
        {
            // Asked for no more than there is, the system need not be asked again where the file ends.
            const std::uint64_t rest = _file.status.size - std::min(offset, _file.status.size);
            const std::size_t length = static_cast<std::size_t>(std::min<std::uint64_t>(rest, buffer.size()));
            return readFully(_file.descriptor.number(), offset, buffer.first(length));
        }

    private:
        OpenedFile _file;
    };

    // Only passed through, which needs no permission to list it.
    Descriptor folderToLookIn(std::string_view path)
    {
        const SystemPath systemPath(path);
        const auto open = [&] { return ::open(systemPath.bytes(), O_PATH | O_DIRECTORY | O_CLOEXEC); };
        return Descriptor(systemPath.isUsable() ? uninterrupted(open) : -1);
    }

    // "/a/b/." and "/a/b/" name the item b of /a.
    std::string_view pathOfItem(std::string_view path)
    {
        path = pathWithoutTrailingSlashes(path);
        while (path.size() > 2 && path.substr(path.size() - 2) == "/.")
            path = pathWithoutTrailingSlashes(path.substr(0, path.size() - 1));
        return path;
    }

} // namespace

std::optional<std::string> LinuxFileSystem::homeFolder() const
{
    if (const char* home = std::getenv("HOME"); isAbsolute(home))
        return home;
    return homeInUserDatabase();
}

FolderListing LinuxFileSystem::itemsInFolder(std::string_view folder, const ListingRequest& request) const
{
    const OpenedFolder opened = openFolder(folder, request.links);
    if (opened.problem != FileProblem::none)
        return FolderListing(opened.problem);
    const bool pathIsReal
        = request.links == LinkPolicy::stop && isLexicallyNormalised(folder) && !hasDotComponent(folder);
    // What lies too deep to be named by its whole path is not to be reached from here either.
    ListingRequest reachable = request;
    if (!pathIsReal || folder == "/" || folder.size() + request.markerBeside.size() + 1 >= PATH_MAX)
        reachable.markerBeside = {};
    if (folder.size() + NAME_MAX + request.subfolder.size() + 2 >= PATH_MAX)
        reachable.subfolder = {};
    FolderListing listing = readOpenFolder(opened.descriptor.number(), reachable);
    listing.setPathIsReal(pathIsReal);
    return listing;
}

std::optional<ItemStatus> LinuxFileSystem::status(std::string_view path) const
{
    return statusAt(path, 0);
}

std::optional<ItemStatus> LinuxFileSystem::linkStatus(std::string_view path) const
{
    return statusAt(path, AT_SYMLINK_NOFOLLOW);
}

std::optional<std::string> LinuxFileSystem::linkTarget(std::string_view path) const
{
    const SystemPath systemPath(path);
    return systemPath.isUsable() ? readLink(AT_FDCWD, systemPath.bytes()) : std::nullopt;
}

ItemFlags LinuxFileSystem::itemFlags(std::string_view path) const
{
    path = pathOfItem(path);
    const std::string name(lastPathComponent(path));
    const Descriptor folder = folderToLookIn(pathByRemovingLastComponent(path));
    if (!folder.isOpen() || path.find('\0') != std::string_view::npos)
        return {};
    const auto status = readItemStatus(folder.number(), name.c_str(), AT_SYMLINK_NOFOLLOW);
    if (!status)
        return {};
    ItemFlags flags = flagsOfItem(name, status->kind);
    if (name == "..")
        flags.invisible = flags.package = false;
    else if (!flags.invisible && name != "/")
        flags.invisible = readHiddenNames(folder.number()).hide(name);
    return flags;
}

std::string LinuxFileSystem::resolvedPath(std::string_view path) const
{
    return pathWithLinksResolved(path);
}

OpenResult LinuxFileSystem::openPlainFile(std::string_view path, PathKnowledge known) const
{
    const SystemPath systemPath(path);
    if (!systemPath.isUsable())
        return { nullptr, systemPath.problem() };
    OpenedFile file = known == PathKnowledge::realPlainFile ? openSeenPlainFile(systemPath.bytes())
                                                            : openPlainFileAt(AT_FDCWD, systemPath.bytes());
    if (file.problem != FileProblem::none)
        return { nullptr, file.problem };
    return { std::make_unique<LinuxOpenFile>(std::move(file)), FileProblem::none };
}

} // namespace platform
