#pragma once

#include "platform/FileSystem.h"
#include "platform/linux/Descriptor.h"

#include <string_view>

namespace platform {

/// A folder that is open for listing, or why it is not.
struct OpenedFolder {
    Descriptor descriptor {};
    FileProblem problem = FileProblem::none;
};

/// Opens `path` for listing.
OpenedFolder openFolder(std::string_view path, LinkPolicy links);

/// Opens `path`, relative to the open folder `parent`, for listing, no link followed. `linkOnTheWay` also where the
/// system cannot tell whether one is in the way.
OpenedFolder openFolderIn(int parent, const char* path);

/// What `openFolder` does with LinkPolicy::stop on kernels before 5.6 and in sandboxes that refuse openat2(2): opens
/// one component after the other, none of which may be a link. Slower, with the same answers.
OpenedFolder openFolderStepByStep(std::string_view path);

} // namespace platform
