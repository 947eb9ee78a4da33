#pragma once

#include "platform/FileSystem.h"

#include <string>
#include <vector>

namespace tests {

/// A listing as lines to compare, in order of names: the name, the kind unless it is a file, each flag that is set, the
/// marker unless it is absent, and the date where there is one.
std::vector<std::string> linesOf(const platform::FolderListing& listing);

/// One item as such a line.
std::string lineOf(const platform::FolderItem& item);

} // namespace tests
