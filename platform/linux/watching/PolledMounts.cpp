#include "platform/linux/watching/PolledMounts.h"

#include "platform/PathText.h"

#include <algorithm>
#include <array>
#include <utility>

namespace platform {

namespace {

    bool contains(const auto& texts, std::string_view text)
    {
        return std::find(texts.begin(), texts.end(), text) != texts.end();
    }

    bool isChangedByOthers(std::string_view type)
    {
        constexpr std::array<std::string_view, 24> types { "nfs", "nfs4", "cifs", "smb3", "smbfs", "ncpfs", "9p", "afs",
            "ceph", "coda", "davfs", "lustre", "gfs", "gfs2", "ocfs2", "beegfs", "glusterfs", "orangefs", "pvfs2",
            "virtiofs", "vboxsf", "vmhgfs", "prl_fs", "acfs" };
        constexpr std::string_view fuse = "fuse";
        // "fusectl" is the kernel's own.
        return contains(types, type) || (type.substr(0, fuse.size()) == fuse && type != "fusectl");
    }

    constexpr std::string_view automountType = "autofs";

} // namespace

PolledMounts::PolledMounts(MountTable table, const std::vector<std::string>& furtherTypes)
    : _table(std::move(table))
    , _furtherTypes(furtherTypes)
{
    for (const Mount& mount : _table.mounts()) {
        if (isPolled(mount) || mount.fileSystemType == automountType)
            _namesOfMountPoints.emplace_back(lastPathComponent(mount.mountPoint));
    }
}

bool PolledMounts::isPolled(const Mount& mount) const
{
    return isChangedByOthers(mount.fileSystemType) || contains(_furtherTypes, mount.fileSystemType);
}

bool PolledMounts::holds(std::string_view path) const
{
    const Mount* mount = _namesOfMountPoints.empty() ? nullptr : _table.mountHolding(path);
    return mount && isPolled(*mount);
}

bool PolledMounts::isMountedOnName(std::string_view name) const
{
    return !_namesOfMountPoints.empty() && contains(_namesOfMountPoints, name);
}

std::string_view PolledMounts::typeAt(std::string_view path) const
{
    const Mount* mount = _table.mountHolding(path);
    return mount ? std::string_view(mount->fileSystemType) : std::string_view();
}

std::string PolledMounts::deviceAt(std::string_view path) const
{
    const Mount* mount = _table.mountHolding(path);
    return mount ? std::to_string(mount->device.major) + ':' + std::to_string(mount->device.minor) : std::string();
}

bool PolledMounts::isAutomountPoint(std::string_view path) const
{
    const Mount* mount = _table.mountAt(path);
    return mount && mount->fileSystemType == automountType;
}

std::vector<std::string> changedMountPoints(const MountTable& before, const MountTable& after)
{
    // The kernel gives the number of a mount that is gone to the next one.
    const auto isSame = [](const Mount& one, const Mount& other) {
        return one.mountPoint == other.mountPoint && one.device == other.device && one.root == other.root
            && one.fileSystemType == other.fileSystemType;
    };
    std::vector<std::string> points;
    const auto addThoseMissingIn = [&](const MountTable& table, const MountTable& other) {
        for (const Mount& mount : table.mounts()) {
            const Mount* same = other.mountWithIdentifier(mount.identifier);
            if ((!same || !isSame(*same, mount)) && !contains(points, mount.mountPoint))
                points.push_back(mount.mountPoint);
        }
    };
    addThoseMissingIn(before, after);
    addThoseMissingIn(after, before);
    return points;
}

} // namespace platform
