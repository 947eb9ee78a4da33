#include "apps/common/HostileNames.h"

#include "platform/formats/Unicode.h"

#include <algorithm>
#include <iterator>

namespace apps {
namespace {

    constexpr std::string_view digits = "0123456789abcdef";

    struct CharacterRange {
        char32_t first;
        char32_t last;
    };

    template <std::size_t count> bool isIn(const CharacterRange (&ranges)[count], char32_t character)
    {
        return std::any_of(std::begin(ranges), std::end(ranges),
            [character](const CharacterRange& range) { return range.first <= character && character <= range.last; });
    }

    bool isControl(char32_t character)
    {
        return character < 0x20 || (character >= 0x7F && character < 0xA0);
    }

    /// What draws nothing itself: it turns the writing direction, hides in a name, or begins a line.
    bool isInvisible(char32_t character)
    {
        constexpr CharacterRange ranges[] { { 0xAD, 0xAD }, { 0x61C, 0x61C }, { 0x180E, 0x180E }, { 0x200B, 0x200F },
            { 0x2028, 0x202E }, { 0x2060, 0x206F }, { 0xFEFF, 0xFEFF }, { 0xFFF9, 0xFFFB }, { 0x1BCA0, 0x1BCA3 },
            { 0x1D173, 0x1D17A }, { 0xE0000, 0xE007F } };
        return isIn(ranges, character);
    }

    /// What emoji are made of, a joined emoji of several of them.
    bool isPicture(char32_t character)
    {
        constexpr CharacterRange ranges[] { { 0xA9, 0xA9 }, { 0xAE, 0xAE }, { 0x2190, 0x2BFF }, { 0x3030, 0x303D },
            { 0x3297, 0x3299 }, { 0x1F000, 0x1FAFF } };
        return isIn(ranges, character);
    }

    /// Goes through a text and knows, of a character that draws nothing, whether it belongs to a joined emoji there.
    class EmojiWatch {
    public:
        /// Whether `character`, before `rest`, only joins pictures or, after a flag, says which.
        bool joins(char32_t character, std::string_view rest) const
        {
            constexpr char32_t joiner = 0x200D;
            if (character == joiner)
                return _isAfterPicture && !rest.empty() && isPicture(platform::decodeCharacter(rest).codePoint);
            return _isAfterFlag && character >= 0xE0020 && character <= 0xE007F;
        }
        void pass(char32_t character)
        {
            constexpr char32_t emojiPresentation = 0xFE0F;
            constexpr char32_t blackFlag = 0x1F3F4;
            _isAfterPicture = isPicture(character) || (_isAfterPicture && character == emojiPresentation);
            _isAfterFlag = character == blackFlag || (_isAfterFlag && character >= 0xE0020 && character <= 0xE007F);
        }

    private:
        bool _isAfterPicture = false;
        bool _isAfterFlag = false;
    };

    void appendByte(std::string& text, char byte)
    {
        const auto value = static_cast<unsigned char>(byte);
        text += "\\x";
        text += digits[value >> 4];
        text += digits[value & 15];
    }

    void appendCode(std::string& text, char32_t code)
    {
        text += code > 0xFFFF ? "\\U" : "\\u";
        for (int shift = code > 0xFFFF ? 28 : 12; shift >= 0; shift -= 4)
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
        EmojiWatch emoji;
        while (!text.empty()) {
            const platform::DecodedCharacter next = platform::decodeCharacter(text);
            const bool isByte = !next.isValid || isControl(next.codePoint);
            const bool isEscaped
                = isByte || (isInvisible(next.codePoint) && !emoji.joins(next.codePoint, text.substr(next.length)));
            emoji.pass(next.codePoint);
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
