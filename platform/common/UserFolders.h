#pragma once

#include <optional>
#include <string>
#include <string_view>

namespace platform {

class FileSystem;

/// The folder that the desktop's user keeps things of one kind in, as `user-dirs.dirs` in `settingsFolder` tells it
/// (xdg-user-dirs): absolute, without a slash at its end. `variable` is such as "XDG_VIDEOS_DIR". Absent where nothing
/// is told, or the home folder itself, which stands for none.
std::optional<std::string> userFolder(
    const FileSystem& files, std::string_view settingsFolder, std::string_view variable);

} // namespace platform
