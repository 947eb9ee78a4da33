#include "apps/common/HostileNames.h"

#include "platform/formats/Unicode.h"

namespace apps {
namespace {

    constexpr std::string_view digits = "0123456789abcdef";

    bool isControl(char32_t character)
    {
        return character < 0x20 || (character >= 0x7F && character < 0xA0);
    }

    /// Overrides and isolates of the writing direction, and the two separators that begin a new line.
    bool turnsOrBreaksLines(char32_t character)
    {
        return (character >= 0x202A && character <= 0x202E) || (character >= 0x2066 && character <= 0x2069)
            || character == 0x2028 || character == 0x2029;
    }

    void appendByte(std::string& text, char byte)
    {
        const auto value = static_cast<unsigned char>(byte);
        text += "\\x";
        text += digits[value >> 4];
        text += digits[value & 15];
    }

    void appendCode(std::string& text, char32_t code)
    {
        text += "\\u";
        for (int shift = 12; shift >= 0; shift -= 4)
            text += digits[(code >> shift) & 15];
    }

    bool isPlainAscii(std::string_view text)
    {
        for (const char letter : text) {
            if (letter < 0x20 || letter == 0x7F)
                return false;
        }
        return true;
    }

    std::string escaped(std::string_view text, bool marked)
    {
        if (isPlainAscii(text))
            return std::string(text);
        std::string result;
        while (!text.empty()) {
            const platform::DecodedCharacter next = platform::decodeCharacter(text);
            const bool isByte = !next.isValid || isControl(next.codePoint);
            const bool isEscaped = isByte || turnsOrBreaksLines(next.codePoint);
            if (isEscaped && marked)
                result += escapeBegins;
            if (!isEscaped)
                result += text.substr(0, next.length);
            else if (!isByte)
                appendCode(result, next.codePoint);
            for (std::size_t index = 0; isByte && index < next.length; ++index)
                appendByte(result, text[index]);
            if (isEscaped && marked)
                result += escapeEnds;
            text.remove_prefix(next.length);
        }
        return result;
    }

} // namespace

std::string escapedName(std::string_view name)
{
    return escaped(name, true);
}

std::string escapedText(std::string_view text)
{
    return escaped(text, false);
}

std::string withoutMarks(std::string_view escaped)
{
    std::string text;
    for (const char letter : escaped) {
        if (letter != escapeBegins && letter != escapeEnds)
            text += letter;
    }
    return text;
}

} // namespace apps
