#pragma once

#include "platform/common/LinkTable.h"

#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace platform {

/// The application identifier under which a description's editor is registered, the only one there is.
inline constexpr std::string_view describedEditorIdentifier = "org.ombrix.Montaro";

/// A mounted volume as a description tells it.
struct DescribedVolume {
    std::string path; ///< its mount point
    std::string displayName; ///< may be empty; the mount point's last component where the description has none
    std::optional<std::string> fileSystem; ///< as written: the kernel's name of the type or the short one

    friend bool operator==(const DescribedVolume&, const DescribedVolume&) = default;
};

/// What a file says of the machine that programs are to run on. Paths are absolute, with single slashes, without "."
/// and ".." and without a slash at the end.
struct MachineDescription {
    std::optional<std::string> home;
    std::vector<DescribedVolume> localVolumes;
    std::vector<DescribedVolume> removableMedia;
    std::vector<AddedLink> links; ///< in the order of the file; each path once
    std::optional<std::string> editorPath;
};

/// A description, or why there is none.
struct MachineDescriptionResult {
    MachineDescription description;
    std::string problem; ///< one line that begins with the number of the line: "12: …"; empty when read
};

/// The largest description that is read, in bytes.
inline constexpr std::size_t largestMachineDescription = std::size_t { 16 } << 20;

/// Reads a description, a JSON object with the keys home, localVolumes, removableMedia, links and editor, each of which
/// may be left out; `folder` is the absolute path to which relative ones are added. Refuses whatever else it finds:
/// other keys, keys that occur twice, wrong types, empty paths, a link at the root.
MachineDescriptionResult readMachineDescription(std::string_view bytes, std::string_view folder);

} // namespace platform
