// Nearly every name is ASCII, and folded many bytes at once. Of the other characters most become one by themselves, and
// it is remembered which; only the rest is taken apart and put together again.

#include "platform/formats/FoldedText.h"

#include "platform/formats/Unicode.h"

#include <utf8proc.h>

#include <algorithm>
#include <array>
#include <atomic>
#include <cstdint>
#include <vector>

namespace platform {
namespace {

    /// Begins no UTF-8 sequence; stands before each byte that belongs to none.
    constexpr char beforeForeignByte = '\xFF';
    constexpr std::size_t mostFromOneCharacter = 8;

    using Characters = std::vector<utf8proc_int32_t>;

    /// How many bytes are folded at once; the compiler makes few instructions of them.
    constexpr std::size_t atOnce = 32;

    char asciiFolded(unsigned char byte)
    {
        const auto isCapital = static_cast<unsigned char>(static_cast<unsigned char>(byte - 'A') < 26);
        const auto isWhiteSpace = static_cast<unsigned char>(static_cast<unsigned char>(byte - '\t') < 5);
        const auto small = static_cast<unsigned char>(byte | (isCapital << 5));
        return static_cast<char>(isWhiteSpace ? ' ' : small);
    }

    /// Folds `atOnce` bytes; answers all of them, one or-ed to the other.
    unsigned char foldBytes(char* bytes)
    {
        unsigned char all = 0;
        for (std::size_t index = 0; index < atOnce; ++index) {
            const auto byte = static_cast<unsigned char>(bytes[index]);
            all |= byte;
            bytes[index] = asciiFolded(byte);
        }
        return all;
    }

    /// The classes of marks that change a letter and are left out by people in a hurry: those that cross it, the points
    /// of Hebrew, Arabic and Syriac, and all that are placed by where they stand.
    bool isAccent(utf8proc_int32_t character)
    {
        const utf8proc_propval_t combiningClass = utf8proc_get_property(character)->combining_class;
        return combiningClass == 1 || (combiningClass >= 10 && combiningClass <= 36) || combiningClass >= 200;
    }

    bool isWhiteSpace(utf8proc_int32_t character)
    {
        constexpr utf8proc_int32_t nextLine = 0x85;
        const utf8proc_category_t category = utf8proc_category(character);
        return category == UTF8PROC_CATEGORY_ZS || category == UTF8PROC_CATEGORY_ZL || category == UTF8PROC_CATEGORY_ZP
            || character == nextLine;
    }

    /// The characters of `text`, all of it UTF-8, in canonical order.
    Characters decomposed(std::string_view text)
    {
        const auto decompose = [text](Characters& into) {
            return utf8proc_decompose(reinterpret_cast<const utf8proc_uint8_t*>(text.data()),
                static_cast<utf8proc_ssize_t>(text.size()), into.data(), static_cast<utf8proc_ssize_t>(into.size()),
                UTF8PROC_DECOMPOSE);
        };
        Characters characters(text.size());
        utf8proc_ssize_t count = decompose(characters);
        if (count > static_cast<utf8proc_ssize_t>(characters.size())) {
            characters.resize(static_cast<std::size_t>(count));
            count = decompose(characters);
        }
        characters.resize(count > 0 ? static_cast<std::size_t>(count) : 0);
        return characters;
    }

    void appendWithoutCase(Characters& folded, utf8proc_int32_t character)
    {
        std::array<utf8proc_int32_t, mostFromOneCharacter> parts {};
        int boundary = 0;
        const utf8proc_ssize_t count
            = utf8proc_decompose_char(character, parts.data(), mostFromOneCharacter, UTF8PROC_CASEFOLD, &boundary);
        folded.insert(folded.end(), parts.begin(), parts.begin() + (count > 0 ? count : 0));
    }

    /// What was decomposed for its accents' sake is composed again: else "か" would be found in "が".
    void compose(Characters& characters)
    {
        const utf8proc_ssize_t count
            = utf8proc_normalize_utf32(characters.data(), static_cast<utf8proc_ssize_t>(characters.size()),
                static_cast<utf8proc_option_t>(UTF8PROC_COMPOSE | UTF8PROC_STABLE));
        characters.resize(count > 0 ? static_cast<std::size_t>(count) : 0);
    }

    Characters foldedTogether(std::string_view characters)
    {
        Characters folded;
        for (const utf8proc_int32_t character : decomposed(characters)) {
            if (isWhiteSpace(character) || (character >= '\t' && character <= '\r'))
                folded.push_back(' ');
            else if (!isAccent(character))
                appendWithoutCase(folded, character);
        }
        compose(folded);
        return folded;
    }

    /// Whether `character` may become one with another beside it: a mark, or a letter of a Korean syllable.
    bool mayJoin(utf8proc_int32_t character)
    {
        const utf8proc_category_t category = utf8proc_category(character);
        return (category >= UTF8PROC_CATEGORY_MN && category <= UTF8PROC_CATEGORY_ME)
            || (character >= 0x1100 && character <= 0x11FF);
    }

    // What becomes of a character by itself, found out when it is first met. 0 stands for what is not known yet.
    constexpr char32_t nothing = 1;
    constexpr char32_t dependsOnOthers = 2; // or becomes several
    constexpr std::size_t rememberedCharacters = 0x20000;

