#include "platform/formats/Base64.h"

#include <algorithm>
#include <cstddef>
#include <cstdint>

namespace platform {
namespace {

    constexpr std::string_view alphabet = "ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz0123456789+/";

    int digitOf(char letter)
    {
        if (letter >= 'A' && letter <= 'Z')
            return letter - 'A';
        if (letter >= 'a' && letter <= 'z')
            return letter - 'a' + 26;
        if (letter >= '0' && letter <= '9')
            return letter - '0' + 52;
        if (letter == '+')
            return 62;
        return letter == '/' ? 63 : -1;
    }

    bool isWhiteSpace(char letter)
    {
        return letter == ' ' || (letter >= '\t' && letter <= '\r');
    }

} // namespace

std::string encodeBase64(std::string_view bytes)
{
    std::string text;
    text.reserve((bytes.size() + 2) / 3 * 4);
    for (std::size_t start = 0; start < bytes.size(); start += 3) {
        const std::size_t length = std::min<std::size_t>(3, bytes.size() - start);
        std::uint32_t group = 0;
        for (std::size_t index = 0; index < 3; ++index)
            group = (group << 8) | (index < length ? static_cast<std::uint8_t>(bytes[start + index]) : 0u);
        for (std::size_t index = 0; index < 4; ++index)
            text += index <= length ? alphabet[(group >> (18 - 6 * index)) & 63] : '=';
    }
    return text;
}

std::optional<std::string> decodeBase64(std::string_view text)
{
    std::string bytes;
    bytes.reserve(text.size() / 4 * 3);
    std::uint32_t group = 0;
    std::size_t digits = 0;
    std::size_t padding = 0;
    for (char letter : text) {
        if (isWhiteSpace(letter))
            continue;
        if (letter == '=') {
            ++padding;
            continue;
        }
        const int digit = digitOf(letter);
        if (digit < 0 || padding > 0)
            return {};
        group = (group << 6) | static_cast<std::uint32_t>(digit);
        ++digits;
        if (digits % 4 == 0) {
            for (int shift : { 16, 8, 0 })
                bytes += static_cast<char>((group >> shift) & 0xFF);
        }
    }
    const std::size_t rest = digits % 4;
    if (rest == 1 || (rest == 0 ? padding != 0 : padding != 4 - rest))
        return {};
    if (rest >= 2)
        bytes += static_cast<char>((group >> (rest == 2 ? 4 : 10)) & 0xFF);
    if (rest == 3)
        bytes += static_cast<char>((group >> 2) & 0xFF);
    return bytes;
}

} // namespace platform
