#pragma once

#include "platform/ThreadSafety.h"
#include "platform/Volumes.h"
#include "platform/linux/BlockDevices.h"
#include "platform/linux/Descriptor.h"
#include "platform/linux/MountTable.h"

namespace platform {

class FileSystem;
class MountWatch;

/// What the kernel has mounted, read afresh at every call. Any thread.
class LinuxVolumes : public Volumes {
public:
    /// `fileSystem` says where the paths of questions really lead, and outlives this object; it is asked for nothing
    /// while it is being constructed.
    explicit LinuxVolumes(const FileSystem& fileSystem, SystemFolders folders = {});

    std::vector<std::string> localVolumes() const override;
    std::vector<std::string> removableMedia() const override;
    std::string displayName(std::string_view path) const override;
    std::optional<std::string> fileSystemType(std::string_view path) const override;
    /// Counts the changes of the mount table. A label that is written anew while its volume stays mounted does not
    /// count.
    std::uint64_t generation() const override EXCLUDES(_lock);
    /// What happens within a twentieth of a second is told once.
    std::shared_ptr<void> watchMounts(const std::function<void()>& changed) const override EXCLUDES(_lock);

private:
    std::string labelOf(const Mount& mount) const;

    const FileSystem& _fileSystem;
    const SystemFolders _folders;
    const BlockDevices _devices;
    mutable Mutex _lock;
    mutable Descriptor _openTable GUARDED_BY(_lock);
    mutable std::uint64_t _generation GUARDED_BY(_lock) = 0;
    mutable std::weak_ptr<MountWatch> _mountWatch GUARDED_BY(_lock);
};

} // namespace platform
