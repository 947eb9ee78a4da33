#include "platform/linux/LinuxVolumes.h"

#include "platform/FileSystem.h"
#include "platform/PathText.h"
#include "platform/common/FileSystemTypeName.h"
#include "platform/linux/MountWatch.h"
#include "platform/linux/SystemPath.h"

#include <algorithm>
#include <array>
#include <cerrno>
#include <utility>

#include <fcntl.h>
#include <linux/fs.h>
#include <sys/ioctl.h>
#include <sys/stat.h>
#include <sys/statfs.h>

namespace platform {

namespace {

    // Asks for what the kernel holds already, so that a disk that sleeps is not woken and a server that is gone not
    // waited for. What cannot be looked at (another user's FUSE volume) is taken for the folder that it nearly always
    // is.
    bool isFolder(const std::string& mountPoint)
    {
        struct statx facts;
        constexpr int flags = AT_STATX_DONT_SYNC | AT_NO_AUTOMOUNT | AT_SYMLINK_NOFOLLOW;
        if (uninterrupted([&] { return statx(AT_FDCWD, mountPoint.c_str(), flags, STATX_TYPE, &facts); }) == -1)
            return errno != ENOENT && errno != ENOTDIR;
        return S_ISDIR(facts.stx_mode);
    }

    std::vector<const Mount*> localMounts(const MountTable& table)
    {
        std::vector<const Mount*> mounts;
        for (const Mount& mount : table.mounts()) {
            if (isLocalVolume(mount) && isFolder(mount.mountPoint))
                mounts.push_back(&mount);
        }
        return mounts;
    }

    // What the file system itself has been told that it is called (ioctl_fslabel(2)). FUSE passes the question on to a
    // program that may not answer, and does not know it anyway.
    std::string labelInFileSystem(const Mount& mount)
    {
        if (mount.fileSystemType.substr(0, 4) == "fuse")
            return {};
        constexpr int flags = O_RDONLY | O_DIRECTORY | O_CLOEXEC | O_NOFOLLOW;
        const Descriptor folder(uninterrupted([&] { return open(mount.mountPoint.c_str(), flags); }));
        std::array<char, FSLABEL_MAX + 1> label {};
        if (!folder.isOpen() || ioctl(folder.number(), FS_IOC_GETFSLABEL, label.data()) == -1)
            return {};
        return label.data();
    }

    // The kernel's numbers for the file systems that a person may meet (statfs(2)), for want of a mount table.
    std::string_view typeNameOfMagic(std::uint32_t magic)
    {
        struct Name {
            std::uint32_t magic;
            std::string_view name;
        };
        constexpr std::array<Name, 20> names { { { 0xef53, "ext4" }, { 0x9123683e, "btrfs" }, { 0x58465342, "xfs" },
            { 0x01021994, "tmpfs" }, { 0x794c7630, "overlay" }, { 0x4d44, "msdos" }, { 0x5346544e, "ntfs" },
            { 0x7366746e, "ntfs3" }, { 0x6969, "nfs" }, { 0x65735546, "fuse" }, { 0x15013346, "udf" },
            { 0x2011bab0, "exfat" }, { 0x9660, "iso9660" }, { 0x9fa0, "proc" }, { 0x62656572, "sysfs" },
            { 0x73717368, "squashfs" }, { 0x2fc12fc1, "zfs" }, { 0xff534d42, "cifs" }, { 0xfe534d42, "smb2" },
            { 0xf2f52010, "f2fs" } } };
        const auto* found = std::find_if(
            names.begin(), names.end(), [magic](const Name& candidate) { return candidate.magic == magic; });
        return found == names.end() ? std::string_view("unknown") : found->name;
    }

    // Which mount a path lies on is the kernel's to know, since 5.8; before, the mount points tell.
    const Mount* mountOfPath(const MountTable& table, const SystemPath& path, std::string_view realPath)
    {
#ifdef STATX_MNT_ID
        struct statx facts;
        const auto ask = [&] { return statx(AT_FDCWD, path.bytes(), AT_SYMLINK_NOFOLLOW, STATX_MNT_ID, &facts); };
        if (uninterrupted(ask) == 0 && (facts.stx_mask & STATX_MNT_ID)) {
            if (const Mount* mount = table.mountWithIdentifier(facts.stx_mnt_id))
                return mount;
        }
#endif
        return table.mountHolding(realPath);
    }

} // namespace

LinuxVolumes::LinuxVolumes(const FileSystem& fileSystem, SystemFolders folders)
    : _fileSystem(fileSystem)
    , _folders(std::move(folders))
    , _devices(_folders)
{
}

std::vector<std::string> LinuxVolumes::localVolumes() const
{
    const MountTable table = MountTable::read(_folders.proc);
    std::vector<std::string> volumes;
    for (const Mount* mount : localMounts(table))
        volumes.push_back(mount->mountPoint);
    if (std::find(volumes.begin(), volumes.end(), "/") == volumes.end())
        volumes.insert(volumes.begin(), "/");
    return volumes;
}

std::vector<std::string> LinuxVolumes::removableMedia() const
{
    const MountTable table = MountTable::read(_folders.proc);
    std::vector<std::string> media;
    for (const Mount* mount : localMounts(table)) {
        if (_devices.isRemovable(*mount, table))
            media.push_back(mount->mountPoint);
    }
    return media;
}

std::string LinuxVolumes::displayName(std::string_view path) const
{
    path = pathWithoutTrailingSlashes(path);
    const MountTable table = MountTable::read(_folders.proc);
    const Mount* mount = table.mountAt(path);
    // Other mounts are no volumes to a person; an automount point must not even be touched.
    std::string label = mount && isLocalVolume(*mount) ? labelOf(*mount) : std::string();
    return label.empty() ? std::string(lastPathComponent(path)) : label;
}

std::string LinuxVolumes::labelOf(const Mount& mount) const
{
    std::string label = _devices.label(mount);
    return label.empty() ? labelInFileSystem(mount) : label;
}

std::optional<std::string> LinuxVolumes::fileSystemType(std::string_view path) const
{
    const std::string realPath = _fileSystem.resolvedPath(path);
    const SystemPath systemPath(realPath);
    struct statfs facts;
    if (!systemPath.isUsable() || uninterrupted([&] { return statfs(systemPath.bytes(), &facts); }) == -1)
        return std::nullopt;
    const MountTable table = MountTable::read(_folders.proc);
    const Mount* mount = mountOfPath(table, systemPath, realPath);
    const auto magic = static_cast<std::uint32_t>(facts.f_type);
    return std::string(shortFileSystemTypeName(mount ? mount->fileSystemType : typeNameOfMagic(magic)));
}

std::uint64_t LinuxVolumes::generation() const
{
    Locked guard(_lock);
    if (!_openTable.isOpen()) {
        _openTable = MountTable::open(_folders.proc);
        if (!_openTable.isOpen())
            return 0;
        ++_generation;
    }
    if (MountTable::hasChanged(_openTable.number()))
        ++_generation;
    return _generation;
}

std::shared_ptr<void> LinuxVolumes::watchMounts(const std::function<void()>& changed) const
{
    Locked guard(_lock);
    if (const std::shared_ptr<MountWatch> current = _mountWatch.lock()) {
        if (auto taker = MountWatch::add(current, changed))
            return taker;
    }
    const std::shared_ptr<MountWatch> fresh = MountWatch::open(_folders.proc);
    _mountWatch = fresh;
    return fresh ? MountWatch::add(fresh, changed) : nullptr;
}

} // namespace platform
