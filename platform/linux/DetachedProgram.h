#pragma once

#include <string>
#include <vector>

namespace platform {

/// Starts a program that this process neither waits for nor outlives: in a session of its own, with nothing to read and
/// nowhere to write, in `workingFolder`; where that is empty in `/`, so that it keeps no disk from being unmounted. A
/// bare name is looked up in PATH. Where `channel` is a descriptor, the program reads from it and writes to it instead;
/// it stays the caller's.
///
/// Answers why it could not be started; empty when it runs. Blocks until the system has found and begun it.
std::string startDetachedProgram(
    const std::vector<std::string>& arguments, const std::string& workingFolder, int channel = -1);

} // namespace platform
