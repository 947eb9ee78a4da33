#pragma once

#include "platform/FileSystem.h"
#include "platform/common/LinkTable.h"

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

namespace platform {

/// Whether a link in the last component of a path is followed.
enum class LastLink : std::uint8_t { followed, kept };

/// Where a path leads on disk.
struct LinkedPlace {
    std::string path; ///< with a problem: as far as it could be told
    /// The added link at `path`, where the last component was to be kept and is one.
    std::optional<AddedLink> link;
    FileProblem problem = FileProblem::none;
};

/// Where `path` leads after every link on the way, added or on disk, component by component. Links in circles give the
/// first of them that the path itself names. What does not exist stays as written; so does a path that is not absolute.
LinkedPlace placeAfterAllLinks(const FileSystem& real, const LinkTable& table, std::string_view path, LastLink last);

/// Where `path` leads after the added links on the way that its text alone tells.
LinkedPlace placeAfterAddedLinks(const FileSystem& real, const LinkTable& table, std::string_view path, LastLink last);

} // namespace platform
