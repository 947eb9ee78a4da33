#pragma once

#include "platform/Platform.h"
#include "platform/Text.h"

#include <string>
#include <string_view>
#include <vector>

/// The folders called `folderName` that may hold a library, in the order in which they are searched: the default one
/// where it is known, one a local volume (by display name), the one at the top of the boot volume, one a removable
/// medium (by path). Whether they exist is not asked, and a volume that is listed twice is searched twice.
std::vector<platform::Text> foldersToSearch(
    const platform::Platform& platform, const platform::Text& defaultFolder, std::string_view folderName);

/// The folder called `folderName` on the volume with this display name, below the fixed root of all volumes.
platform::Text folderOnVolume(std::string_view displayName, std::string_view folderName);

/// The folder called `folderName` in the user's folder of movies; absent while no home folder is known.
platform::Text folderInMovies(const platform::Platform& platform, std::string_view folderName);

/// The same texts for whoever takes strings.
std::vector<std::string> stringsOf(const std::vector<platform::Text>& texts);
