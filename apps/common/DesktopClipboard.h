#pragma once

#include "apps/common/ClipboardOffer.h"
#include "platform/linux/Descriptor.h"

#include <chrono>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace apps {

/// The clipboard of the desktop that this process runs on. A program of its own offers what is copied, and goes on when
/// this process has ended. One thread at a time.
class DesktopClipboard {
public:
    /// Why something could not be done, and where.
    struct Problem {
        std::string place;
        std::string what;
    };

    /// Starts that program and waits until it has opened the display. Absent when it has.
    std::optional<Problem> open();
    /// Offers the items in place of what the clipboard held, and waits until everybody can have them. Absent when they
    /// can. Once, after `open`; without it the program ends with this object and leaves the clipboard as it was.
    std::optional<Problem> offer(const std::vector<ClipboardItem>& items);

private:
    using Time = std::chrono::steady_clock::time_point;

    std::optional<Problem> start();
    /// Waits for the program to say `wanted`; `late` is what is wrong where it says nothing.
    std::optional<Problem> waitFor(ClipboardWord wanted, std::string_view late);
    bool send(std::string_view bytes, Time deadline) const;
    bool waitUntilReady(short events, Time deadline) const;

    platform::Descriptor _channel {};
    std::chrono::steady_clock::duration _patience = std::chrono::seconds(clipboardPatience);
};

} // namespace apps
