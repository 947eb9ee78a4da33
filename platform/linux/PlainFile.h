#pragma once

#include "platform/FileSystem.h"
#include "platform/linux/Descriptor.h"

#include <cstddef>
#include <span>

namespace platform {

/// A plain file that is open for reading, or why it is not.
struct OpenedFile {
    Descriptor descriptor {};
    ItemStatus status {}; ///< of the open file
    FileProblem problem = FileProblem::none;
};

/// Opens the plain file at `path`, relative to the open folder `folder` (or AT_FDCWD), links followed.
///
/// What is no plain file is not opened at all: opening alone rewinds a tape, starts a watchdog and lets the writer of a
/// pipe go on.
OpenedFile openPlainFileAt(int folder, const char* path);

/// Fills `buffer` from `offset` and answers how many bytes were read: fewer only at the end of the file or when the
/// disk fails.
std::size_t readFully(int file, std::uint64_t offset, std::span<std::byte> buffer);

} // namespace platform
