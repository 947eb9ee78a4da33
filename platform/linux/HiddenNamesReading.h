#pragma once

#include "platform/common/HiddenNames.h"

namespace platform {

/// Those of the open folder `folder`; none where it has no `.hidden` that is a plain file, or a link to one.
HiddenNames readHiddenNames(int folder);

} // namespace platform
