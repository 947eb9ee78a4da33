#pragma once

#include "apps/common/ClipboardOffer.h"

#include <functional>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace platform {
class Pasteboard;
}

namespace apps {

/// What a person copied.
struct Exported {
    std::optional<std::string> propertyList {}; ///< as XML; absent where none was written
    std::vector<ClipboardItem> items {}; ///< all that was written, as the desktop takes it
};

/// Has `write` fill a pasteboard, and answers what it wrote, `type` being the one whose property list is wanted.
Exported exportedBy(const std::function<void(platform::Pasteboard&)>& write, std::string_view type);

} // namespace apps
