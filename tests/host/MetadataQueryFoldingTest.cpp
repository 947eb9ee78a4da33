#include "host/OBMetadataQuery.h"
#include "platform/formats/FoldedText.h"
#include "platform/formats/Unicode.h"

#include <doctest/doctest.h>

#include <string>
#include <string_view>

namespace {

constexpr char32_t endOfCharacters = 0x110000;

std::string utf8(char32_t character)
{
    std::string text;
    platform::appendCharacter(text, character);
    return text;
}

bool isSurrogate(char32_t character)
{
    return character >= 0xD800 && character < 0xE000;
}

/// Whether a file with that name has the name that `quoted`, with its modifiers, stands for.
bool isNamed(const std::string& quoted, const std::string& name)
{
    return OBMetadataQuery::parse("kMDItemFSName = " + quoted).query->matchesByPath("/" + name);
}

/// Characters that stand for another one in every text; a query compares characters and not what they stand for.
bool isOtherSpelling(char32_t character)
{
    const bool isIdeograph = (character >= 0xF900 && character < 0xFB00) || character >= 0x2F800;
    return isIdeograph || character == 0x374 || character == 0x37E || character == 0x387 || character == 0x1FEF
        || character == 0x1FFD || character == 0x2329 || character == 0x232A;
}

std::size_t lettersOf(std::string_view text)
{
    std::size_t count = 0;
    for (; !text.empty(); ++count)
        text.remove_prefix(platform::decodeCharacter(text).length);
    return count;
}

} // namespace

TEST_CASE("a letter that a search takes for another is the same letter to a query without case and accents")
{
    int compared = 0;
    for (char32_t character = 0xC0; character < endOfCharacters; ++character) {
        const std::string folded = isSurrogate(character) ? std::string() : platform::foldedText(utf8(character));
        if (folded == utf8(character) || lettersOf(folded) != 1 || folded == " " || isOtherSpelling(character))
            continue;
        CAPTURE(static_cast<std::uint32_t>(character));
        ++compared;
        CHECK(isNamed("'" + utf8(character) + "'cd", folded));
    }
    CHECK(compared > 1500);
}

TEST_CASE("the marks that a search leaves out are the accents of a query")
{
    constexpr char32_t endOfOldCharacters = 0x10000; // beyond them every edition of the tables adds marks
    for (char32_t character = 0x80; character < endOfOldCharacters; ++character) {
        if (isSurrogate(character))
            continue;
        const std::string marked = "a" + utf8(character);
        if (isNamed("'a'd", marked) != (platform::foldedText(marked) == "a")) {
            CAPTURE(static_cast<std::uint32_t>(character));
            CHECK(isNamed("'a'd", marked) == (platform::foldedText(marked) == "a"));
        }
    }
}

TEST_CASE("what separates the words of a search separates those of a query")
{
    const auto check = [](char32_t first, char32_t last) {
        for (char32_t character = first; character <= last; ++character) {
            const std::string text = utf8(character) + "a";
            CAPTURE(static_cast<std::uint32_t>(character));
            CHECK(isNamed("'a'w", text) == platform::wordMayBeginAt(text, utf8(character).size()));
        }
    };
    check(0x30, 0x377);
    check(0x400, 0x52F);
    check(0x2000, 0x2064);
    check(0x3001, 0x303F);
    check(0xFF01, 0xFFBE);
}