    char32_t becomes(char32_t character)
    {
        std::string alone;
        appendCharacter(alone, character);
        const auto point = static_cast<utf8proc_int32_t>(character);
        const Characters folded = foldedTogether(alone);
        if (folded.empty() && isAccent(point))
            return nothing;
        if (folded.size() != 1 || mayJoin(point) || mayJoin(folded[0]))
            return dependsOnOthers;
        return static_cast<char32_t>(folded[0]);
    }

    char32_t remembered(char32_t character)
    {
        static std::array<std::atomic<char32_t>, rememberedCharacters> memory {};
        if (character >= rememberedCharacters)
            return dependsOnOthers;
        std::atomic<char32_t>& place = memory[character];
        char32_t known = place.load(std::memory_order_relaxed);
        if (known == 0) {
            known = becomes(character);
            place.store(known, std::memory_order_relaxed);
        }
        return known;
    }

    /// Appends what becomes of a character that is not ASCII; answers false where it does not become one by itself.
    bool appendSingle(std::string& text, const DecodedCharacter& character)
    {
        const char32_t folded = character.isValid ? remembered(character.codePoint) : dependsOnOthers;
        if (folded > dependsOnOthers)
            appendCharacter(text, folded);
        return folded != dependsOnOthers;
    }

    /// Appends characters of which each becomes one by itself; answers false, and appends nothing, where one does not.
    bool appendOneByOne(std::string& text, std::string_view characters)
    {
        const std::size_t start = text.size();
        while (!characters.empty()) {
            const DecodedCharacter next = decodeCharacter(characters);
            characters.remove_prefix(next.length);
            if (next.codePoint < 0x80) {
                text += asciiFolded(static_cast<unsigned char>(next.codePoint));
                continue;
            }
            if (!appendSingle(text, next)) {
                text.resize(start);
                return false;
            }
        }
        return true;
    }

    void appendCharacters(std::string& text, std::string_view characters)
    {
        if (appendOneByOne(text, characters))
            return;
        for (const utf8proc_int32_t character : foldedTogether(characters))
            appendCharacter(text, static_cast<char32_t>(character));
    }

    bool isLetterOrDigit(char32_t character)
    {
        const utf8proc_category_t category = utf8proc_category(static_cast<utf8proc_int32_t>(character));
        return category >= UTF8PROC_CATEGORY_LU && category <= UTF8PROC_CATEGORY_NO; // marks too, which end a letter
    }

} // namespace

bool appendFoldedAscii(std::string& folded, std::string_view text)
{
    const std::size_t start = folded.size();
    folded.append(text);
    char* next = folded.data() + start;
    std::size_t left = text.size();
    unsigned char all = 0;
    for (; left >= atOnce; left -= atOnce, next += atOnce)
        all |= foldBytes(next);
    std::array<char, atOnce> rest {};
    std::copy_n(next, left, rest.data());
    all |= foldBytes(rest.data());
    std::copy_n(rest.data(), left, next);
    return all < 0x80;
}

void appendFolded(std::string& folded, std::string_view text)
{
    const std::size_t start = folded.size();
    if (appendFoldedAscii(folded, text))
        return;
    folded.resize(start);
    while (!text.empty()) {
        const std::size_t length = lengthOfValidPrefix(text);
        appendCharacters(folded, text.substr(0, length));
        text.remove_prefix(length);
        if (!text.empty()) {
            folded += beforeForeignByte;
            folded += text.front();
            text.remove_prefix(1);
        }
    }
}

/// What is ASCII is folded where it stands, and moved up for what became shorter before it.
bool appendFoldedOneByOne(std::string& folded, std::string_view text, std::vector<FoldedCharacter>& others)
{
    const std::size_t start = folded.size();
    if (appendFoldedAscii(folded, text))
        return true;
    const std::size_t othersBefore = others.size();
    char* const bytes = folded.data() + start;
    std::string letter;
    std::size_t written = 0;
    for (std::size_t next = 0; next < text.size();) {
        const std::size_t ascii = lengthOfAsciiPrefix(text.substr(next));
        if (written != next)
            std::copy(bytes + next, bytes + next + ascii, bytes + written);
        next += ascii;
        written += ascii;
        if (next == text.size())
            break;
        const DecodedCharacter character = decodeCharacter(text.substr(next));
        next += character.length;
        letter.clear();
        if (!appendSingle(letter, character) || written + letter.size() > next) {
            folded.resize(start);
            others.resize(othersBefore);
            return false;
        }
        std::copy(letter.begin(), letter.end(), bytes + written);
        written += letter.size();
        others.push_back({ next, start + written });
    }
    folded.resize(start + written);
    return true;
}

std::string foldedText(std::string_view text)
{
    std::string folded;
    appendFolded(folded, text);
    return folded;
}

bool wordMayBeginAt(std::string_view folded, std::size_t position) noexcept
{
    if (position == 0)
        return true;
    std::size_t before = position - 1;
    while (before > 0 && (static_cast<std::uint8_t>(folded[before]) & 0xC0) == 0x80)
        --before;
    const DecodedCharacter character = decodeCharacter(folded.substr(before));
    // A byte that is no UTF-8 is most likely a letter of an older encoding.
    return character.isValid && !isLetterOrDigit(character.codePoint);
}

} // namespace platform
