#pragma once

#include "platform/linux/Descriptor.h"

#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace platform {

/// Major and minor number of a device, as the kernel writes them.
struct DeviceNumber {
    unsigned major = 0;
    unsigned minor = 0;

    friend bool operator==(const DeviceNumber&, const DeviceNumber&) = default;
};

/// One line of the kernel's mount table (proc(5), /proc/PID/mountinfo). Texts are bytes, escapes undone.
struct Mount {
    std::uint64_t identifier = 0;
    std::uint64_t parent = 0;
    DeviceNumber device;
    std::string root; ///< the part of the file system that is mounted; "/" for the whole
    std::string mountPoint;
    std::string fileSystemType;
    std::string source;
    std::string superOptions;
};

/// The lines of `text` that are whole, in their order. Damaged lines are left out.
std::vector<Mount> parseMountTable(std::string_view text);

/// What is mounted, as it stood at one moment. A value.
class MountTable {
public:
    MountTable() = default;
    /// `mounts` in the kernel's order.
    explicit MountTable(const std::vector<Mount>& mounts);

    /// Reads the table of this process from `procFolder`; empty when it cannot be read.
    static MountTable read(const std::string& procFolder);
    /// For `hasChanged`; not open where there is no table.
    static Descriptor open(const std::string& procFolder);

    /// Whether anything was mounted or unmounted since the table was opened as `openTable`, or since this was last
    /// asked.
    static bool hasChanged(int openTable);

    /// The mounts that a path can reach, in mount order: without those that a later mount covers, at the same point or
    /// above it. Mount points occur once.
    const std::vector<Mount>& mounts() const noexcept { return _mounts; }

    /// The mount at exactly `mountPoint`, or null.
    const Mount* mountAt(std::string_view mountPoint) const;
    /// The mount that holds `path`, absolute and without links: the one with the longest mount point above it, or null.
    const Mount* mountHolding(std::string_view path) const;
    /// The mount that the kernel gave `identifier`, or null.
    const Mount* mountWithIdentifier(std::uint64_t identifier) const;

private:
    std::vector<Mount> _mounts;
};

/// Whether a person would call what is mounted there a disk: on a block device, of FUSE or of ZFS, mounted whole (or as
/// a subvolume of btrfs), and none of the system's own. Looks at the line only; touches nothing.
bool isLocalVolume(const Mount& mount);

} // namespace platform
