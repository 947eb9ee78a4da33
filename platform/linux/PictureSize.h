#pragma once

#include "platform/Value.h"

#include <string_view>

namespace platform {

/// The natural size of a picture in SVG: width and height of its outermost element in units of its own or pixels, else
/// those of its `viewBox`. Zero when it does not tell.
Size sizeOfVectorPicture(std::string_view text);

} // namespace platform
