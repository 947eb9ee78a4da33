#pragma once

#include <string>
#include <string_view>
#include <unordered_set>

namespace platform {

class OpenFile;

/// The name of the file in which a folder lists those of its items that file managers do not show.
inline constexpr std::string_view hiddenNamesFile = ".hidden";

/// The names in such a file, one a line, byte for byte; the last line may lack its line feed. Of a file larger than a
/// folder's worth of names (16 MiB) the beginning counts.
std::unordered_set<std::string> readHiddenNames(const OpenFile& file);

/// Whether file managers do not show an item called `name` in a folder whose list holds `hiddenNames`.
bool isInvisibleName(std::string_view name, const std::unordered_set<std::string>& hiddenNames);

} // namespace platform
