#pragma once

#include "platform/linux/MountTable.h"

#include <string>
#include <string_view>
#include <vector>

namespace platform {

/// Where the kernel shows its devices; another place in tests.
struct SystemFolders {
    std::string proc = "/proc";
    std::string sys = "/sys";
    std::string dev = "/dev";
};

/// Tells of the block devices below mounted file systems. Any thread. Nothing is opened but files of /sys and links of
/// /dev. Without them nothing is removable and nothing has a label.
class BlockDevices {
public:
    explicit BlockDevices(SystemFolders folders);

    /// Whether `mount` lies on a removable or hot-pluggable device. `table` is asked what holds the file of a loop
    /// device.
    bool isRemovable(const Mount& mount, const MountTable& table) const;

    /// The label that udev found on the device of `mount` (/dev/disk/by-label); empty when it knows none.
    std::string label(const Mount& mount) const;

private:
    std::string systemFolderOf(const Mount& mount) const;
    std::string pathOfSource(std::string_view source) const;
    bool isRemovableDevice(const std::string& folder, const MountTable& table, int depth) const;
    bool isRemovableDisk(const std::string& folder) const;

    SystemFolders _folders;
};

} // namespace platform
