#pragma once

#include <cstdint>
#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace platform {

/// What is mounted, as a person would name it. Any thread; may block while a disk does not answer. None throws.
class Volumes {
public:
    virtual ~Volumes() = default;

    /// The mount points of the mounted file systems that a person would call a disk, in mount order, `/` included.
    virtual std::vector<std::string> localVolumes() const = 0;

    /// The mount points of those of them that lie on a removable or hot-pluggable device, in mount order.
    virtual std::vector<std::string> removableMedia() const = 0;

    /// The name a person sees for `path`: of a mounted volume its label, else the last component of its mount point; of
    /// any other path its last component.
    virtual std::string displayName(std::string_view path) const = 0;

    /// The short name of the type of file system that holds `path`: `msdos` for every FAT, `ntfs` for every NTFS
    /// driver, `nfs` for every NFS version, `webdav`, `udf`; else the kernel's name. Absent when `path` does not exist.
    virtual std::optional<std::string> fileSystemType(std::string_view path) const = 0;

    /// A number that is another one whenever the lists or the names may have changed since it was last asked for, so
    /// that whoever keeps them need not read them again; 0 where that cannot be told. Cheap.
    virtual std::uint64_t generation() const { return 0; }

    /// Calls `changed` after anything was mounted or unmounted, on a thread of its own, until the answer is destroyed.
    /// Null where that never happens or cannot be noticed. No call is on its way once the answer has been destroyed,
    /// unless that happens inside `changed`.
    virtual std::shared_ptr<void> watchMounts(const std::function<void()>& changed) const
    {
        static_cast<void>(changed);
        return nullptr;
    }
};

} // namespace platform
