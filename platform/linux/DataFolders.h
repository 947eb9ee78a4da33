#pragma once

#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace platform {

class FileSystem;

/// The folders that hold the desktop's data, the user's own first (XDG Base Directory Specification). Relative ones in
/// the environment do not count.
std::vector<std::string> dataFolders(const FileSystem& files);

/// The folders that hold the desktop's settings, the user's own first.
std::vector<std::string> settingsFolders(const FileSystem& files);

/// The folders in which programs are looked up by their names.
std::vector<std::string> programFolders();

/// The content of the plain file at `path`, at most `sizeAtMost` bytes; absent when it is none, is larger, or cannot be
/// read.
std::optional<std::string> contentOfFile(const FileSystem& files, std::string_view path, std::size_t sizeAtMost);

} // namespace platform
