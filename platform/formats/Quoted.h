#pragma once

#include <string>
#include <string_view>

namespace platform {

/// `text` in double quotes, fit to stand in a one-line message: control characters and bytes that are no UTF-8 become
/// U+FFFD, and what is longer than 80 bytes is cut, with an ellipsis.
std::string quoted(std::string_view text);

} // namespace platform
