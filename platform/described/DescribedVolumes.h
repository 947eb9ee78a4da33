#pragma once

#include "platform/Volumes.h"
#include "platform/described/MachineDescription.h"

#include <vector>

namespace platform {

class FileSystem;

/// The volumes that a description lists. Any thread.
class DescribedVolumes : public Volumes {
public:
    /// `files`, the described machine's own, and `base`, which is asked for types that the description leaves out,
    /// outlive this object.
    DescribedVolumes(const MachineDescription& description, const FileSystem& files, const Volumes& base);

    std::vector<std::string> localVolumes() const override;
    std::vector<std::string> removableMedia() const override;
    std::string displayName(std::string_view path) const override;
    /// A path belongs to the volume with the longest mount point above its real path. Mount points are taken as real
    /// paths too, so that what is served from elsewhere through a link has the type that the description gave it.
    std::optional<std::string> fileSystemType(std::string_view path) const override;
    std::uint64_t generation() const override { return 1; }

private:
    std::optional<std::string> describedTypeOfRealPath(std::string_view realPath) const;

    std::vector<DescribedVolume> _volumes; ///< the local ones, then the removable ones
    std::size_t _localCount;
    const FileSystem& _files;
    const Volumes& _base;
};

} // namespace platform
