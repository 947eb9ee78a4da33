#pragma once

#include <optional>
#include <string>
#include <string_view>

namespace ombrix {

/// Absolute, as the shell names the working folder, "." and ".." taken out as text; no link is looked at. The empty
/// path stays empty; absent where there is no current folder.
std::optional<std::string> absolutePath(const std::string& path);

/// Why there is none.
inline constexpr std::string_view noCurrentFolder = "it is relative, and there is no current folder";

/// Makes / the working folder, so that no volume is held by a program that runs for long. Relative paths lead elsewhere
/// from then on.
void leaveWorkingFolder();

} // namespace ombrix
