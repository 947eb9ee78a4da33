#include "host/QueryScanner.h"

#include "host/Characters.h"

#include <algorithm>
#include <utility>

namespace {

bool isWhiteSpace(char letter)
{
    return letter == ' ' || (letter >= '\t' && letter <= '\r');
}

bool isNameLetter(char letter)
{
    const char small = static_cast<char>(letter | 0x20);
    return (small >= 'a' && small <= 'z') || (letter >= '0' && letter <= '9') || letter == '_';
}

bool isNumberLetter(char letter)
{
    return isNameLetter(letter) || letter == '.' || letter == '+' || letter == '-';
}

char32_t wildcardOf(char32_t character)
{
    if (character == U'*')
        return TextPattern::anyRun;
    return character == U'?' ? TextPattern::anyCharacter : character;
}

} // namespace

void QueryScanner::fail(std::size_t offset, std::string text)
{
    if (!_problem)
        _problem = QueryProblem { offset, std::move(text) };
}

std::size_t QueryScanner::offset()
{
    while (_offset < _text.size() && isWhiteSpace(_text[_offset]))
        ++_offset;
    return _offset;
}

bool QueryScanner::isAtEnd()
{
    return offset() == _text.size();
}

bool QueryScanner::takes(std::string_view word)
{
    if (_text.substr(offset(), word.size()) != word)
        return false;
    _offset += word.size();
    return true;
}

std::string_view QueryScanner::takeName()
{
    const std::string_view rest = _text.substr(offset());
    const auto* const end = std::find_if_not(rest.begin(), rest.end(), isNameLetter);
    const std::string_view name = rest.substr(0, static_cast<std::size_t>(end - rest.begin()));
    _offset += name.size();
    return name;
}

std::string_view QueryScanner::takeNumber()
{
    const std::string_view rest = _text.substr(offset());
    const auto* const end = std::find_if_not(rest.begin(), rest.end(), isNumberLetter);
    const std::string_view number = rest.substr(0, static_cast<std::size_t>(end - rest.begin()));
    _offset += number.size();
    return number;
}

std::optional<std::string_view> QueryScanner::takeUpTo(char end)
{
    const std::size_t start = offset();
    const std::size_t found = _text.find(end, start);
    if (found == std::string_view::npos)
        return std::nullopt;
    _offset = found;
    return _text.substr(start, found - start);
}

bool QueryScanner::isAtQuote()
{
    return !isAtEnd() && (_text[_offset] == '"' || _text[_offset] == '\'');
}

std::optional<std::vector<char32_t>> QueryScanner::takeQuoted()
{
    const std::size_t start = offset();
    std::string_view rest = _text.substr(start + 1);
    std::vector<char32_t> elements;
    while (!rest.empty()) {
        char32_t character = takeCharacter(rest);
        if (character == static_cast<unsigned char>(_text[start])) {
            _offset = _text.size() - rest.size();
            return elements;
        }
        if (character != U'\\')
            character = wildcardOf(character);
        else if (!rest.empty())
            character = takeCharacter(rest);
        elements.push_back(character);
    }
    fail(start, "this quoted text has no end");
    return std::nullopt;
}

std::optional<TextModifiers> QueryScanner::takeModifiers()
{
    TextModifiers modifiers;
    for (; _offset < _text.size() && isNameLetter(_text[_offset]); ++_offset) {
        const char letter = _text[_offset];
        if (letter == 'c') {
            modifiers.ignoresCase = true;
        } else if (letter == 'd') {
            modifiers.ignoresAccents = true;
        } else if (letter == 'w') {
            modifiers.comparesWords = true;
        } else {
            fail(_offset, std::string("unknown modifier \"") + letter + "\" (known are c, d and w)");
            return std::nullopt;
        }
    }
    return modifiers;
}
