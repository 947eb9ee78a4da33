#pragma once

#include "platform/ThreadSafety.h"

#include <cstdint>
#include <functional>
#include <map>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace platform {

class FileSystem;
class Volumes;

/// A symbolic link that the machine adds to those on disk. Both paths are absolute and without a slash at the end.
struct AddedLink {
    std::string path;
    std::string target;
};

/// Where a machine adds links: at paths that were named one by one, and at "/Volumes/NAME" for every mounted volume
/// that a person sees as NAME.
///
/// A named link wins over a volume's; of two volumes with one name the first wins, local volumes before removable
/// media; a folder that really stands at "/Volumes/NAME" wins over a volume. Volumes are asked only about paths below
/// "/Volumes", and only when they may have changed. Any thread.
class LinkTable {
public:
    /// `volumes` and `real`, the file system without added links, outlive the table.
    LinkTable(const std::vector<AddedLink>& links, const Volumes& volumes, const FileSystem& real);

    /// Whether links were named. Without any, what is really on disk is always right where it exists.
    bool hasNamedLinks() const noexcept { return !_links.empty(); }

    /// Whether a link could stand at `path` or above it; false costs nothing.
    bool mayApplyTo(std::string_view path) const noexcept;

    /// The link at `path` or, failing that, the nearest above it. `path` is absolute, single slashes, none at its end.
    std::optional<AddedLink> linkAtOrAbove(std::string_view path) const;

    /// Whether a link was named anywhere below `folder`.
    bool hasNamedLinkBelow(std::string_view folder) const;

    /// The names of the links directly in `folder`, in no order.
    std::vector<std::string> namesInFolder(std::string_view folder) const;

    /// The names of the items directly in `folder` in which a named link called `entry` stands, in no order.
    std::vector<std::string> namesOfHolders(std::string_view folder, std::string_view entry) const;

private:
    struct VolumeLinks {
        std::uint64_t generation = 0;
        std::vector<AddedLink> links;
    };

    template <class Take> void forEachNamedLinkBelow(std::string_view folder, const Take& take) const;
    std::shared_ptr<const VolumeLinks> volumeLinks() const;
    std::optional<AddedLink> volumeLinkAtOrAbove(std::string_view path) const;
    bool isInEffect(const AddedLink& volumeLink) const;

    const std::map<std::string, std::string, std::less<>> _links;
    const Volumes& _volumes;
    const FileSystem& _real;
    mutable Mutex _lock;
    mutable std::shared_ptr<const VolumeLinks> _volumeLinks GUARDED_BY(_lock);
};

} // namespace platform
