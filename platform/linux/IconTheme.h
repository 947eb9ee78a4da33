#pragma once

#include <optional>
#include <string>
#include <string_view>

namespace platform {

class FileSystem;

/// The picture file for the icon `name`, drawn for a place of 16 by 16 points (Icon Theme Specification 0.13): looked
/// up in the theme that the desktop is set to, in those it inherits from, in hicolor, then among the pixmaps. An
/// absolute path stands for itself. Absent when there is no such file.
std::optional<std::string> iconFile(const FileSystem& files, std::string_view name);

} // namespace platform
