#include "platform/formats/Unicode.h"

#include <array>
#include <cstdint>
#include <cstring>

namespace platform {
namespace {

    /// What is set in eight bytes of which none is ASCII.
    constexpr std::uint64_t highBits = 0x8080808080808080;

    std::uint8_t byteAt(std::string_view bytes, std::size_t index)
    {
        return static_cast<std::uint8_t>(bytes[index]);
    }

    bool isBetween(std::uint8_t byte, std::uint8_t first, std::uint8_t last)
    {
        return byte >= first && byte <= last;
    }

    /// What the first byte promises: how long the sequence is, and what its second byte may be.
    struct Lead {
        std::size_t length = 0;
        std::uint8_t secondFirst = 0x80;
        std::uint8_t secondLast = 0xBF;
    };

    Lead leadOf(std::uint8_t byte)
    {
        if (isBetween(byte, 0xC2, 0xDF))
            return { 2 };
        if (byte == 0xE0)
            return { 3, 0xA0, 0xBF };
        if (byte == 0xED)
            return { 3, 0x80, 0x9F };
        if (isBetween(byte, 0xE1, 0xEF))
            return { 3 };
        if (byte == 0xF0)
            return { 4, 0x90, 0xBF };
        if (isBetween(byte, 0xF1, 0xF3))
            return { 4 };
        if (byte == 0xF4)
            return { 4, 0x80, 0x8F };
        return {};
    }

} // namespace

std::size_t lengthOfValidSequence(std::string_view bytes) noexcept
{
    if (bytes.empty())
        return 0;
    const std::uint8_t first = byteAt(bytes, 0);
    if (first < 0x80)
        return 1;
    const Lead lead = leadOf(first);
    if (lead.length == 0 || bytes.size() < lead.length)
        return 0;
    if (!isBetween(byteAt(bytes, 1), lead.secondFirst, lead.secondLast))
        return 0;
    for (std::size_t index = 2; index < lead.length; ++index) {
        if (!isBetween(byteAt(bytes, index), 0x80, 0xBF))
            return 0;
    }
    return lead.length;
}

DecodedCharacter decodeCharacter(std::string_view bytes) noexcept
{
    const std::size_t length = lengthOfValidSequence(bytes);
    if (length == 0)
        return {};
    const std::uint8_t first = byteAt(bytes, 0);
    if (length == 1)
        return { first, 1, true };
    char32_t codePoint = first & (0xFFu >> (length + 1));
    for (std::size_t index = 1; index < length; ++index)
        codePoint = (codePoint << 6) | (byteAt(bytes, index) & 0x3Fu);
    return { codePoint, length, true };
}

std::size_t lengthOfAsciiPrefix(std::string_view bytes) noexcept
{
    std::size_t end = 0;
    for (std::array<std::uint64_t, 4> many {}; bytes.size() - end >= sizeof many; end += sizeof many) {
        std::memcpy(&many, bytes.data() + end, sizeof many);
        if (((many[0] | many[1] | many[2] | many[3]) & highBits) != 0)
            break;
    }
    for (std::uint64_t eight = 0; bytes.size() - end >= sizeof eight; end += sizeof eight) {
        std::memcpy(&eight, bytes.data() + end, sizeof eight);
        if ((eight & highBits) != 0)
            break;
    }
    while (end < bytes.size() && byteAt(bytes, end) < 0x80)
        ++end;
    return end;
}

std::size_t lengthOfValidPrefix(std::string_view bytes) noexcept
{
    std::size_t end = 0;
    while (end < bytes.size()) {
        std::uint64_t eight = highBits;
        if (bytes.size() - end >= sizeof eight)
            std::memcpy(&eight, bytes.data() + end, sizeof eight);
        if ((eight & highBits) == 0) {
            end += sizeof eight;
            continue;
        }
        const std::size_t length = lengthOfValidSequence(bytes.substr(end));
        if (length == 0)
            break;
        end += length;
    }
    return end;
}

void appendCharacter(std::string& text, char32_t codePoint)
{
    const bool isSurrogate = codePoint >= 0xD800 && codePoint <= 0xDFFF;
    if (isSurrogate || codePoint > 0x10FFFF) {
        text += replacementCharacter;
    } else if (codePoint < 0x80) {
        text += static_cast<char>(codePoint);
    } else if (codePoint < 0x800) {
        text += static_cast<char>(0xC0 | (codePoint >> 6));
        text += static_cast<char>(0x80 | (codePoint & 0x3F));
    } else if (codePoint < 0x10000) {
        text += static_cast<char>(0xE0 | (codePoint >> 12));
        text += static_cast<char>(0x80 | ((codePoint >> 6) & 0x3F));
        text += static_cast<char>(0x80 | (codePoint & 0x3F));
    } else {
        text += static_cast<char>(0xF0 | (codePoint >> 18));
        text += static_cast<char>(0x80 | ((codePoint >> 12) & 0x3F));
        text += static_cast<char>(0x80 | ((codePoint >> 6) & 0x3F));
        text += static_cast<char>(0x80 | (codePoint & 0x3F));
    }
}

} // namespace platform
