#pragma once

#include "platform/linux/PlainFile.h"

namespace platform {

/// Opens the plain file at the absolute `path`, which was seen to be one and to hold no link, without looking a second
/// time beforehand. `linkOnTheWay` where a link is in the way now, or where the system cannot tell.
OpenedFile openSeenPlainFile(const char* path);

} // namespace platform
