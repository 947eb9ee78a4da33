#pragma once

#include <string>

namespace platform {

class OpenFile;

/// Why the loader must not be given `file`: that it is no shared library for this machine (ELF, elf(5)), or is cut
/// short, which the loader itself finds out by crashing. Empty when it may be loaded.
std::string problemOfSharedLibrary(const OpenFile& file);

} // namespace platform
