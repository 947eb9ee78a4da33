#include "host/TextPattern.h"

// Texts are decoded as they are compared, so holding a million names against a pattern allocates nothing. After a
// mismatch only the last run of any characters is made longer: that finds a match where there is one.

#include "host/Characters.h"

#include <algorithm>

namespace {

bool isWildcard(char32_t element)
{
    return element == TextPattern::anyCharacter || element == TextPattern::anyRun;
}

char32_t folded(char32_t character, const TextModifiers& modifiers)
{
    if (modifiers.ignoresAccents)
        character = withoutAccents(character);
    return modifiers.ignoresCase ? withoutCase(character) : character;
}

/// Whether the character that ends at `offset` belongs to a word.
bool isWordBefore(std::string_view text, std::size_t offset)
{
    constexpr std::size_t longestSequence = 4;
    for (std::size_t length = 1; length <= std::min(longestSequence, offset); ++length) {
        std::string_view last = text.substr(offset - length, length);
        const char32_t character = takeCharacter(last);
        if (last.empty() && !isForeignByte(character))
            return belongsToWord(character);
    }
    return true;
}

/// Whether no word goes on across `offset`.
bool isWordBoundary(std::string_view text, std::size_t offset)
{
    if (offset == 0 || offset == text.size())
        return true;
    std::string_view rest = text.substr(offset);
    return !belongsToWord(takeCharacter(rest)) || !isWordBefore(text, offset);
}

} // namespace

TextPattern::TextPattern(const std::vector<char32_t>& elements, TextModifiers modifiers)
    : _modifiers(modifiers)
{
    for (const char32_t element : elements) {
        if (isWildcard(element))
            _elements.push_back(element);
        else if (!modifiers.ignoresAccents || !isAccent(element))
            _elements.push_back(folded(element, modifiers));
    }
}

bool TextPattern::matches(std::string_view text) const
{
    if (!_modifiers.comparesWords)
        return matchesFrom(text, text);
    for (std::string_view rest = text;; takeCharacter(rest)) {
        if (isWordBoundary(text, text.size() - rest.size()) && matchesFrom(rest, text))
            return true;
        if (rest.empty())
            return false;
    }
}

/// The next character of `rest` as it is compared; absent at the end.
std::optional<char32_t> TextPattern::takeCompared(std::string_view& rest) const
{
    while (!rest.empty()) {
        const char32_t character = takeCharacter(rest);
        if (!_modifiers.ignoresAccents || !isAccent(character))
            return folded(character, _modifiers);
    }
    return std::nullopt;
}

/// Whether a match may end where `rest`, the end of `text`, begins. An accent there belongs to the character before.
bool TextPattern::mayEndBefore(std::string_view rest, std::string_view text) const
{
    std::string_view after = rest;
    while (_modifiers.ignoresAccents && !rest.empty() && isAccent(takeCharacter(after)))
        rest = after;
    return rest.empty() || (_modifiers.comparesWords && isWordBoundary(text, text.size() - rest.size()));
}

/// Whether the pattern stands at the start of `rest`, the end of `text`.
bool TextPattern::matchesFrom(std::string_view rest, std::string_view text) const
{
    std::size_t next = 0;
    std::optional<std::size_t> afterRun;
    std::string_view endOfRun;
    while (true) {
        if (next < _elements.size() && _elements[next] == anyRun) {
            afterRun = ++next;
            endOfRun = rest;
            continue;
        }
        if (next == _elements.size() && (mayEndBefore(rest, text) || afterRun == next))
            return true;
        std::string_view following = rest;
        const std::optional<char32_t> character = takeCompared(following);
        if (next < _elements.size() && character
            && (_elements[next] == anyCharacter || _elements[next] == *character)) {
            ++next;
            rest = following;
            continue;
        }
        if (!afterRun || !takeCompared(endOfRun))
            return false;
        next = *afterRun;
        rest = endOfRun;
    }
}
