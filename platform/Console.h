#pragma once

#include <string_view>

namespace platform {

/// The platform's console log, for what must be seen whatever log level is chosen. Any thread. None throws.
class Console {
public:
    virtual ~Console() = default;
    /// Writes `text` and a line feed as one line.
    virtual void log(std::string_view text) = 0;
};

} // namespace platform
