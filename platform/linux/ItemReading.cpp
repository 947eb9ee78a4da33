#include "platform/linux/ItemReading.h"

#include "platform/PathText.h"
#include "platform/linux/Descriptor.h"

#include <algorithm>
#include <array>
#include <cerrno>

#include <fcntl.h>
#include <sys/stat.h>

namespace platform {

namespace {

    ItemKind kindOfMode(unsigned mode)
    {
        if (S_ISREG(mode))
            return ItemKind::file;
        if (S_ISDIR(mode))
            return ItemKind::folder;
        return S_ISLNK(mode) ? ItemKind::symbolicLink : ItemKind::other;
    }

    ItemStatus statusOfFacts(const struct statx& facts)
    {
        ItemStatus status;
        status.kind = kindOfMode(facts.stx_mode);
        status.size = facts.stx_size;
        status.modificationDate = { facts.stx_mtime.tv_sec, facts.stx_mtime.tv_nsec };
        status.creationDate = status.modificationDate;
        if (facts.stx_mask & STATX_BTIME)
            status.creationDate
                = std::min(status.modificationDate, Date { facts.stx_btime.tv_sec, facts.stx_btime.tv_nsec });
        return status;
    }

    // Sandboxes older than statx(2) refuse it as not permitted, an error that the call itself never has.
    std::optional<ItemStatus> statusWithoutBirthTime(int folder, const char* path, int flags)
    {
        struct stat facts;
        if (uninterrupted([&] { return fstatat(folder, path, &facts, flags); }) == -1)
            return std::nullopt;
        ItemStatus status;
        status.kind = kindOfMode(facts.st_mode);
        status.size = static_cast<std::uint64_t>(facts.st_size);
        status.modificationDate = { facts.st_mtim.tv_sec, static_cast<std::uint32_t>(facts.st_mtim.tv_nsec) };
        status.creationDate = status.modificationDate;
        return status;
    }

    char lowerCase(char byte)
    {
        return byte >= 'A' && byte <= 'Z' ? static_cast<char>(byte - 'A' + 'a') : byte;
    }

    // Equal by simple case folding to `word`, which is of lower-case ASCII letters. Of the letters beyond ASCII two
    // fold to one of ASCII: the Kelvin sign to k and the long s to s.
    bool foldsTo(std::string_view text, std::string_view word)
    {
        constexpr std::string_view kelvinSign = "\u212a";
        constexpr std::string_view longS = "\u017f";
        for (const char letter : word) {
            if (letter == 'k' && text.substr(0, kelvinSign.size()) == kelvinSign)
                text.remove_prefix(kelvinSign.size());
            else if (letter == 's' && text.substr(0, longS.size()) == longS)
                text.remove_prefix(longS.size());
            else if (!text.empty() && lowerCase(text.front()) == letter)
                text.remove_prefix(1);
            else
                return false;
        }
        return text.empty();
    }

    bool isPackageExtension(std::string_view extension)
    {
        constexpr std::array<std::string_view, 5> packages { "app", "bundle", "framework", "plugin", "obplugin" };
        return std::any_of(packages.begin(), packages.end(),
            [extension](std::string_view package) { return foldsTo(extension, package); });
    }

} // namespace

FileProblem problemOfError(int error)
{
    switch (error) {
    case ENOENT:
        return FileProblem::missing;
    case ENOTDIR:
        return FileProblem::notAFolder;
    case EACCES:
    case EPERM:
        return FileProblem::notPermitted;
    case ENAMETOOLONG:
        return FileProblem::pathTooLong;
    case ELOOP:
        return FileProblem::linksInCircles;
    default:
        return FileProblem::readError;
    }
}

std::optional<ItemStatus> readItemStatus(int folder, const char* path, int flags)
{
    struct statx facts;
    const auto ask = [&] { return statx(folder, path, flags, STATX_BASIC_STATS | STATX_BTIME, &facts); };
    if (uninterrupted(ask) == 0)
        return statusOfFacts(facts);
    if (errno == EPERM)
        return statusWithoutBirthTime(folder, path, flags);
    return std::nullopt;
}

ItemFlags flagsOfItem(std::string_view name, ItemKind kind)
{
    ItemFlags flags;
    flags.invisible = !name.empty() && name.front() == '.';
    flags.container = kind == ItemKind::folder;
    flags.package = flags.container && isPackageExtension(extensionOfName(name));
    return flags;
}

} // namespace platform
