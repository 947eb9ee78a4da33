#pragma once

#include <functional>
#include <optional>
#include <string>
#include <string_view>

namespace platform {
class Pasteboard;
}

namespace apps {

/// Has `write` fill a pasteboard, and answers what it wrote of `type` as an XML property list; absent where it wrote
/// none.
std::optional<std::string> propertyListWritten(
    std::string_view type, const std::function<void(platform::Pasteboard&)>& write);

} // namespace apps
