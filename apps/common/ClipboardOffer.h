#pragma once

#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace apps {

/// What is copied, in one representation.
struct ClipboardItem {
    std::string type; ///< a MIME type
    std::string bytes {};

    bool operator==(const ClipboardItem&) const = default;
};

// What a command and the program that offers things on the desktop's clipboard tell each other, both ways over one
// stream: the program says that it has opened the display, is given an offer, says that it owns the clipboard, and is
// told to keep it. When either side ends before that, the other knows by the end of the stream.

/// The program that alone knows the desktop's toolkit. It lies beside the one that starts it.
inline constexpr std::string_view clipboardProgramName = "ombrix-clipboard";

/// What the program says, a byte each.
enum class ClipboardWord : char {
    opened = 'o', ///< the display answers, and an offer is waited for
    owned = 'c', ///< everybody on the desktop can have what was offered
    noDisplay = 'd', ///< the display cannot be opened
    refused = 'r', ///< the display leaves the clipboard to somebody else
};

/// What the program is told in the end, likewise.
inline constexpr char keepClipboard = 'k';

/// For how many seconds the program is waited for.
inline constexpr int clipboardPatience = 2;

/// The bytes in which an offer is handed over.
std::string writtenOffer(const std::vector<ClipboardItem>& items);
/// The offer at the start of what has arrived; absent until all of it has, and for bytes that are none.
std::optional<std::vector<ClipboardItem>> readOffer(std::string_view arrived);

} // namespace apps
