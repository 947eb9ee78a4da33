#include "apps/common/ClipboardOffer.h"

#include <cstdint>
#include <cstring>

namespace apps {
namespace {

    // Both sides run on one machine, so a length has the machine's own byte order.
    using Length = std::uint64_t;

    void addText(std::string& bytes, std::string_view text)
    {
        const Length length = text.size();
        bytes.append(reinterpret_cast<const char*>(&length), sizeof(length)).append(text);
    }

    /// Takes a text off the front; absent where it is not all there.
    std::optional<std::string_view> takeText(std::string_view& bytes)
    {
        Length length = 0;
        if (bytes.size() < sizeof(length))
            return std::nullopt;
        std::memcpy(&length, bytes.data(), sizeof(length));
        if (length > bytes.size() - sizeof(length))
            return std::nullopt;
        const std::string_view text = bytes.substr(sizeof(length), length);
        bytes.remove_prefix(sizeof(length) + length);
        return text;
    }

} // namespace

std::string writtenOffer(const std::vector<ClipboardItem>& items)
{
    std::string body;
    for (const ClipboardItem& item : items) {
        addText(body, item.type);
        addText(body, item.bytes);
    }
    std::string bytes;
    addText(bytes, body);
    return bytes;
}

std::optional<std::vector<ClipboardItem>> readOffer(std::string_view arrived)
{
    std::optional<std::string_view> body = takeText(arrived);
    if (!body)
        return std::nullopt;
    std::vector<ClipboardItem> items;
    while (!body->empty()) {
        const std::optional<std::string_view> type = takeText(*body);
        const std::optional<std::string_view> bytes = type ? takeText(*body) : std::nullopt;
        if (!bytes)
            return std::nullopt;
        items.push_back({ std::string(*type), std::string(*bytes) });
    }
    return items;
}

} // namespace apps
