#include "platform/formats/DesktopFile.h"

#include <algorithm>

namespace platform {
namespace {

    constexpr std::string_view blanks = " \t";

    std::string_view withoutBlanksBefore(std::string_view text)
    {
        text.remove_prefix(std::min(text.find_first_not_of(blanks), text.size()));
        return text;
    }

    std::string_view withoutBlanksAfter(std::string_view text)
    {
        return text.substr(0, text.find_last_not_of(blanks) + 1);
    }

    std::string_view withoutBlanks(std::string_view text)
    {
        return withoutBlanksAfter(withoutBlanksBefore(text));
    }

    /// Takes the first line off `bytes`, its end included.
    std::string_view takeFirstLine(std::string_view& bytes)
    {
        const std::size_t end = std::min(bytes.find('\n'), bytes.size());
        std::string_view line = bytes.substr(0, end);
        bytes.remove_prefix(std::min(end + 1, bytes.size()));
        if (!line.empty() && line.back() == '\r')
            line.remove_suffix(1);
        return line;
    }

    /// What `\letter` stands for; absent for what is no escape, which then stays as written.
    std::optional<char> unescaped(char letter)
    {
        switch (letter) {
        case 's':
            return ' ';
        case 'n':
            return '\n';
        case 't':
            return '\t';
        case 'r':
            return '\r';
        case '\\':
            return '\\';
        default:
            return {};
        }
    }

    std::string resolvedEscapes(std::string_view value)
    {
        std::string text;
        text.reserve(value.size());
        for (std::size_t index = 0; index < value.size(); ++index) {
            const bool mayEscape = value[index] == '\\' && index + 1 < value.size();
            const std::optional<char> letter = mayEscape ? unescaped(value[index + 1]) : std::nullopt;
            text += letter.value_or(value[index]);
            index += letter ? 1 : 0;
        }
        return text;
    }

    void addPart(std::vector<std::string>& parts, std::string_view part)
    {
        if (const std::string_view trimmed = withoutBlanks(part); !trimmed.empty())
            parts.push_back(resolvedEscapes(trimmed));
    }

} // namespace

DesktopFile::DesktopFile(std::string_view bytes)
{
    constexpr std::string_view mark = "\xEF\xBB\xBF";
    if (bytes.size() > largestSize)
        return;
    if (bytes.substr(0, mark.size()) == mark)
        bytes.remove_prefix(mark.size());
    Group* group = nullptr;
    for (int number = 1; !bytes.empty(); ++number) {
        if (!takeLine(takeFirstLine(bytes), group) && _firstSkippedLine == 0)
            _firstSkippedLine = number;
    }
}

bool DesktopFile::takeLine(std::string_view line, Group*& group)
{
    const std::string_view content = withoutBlanks(line);
    if (content.empty() || content.front() == '#')
        return true;
    if (content.front() == '[') {
        const bool isGroup = content.size() > 2 && content.find(']') == content.size() - 1;
        // Keys below a heading that cannot be read must not fall to the group before it.
        group = isGroup ? &_groups[std::string(content.substr(1, content.size() - 2))] : nullptr;
        return isGroup;
    }
    const std::size_t equals = line.find('=');
    if (!group || equals == std::string_view::npos)
        return false;
    const std::string_view key = withoutBlanks(line.substr(0, equals));
    if (key.empty())
        return false;
    (*group)[std::string(key)] = withoutBlanksBefore(line.substr(equals + 1));
    return true;
}

bool DesktopFile::hasGroup(std::string_view group) const
{
    return _groups.find(group) != _groups.end();
}

const std::string* DesktopFile::value(std::string_view group, std::string_view key) const
{
    const auto found = _groups.find(group);
    if (found == _groups.end())
        return nullptr;
    const auto entry = found->second.find(key);
    return entry == found->second.end() ? nullptr : &entry->second;
}

std::optional<std::string> DesktopFile::text(std::string_view group, std::string_view key) const
{
    const std::string* found = value(group, key);
    return found ? std::optional(resolvedEscapes(*found)) : std::nullopt;
}

bool DesktopFile::isTrue(std::string_view group, std::string_view key) const
{
    const std::string* found = value(group, key);
    const std::string_view word = found ? withoutBlanksAfter(*found) : std::string_view();
    return word == "true" || word == "1";
}

std::vector<std::string> DesktopFile::list(std::string_view group, std::string_view key, char separator) const
{
    std::vector<std::string> parts;
    const std::string* found = value(group, key);
    if (!found)
        return parts;
    std::string part;
    for (std::size_t index = 0; index < found->size(); ++index) {
        const char letter = (*found)[index];
        const bool hasNext = letter == '\\' && index + 1 < found->size();
        if (hasNext && (*found)[index + 1] == separator) {
            part += separator;
            ++index;
        } else if (hasNext) {
            // Kept for later, so that the second of two backslashes escapes no separator.
            part.append(*found, index, 2);
            ++index;
        } else if (letter == separator) {
            addPart(parts, part);
            part.clear();
        } else {
            part += letter;
        }
    }
    addPart(parts, part);
    return parts;
}

} // namespace platform
