#pragma once

#include <cstddef>
#include <string>

namespace platform {

class OpenFile;

/// The bytes of `file` from its start, at most `limit` of them; fewer when the disk fails. A size that the file only
/// claims to have costs no memory.
std::string readBytes(const OpenFile& file, std::size_t limit);

} // namespace platform
