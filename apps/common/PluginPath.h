#pragma once

#include "platform/FileSystem.h"

#include <string>
#include <vector>

namespace apps {

/// The folders of bundles that OMBRIX_PLUGIN_PATH names, absolute, in order.
std::vector<std::string> foldersOfPluginPath();

/// What leads nowhere of what OMBRIX_PLUGIN_PATH names: one line each, which names the place and says why.
std::vector<std::string> problemsOfPluginPath(const platform::FileSystem& fileSystem);

} // namespace apps
