#pragma once

#include <string>
#include <string_view>

namespace ombrix {

/// `text` as one word for a shell, quoted where it has to be, on one line and harmless to a terminal.
std::string shellWord(std::string_view text);

} // namespace ombrix
