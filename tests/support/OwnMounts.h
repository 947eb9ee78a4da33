#pragma once

#include <string>

namespace tests {

/// Gives this process, which has one thread, mounts of its own that nobody else sees: with root's rights, or with those
/// that anybody has among mounts of his own. False where the system refuses both.
bool enterOwnMounts();

/// Whether a file system in memory is now mounted at the folder `path`.
bool mountMemory(const std::string& path);

/// Takes from this process, which has one thread, what lets root read and enter everything; harmless without it.
void giveUpReadingEverything();

} // namespace tests
