#pragma once

#include "platform/FileSystem.h"

#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

namespace ombrix {

/// Whether a folder that a source searches can be: `missing` where nothing is there, `notPermitted` also where its
/// names may be listed but nothing in it may be looked at.
platform::FileProblem searchProblem(const platform::FileSystem& fileSystem, std::string_view folder);

/// That in the words of a list: "exists", "absent", "not a folder", "not readable: …".
std::string searchStateText(platform::FileProblem problem);

/// How many of some folders are there, and how many of those cannot be read.
struct SearchFolderCounts {
    std::size_t existing = 0;
    std::size_t absent = 0;
    std::size_t unreadable = 0;
};

SearchFolderCounts countSearchFolders(const platform::FileSystem& fileSystem, const std::vector<std::string>& folders);

} // namespace ombrix
