#pragma once

#include "platform/linux/MountTable.h"

#include <string>
#include <string_view>
#include <vector>

namespace platform {

/// Which mounts hold file systems whose changes the kernel is not told of, because others make them: those of the
/// network, and FUSE. A value. Nothing is touched to tell.
class PolledMounts {
public:
    /// None.
    PolledMounts() = default;
    /// Those of `table`, and those whose type is one of `furtherTypes`.
    PolledMounts(MountTable table, const std::vector<std::string>& furtherTypes);

    /// Whether `path`, a real path, lies on one of them.
    bool holds(std::string_view path) const;
    /// Whether one of them is mounted on a folder called `name`; costs next to nothing where there is none.
    bool isMountedOnName(std::string_view name) const;
    /// The kernel's name for the type of file system that holds `path`, and its device; empty where that is not known.
    std::string_view typeAt(std::string_view path) const;
    std::string deviceAt(std::string_view path) const;
    /// Whether looking at `path` would have something mounted there.
    bool isAutomountPoint(std::string_view path) const;

    const MountTable& table() const noexcept { return _table; }

private:
    bool isPolled(const Mount& mount) const;

    MountTable _table;
    std::vector<std::string> _furtherTypes;
    std::vector<std::string> _namesOfMountPoints;
};

/// The mount points that are in one of the tables alone, or hold another mount there than in the other one.
std::vector<std::string> changedMountPoints(const MountTable& before, const MountTable& after);

} // namespace platform
