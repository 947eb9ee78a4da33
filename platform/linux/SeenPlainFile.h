#pragma once

#include "platform/linux/PlainFile.h"

namespace platform {

/// Opens the plain file at the absolute `path`, which was seen to be one and to hold no link, without looking a second
/// time beforehand. Where that has changed meanwhile, and where the system cannot tell, as `openPlainFileAt`.
OpenedFile openSeenPlainFile(const char* path);

} // namespace platform
