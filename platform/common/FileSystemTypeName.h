#pragma once

#include <algorithm>
#include <array>
#include <string_view>

namespace platform {

/// The platform's short name for the file system type that the kernel, or whoever describes a machine, calls
/// `kernelName`: one for all drivers of FAT, of NTFS, of NFS and of WebDAV. A FUSE file system goes by the name after
/// "fuse."; on a block device it is taken for NTFS, the driver that is mounted so. exFAT is no FAT. What has no short
/// name keeps its own.
constexpr std::string_view shortFileSystemTypeName(std::string_view kernelName) noexcept
{
    struct ShortName {
        std::string_view kernelName;
        std::string_view shortName;
    };
    constexpr std::array<ShortName, 13> shortNames { {
        { "fat", "msdos" },
        { "vfat", "msdos" },
        { "msdos", "msdos" },
        { "umsdos", "msdos" },
        { "ntfs", "ntfs" },
        { "ntfs3", "ntfs" },
        { "ntfs-3g", "ntfs" },
        { "fuseblk", "ntfs" },
        { "nfs", "nfs" },
        { "nfs3", "nfs" },
        { "nfs4", "nfs" },
        { "davfs", "webdav" },
        { "davfs2", "webdav" },
    } };
    constexpr std::string_view fusePrefix = "fuse.";
    if (kernelName.substr(0, fusePrefix.size()) == fusePrefix)
        kernelName.remove_prefix(fusePrefix.size());
    const auto* entry = std::find_if(shortNames.begin(), shortNames.end(),
        [kernelName](const ShortName& candidate) { return candidate.kernelName == kernelName; });
    return entry == shortNames.end() ? kernelName : entry->shortName;
}

} // namespace platform
