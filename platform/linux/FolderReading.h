#pragma once

#include "platform/FileSystem.h"

namespace platform {

/// Lists the folder that is open as `folder`, and answers what `request` asks of each item, relative to it.
FolderListing readOpenFolder(int folder, const ListingRequest& request);

} // namespace platform
