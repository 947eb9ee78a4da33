#include "apps/common/DisplayWidth.h"

#include "apps/common/CharacterRanges.h"
#include "apps/common/HostileNames.h"
#include "platform/PathText.h"
#include "platform/formats/Unicode.h"

#include <algorithm>

namespace apps {
namespace {

    constexpr std::string_view ellipsis = "…";
    constexpr char32_t joiner = 0x200D;
    constexpr char32_t emojiPresentation = 0xFE0F;
    constexpr std::size_t longestEscape = 20; // bytes, marks included: four of a character, four letters each

    bool isSkinTone(char32_t character)
    {
        return character >= 0x1F3FB && character <= 0x1F3FF;
    }
    bool isFlagLetter(char32_t character)
    {
        return character >= 0x1F1E6 && character <= 0x1F1FF;
    }

    int columnsOf(platform::DecodedCharacter character)
    {
        if (!character.isValid)
            return 1;
        const char32_t code = character.codePoint;
        if (code < 0x20 || (code >= 0x7F && code < 0xA0) || isZeroWidth(code))
            return 0;
        return isWide(code) ? 2 : 1;
    }

    /// How long the escape at the start of a laid-out text is, its marks included; 0 where none begins.
    std::size_t lengthOfEscape(std::string_view text)
    {
        if (text.front() != escapeBegins)
            return 0;
        const std::size_t end = text.substr(0, longestEscape).find(escapeEnds);
        return end == std::string_view::npos ? 0 : end + 1;
    }

    int spacesTo(std::string_view text, int columns)
    {
        return std::max(0, columns - displayWidth(text));
    }

    /// How many bytes of `text` fit into `columns` columns.
    std::size_t lengthOfPrefix(std::string_view text, int columns)
    {
        std::size_t length = 0;
        while (length < text.size()) {
            const Letter letter = letterAtStart(text.substr(length));
            columns -= letter.columns;
            if (columns < 0)
                break;
            length += letter.length;
        }
        return length;
    }

    /// The longest end of `text` that fits into `columns` columns.
    std::string_view suffixOf(std::string_view text, int columns)
    {
        int tooMany = displayWidth(text) - columns;
        while (tooMany > 0 && !text.empty()) {
            const Letter letter = letterAtStart(text);
            tooMany -= letter.columns;
            text.remove_prefix(letter.length);
        }
        return text;
    }

} // namespace

Letter letterAtStart(std::string_view text)
{
    if (const std::size_t length = lengthOfEscape(text); length > 0)
        return { length, displayWidth(text.substr(1, length - 2)) };
    const platform::DecodedCharacter first = platform::decodeCharacter(text);
    Letter letter { first.length, columnsOf(first) };
    if (!first.isValid || first.codePoint < 0x20)
        return letter;
    bool joins = false;
    bool pairs = isFlagLetter(first.codePoint);
    while (letter.length < text.size()) {
        const platform::DecodedCharacter next = platform::decodeCharacter(text.substr(letter.length));
        const char32_t code = next.codePoint;
        const bool belongs
            = next.isValid && (joins || isZeroWidth(code) || isSkinTone(code) || (pairs && isFlagLetter(code)));
        if (!belongs)
            break;
        if (code == emojiPresentation || (pairs && isFlagLetter(code)))
            letter.columns = 2;
        // Only pictures are joined into one; in scripts that use the same character it changes shapes, not widths.
        joins = code == joiner && letter.columns == 2;
        pairs = false;
        letter.length += next.length;
    }
    return letter;
}

int displayWidth(std::string_view text)
{
    int columns = 0;
    while (!text.empty()) {
        const Letter letter = letterAtStart(text);
        columns += letter.columns;
        text.remove_prefix(letter.length);
    }
    return columns;
}

std::string cutAtEnd(std::string_view text, int columns)
{
    if (displayWidth(text) <= columns)
        return std::string(text);
    if (columns <= 0)
        return {};
    std::string cut(text.substr(0, lengthOfPrefix(text, columns - 1)));
    cut += ellipsis;
    return cut;
}

std::string cutInMiddle(std::string_view text, int columns)
{
    if (displayWidth(text) <= columns)
        return std::string(text);
    if (columns <= 0)
        return {};
    const std::size_t dot = platform::extensionStart(text);
    const std::string_view extension = dot == std::string_view::npos ? std::string_view() : text.substr(dot);
    const int room = columns - 1;
    const bool keepsExtension = displayWidth(extension) * 2 <= room;
    // A third of the room goes to the end: numbered clips differ there.
    const int atEnd = std::max(keepsExtension ? displayWidth(extension) : 0, room / 3);
    const std::string_view end = suffixOf(text, atEnd);
    std::string cut(text.substr(0, lengthOfPrefix(text, room - displayWidth(end))));
    cut += ellipsis;
    cut += end;
    return cut;
}

std::vector<std::string> wrappedWords(std::string_view text, int columns)
{
    std::vector<std::string> lines(1);
    while (!text.empty()) {
        const std::size_t blanks = std::min(text.find_first_not_of(' '), text.size());
        const std::size_t end = std::min(text.find(' ', blanks), text.size());
        const std::string_view word = text.substr(0, end);
        if (lines.back().empty() || displayWidth(lines.back()) + displayWidth(word) <= columns)
            lines.back() += word;
        else
            lines.emplace_back(word.substr(blanks));
        text.remove_prefix(end);
    }
    return lines;
}

std::string paddedAfter(std::string_view text, int columns)
{
    std::string padded(text);
    padded.append(static_cast<std::size_t>(spacesTo(text, columns)), ' ');
    return padded;
}

std::string paddedBefore(std::string_view text, int columns)
{
    std::string padded(static_cast<std::size_t>(spacesTo(text, columns)), ' ');
    padded += text;
    return padded;
}

} // namespace apps
