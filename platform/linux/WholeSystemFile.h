#pragma once

#include <cstddef>
#include <string>

namespace platform {

/// What the open file `file`, whose size is known only at its end, still holds: at most `sizeAtMost` bytes of it.
std::string readToEnd(int file, std::size_t sizeAtMost);

/// The content of one of the kernel's files (/proc, /sys), likewise. Empty when it cannot be read.
std::string readWholeSystemFile(const std::string& path, std::size_t sizeAtMost);

} // namespace platform
