#include "host/Characters.h"

#include <algorithm>

namespace {

constexpr char32_t firstForeignByte = 0x110000;

std::size_t lengthOfSequence(std::uint32_t lead)
{
    if (lead < 0xC2)
        return 0;
    if (lead < 0xE0)
        return 2;
    if (lead < 0xF0)
        return 3;
    return lead < 0xF5 ? 4 : 0;
}

/// Strict as The Unicode Standard, table 3-7: no overlong forms, no surrogates, nothing above U+10FFFF.
bool isCodePoint(std::uint32_t value, std::size_t length)
{
    constexpr std::uint32_t smallest[] = { 0, 0, 0x80, 0x800, 0x10000 };
    const bool isSurrogate = value >= 0xD800 && value < 0xE000;
    return value >= smallest[length] && value <= 0x10FFFF && !isSurrogate;
}

char32_t takeSequence(std::string_view& text)
{
    const auto byteAt = [&](std::size_t index) -> std::uint32_t { return static_cast<unsigned char>(text[index]); };
    constexpr std::uint32_t leadBits[] = { 0, 0, 0x1F, 0x0F, 0x07 };
    const std::uint32_t lead = byteAt(0);
    const std::size_t length = lengthOfSequence(lead);
    std::uint32_t value = lead & leadBits[length];
    bool isValid = length != 0 && length <= text.size();
    for (std::size_t index = 1; isValid && index < length; ++index) {
        isValid = (byteAt(index) & 0xC0) == 0x80;
        value = value << 6 | (byteAt(index) & 0x3F);
    }
    isValid = isValid && isCodePoint(value, length);
    text.remove_prefix(isValid ? length : 1);
    return isValid ? value : firstForeignByte + lead;
}

} // namespace

bool isInRanges(std::span<const CharacterRange> ranges, char32_t character)
{
    const auto found = std::lower_bound(ranges.begin(), ranges.end(), character,
        [](const CharacterRange& candidate, char32_t wanted) { return candidate.last < wanted; });
    return found != ranges.end() && found->first <= character;
}

bool isForeignByte(char32_t character)
{
    return character >= firstForeignByte;
}

char32_t takeCharacter(std::string_view& text)
{
    const auto first = static_cast<unsigned char>(text.front());
    if (first >= 0x80)
        return takeSequence(text);
    text.remove_prefix(1);
    return first;
}
