#include "apps/ombrix/TreeDocument.h"

#include "host/OBConstants.h"
#include "host/OBTextComparison.h"
#include "platform/PathText.h"

#include <algorithm>
#include <charconv>
#include <map>
#include <unordered_map>

namespace ombrix {
namespace {

    constexpr std::string_view nothing = "null";

    std::string_view withoutQuotes(std::string_view value)
    {
        return value.size() >= 2 && value.front() == '"' ? value.substr(1, value.size() - 2) : std::string_view();
    }

    /// Goes through a document once.
    class DocumentReader {
    public:
        explicit DocumentReader(std::string_view text)
            : _text(text)
        {
        }

        char next()
        {
            while (_at < _text.size() && (_text[_at] == ' ' || _text[_at] == '\n' || _text[_at] == ','))
                ++_at;
            return _at < _text.size() ? _text[_at] : '\0';
        }
        bool take(char letter)
        {
            if (next() != letter)
                return false;
            ++_at;
            return true;
        }
        /// A key without its quotes, and the colon after it.
        std::string_view takeKey()
        {
            const std::string_view key = takeValue();
            take(':');
            return key.size() < 2 ? std::string_view() : key.substr(1, key.size() - 2);
        }
        std::string_view takeValue()
        {
            next();
            const std::size_t start = _at;
            std::size_t depth = 0;
            do {
                if (_at >= _text.size())
                    break;
                const char letter = _text[_at];
                if (letter == '"') {
                    passString();
                    continue;
                }
                depth += letter == '{' || letter == '[';
                depth -= letter == '}' || letter == ']';
                ++_at;
            } while (depth > 0 || isInsideLiteral(start));
            return _text.substr(start, _at - start);
        }

    private:
        void passString()
        {
            ++_at;
            while (_at < _text.size() && _text[_at] != '"')
                _at += _text[_at] == '\\' ? 2 : 1;
            _at = std::min(_at + 1, _text.size());
        }
        /// Numbers and words end where something else begins.
        bool isInsideLiteral(std::size_t start) const
        {
            constexpr std::string_view begins = "\"{[";
            constexpr std::string_view ends = ",]} \n:";
            return begins.find(_text[start]) == begins.npos && _at < _text.size() && ends.find(_text[_at]) == ends.npos;
        }

        const std::string_view _text;
        std::size_t _at = 0;
    };

    class TreeReader {
    public:
        explicit TreeReader(std::string bytes) { _tree.bytes = std::make_shared<const std::string>(std::move(bytes)); }

        std::optional<TreeDocument> read()
        {
            DocumentReader reader(*_tree.bytes);
            if (!begin(reader))
                return std::nullopt;
            while (!_open.empty()) {
                if (!step(reader))
                    return std::nullopt;
            }
            return std::move(_tree);
        }

    private:
        struct Open {
            std::size_t group;
            bool isInChildren = false;
        };

        bool begin(DocumentReader& reader)
        {
            if (!reader.take('{'))
                return false;
            const std::size_t group = _tree.groups.size();
            DocumentGroup& begun = _tree.groups.emplace_back();
            if (!_open.empty()) {
                begun.parent = _open.back().group;
                _tree.groups[begun.parent].children.push_back(group);
            }
            _open.push_back({ group });
            return true;
        }

        bool step(DocumentReader& reader)
        {
            if (_open.back().isInChildren) {
                if (!reader.take(']'))
                    return begin(reader);
                _open.back().isInChildren = false;
                return true;
            }
            if (reader.take('}')) {
                _open.pop_back();
                return true;
            }
            return reader.next() == '"' && takeMember(reader);
        }

        bool takeMember(DocumentReader& reader)
        {
            DocumentGroup& group = _tree.groups[_open.back().group];
            const std::string_view key = reader.takeKey();
            if (key == "childGroups") {
                _open.back().isInChildren = true;
                return reader.take('[');
            }
            if (key != "mediaObjects") {
                group.facts.emplace_back(key, reader.takeValue());
                return true;
            }
            if (!reader.take('['))
                return false;
            while (reader.next() == '{')
                group.objects.push_back(reader.takeValue());
            return reader.take(']');
        }

        TreeDocument _tree {};
        std::vector<Open> _open {};
    };

    void appendCodePoint(std::string& text, unsigned code)
    {
        if (code < 0x80) {
            text += static_cast<char>(code);
        } else if (code < 0x800) {
            text += { static_cast<char>(0xC0 | code >> 6), static_cast<char>(0x80 | (code & 0x3F)) };
        } else {
            text += { static_cast<char>(0xE0 | code >> 12), static_cast<char>(0x80 | (code >> 6 & 0x3F)),
                static_cast<char>(0x80 | (code & 0x3F)) };
        }
    }

    /// Our own writer escapes control characters alone by number.
    std::size_t appendEscape(std::string& text, std::string_view escape)
    {
        constexpr std::string_view letters = "bfnrt";
        constexpr std::string_view meant = "\b\f\n\r\t";
        if (escape[0] == 'u' && escape.size() >= 5) {
            unsigned code = 0;
            std::from_chars(escape.data() + 1, escape.data() + 5, code, 16);
            appendCodePoint(text, code);
            return 5;
        }
        const std::size_t known = letters.find(escape[0]);
        text += known == letters.npos ? escape[0] : meant[known];
        return 1;
    }

    /// The place of each child of the root in their order, by its path.
    std::unordered_map<std::string_view, std::size_t> ranksOfPaths(const TreeDocument& tree)
    {
        std::unordered_map<std::string_view, std::size_t> ranks;
        const std::vector<std::size_t>& children = tree.groups.front().children;
        for (std::size_t rank = 0; rank < children.size(); ++rank) {
            if (!tree.isTopLevelEventLibrary(children[rank]))
                ranks.emplace(withoutQuotes(tree.groups[children[rank]].fact("path")), rank);
        }
        return ranks;
    }

    /// The place of the child that a representative stands for; clips of events come last.
    std::size_t rankOfObject(
        std::string_view object, const std::unordered_map<std::string_view, std::size_t>& ranks, std::size_t last)
    {
        std::string_view path = withoutQuotes(memberOf(memberOf(object, "attributes"), "Project Path"));
        for (; path.size() > 1; path = platform::pathByRemovingLastComponent(path)) {
            if (const auto known = ranks.find(path); known != ranks.end())
                return known->second;
        }
        return last;
    }

    void sortObjects(TreeDocument& tree)
    {
        const auto ranks = ranksOfPaths(tree);
        std::vector<std::pair<std::size_t, std::string_view>> ranked;
        DocumentGroup& root = tree.groups.front();
        for (const std::string_view object : root.objects)
            ranked.emplace_back(rankOfObject(object, ranks, root.children.size()), object);
        std::stable_sort(
            ranked.begin(), ranked.end(), [](const auto& left, const auto& right) { return left.first < right.first; });
        for (std::size_t index = 0; index < ranked.size(); ++index)
            root.objects[index] = ranked[index].second;
    }

} // namespace

std::string_view DocumentGroup::fact(std::string_view key) const
{
    for (const auto& [name, value] : facts) {
        if (name == key)
            return value;
    }
    return nothing;
}

bool TreeDocument::isTopLevelEventLibrary(std::size_t group) const
{
    return withoutQuotes(groups[group].fact("typeIdentifier"))
        == std::string_view(OBMontaroEventLibraryGroupTypeIdentifier->text());
}

std::optional<TreeDocument> readTreeDocument(std::string bytes)
{
    return TreeReader(std::move(bytes)).read();
}

std::string_view memberOf(std::string_view value, std::string_view key)
{
    DocumentReader reader(value);
    if (!reader.take('{'))
        return nothing;
    while (reader.next() == '"') {
        const std::string_view name = reader.takeKey();
        const std::string_view member = reader.takeValue();
        if (name == key)
            return member;
    }
    return nothing;
}

std::string textOfValue(std::string_view value)
{
    value = withoutQuotes(value);
    std::string text;
    for (std::size_t at = 0; at < value.size(); ++at) {
        if (value[at] == '\\' && at + 1 < value.size())
            at += appendEscape(text, value.substr(at + 1));
        else
            text += value[at];
    }
    return text;
}

void sortAsSource(TreeDocument& tree)
{
    struct Key {
        bool isEvents;
        std::string name;
        std::string_view identifier;
    };
    std::map<std::size_t, Key> keys;
    std::vector<std::size_t>& children = tree.groups.front().children;
    for (const std::size_t child : children) {
        const DocumentGroup& group = tree.groups[child];
        keys[child] = { tree.isTopLevelEventLibrary(child), textOfValue(group.fact("name")), group.fact("ID") };
    }
    std::stable_sort(children.begin(), children.end(), [&keys](std::size_t left, std::size_t right) {
        const Key& one = keys.at(left);
        const Key& other = keys.at(right);
        if (one.isEvents != other.isEvents)
            return other.isEvents;
        const int order = OBCaseInsensitiveCompare(one.name, other.name);
        return order != 0 ? order < 0 : one.identifier < other.identifier;
    });
    sortObjects(tree);
}

} // namespace ombrix
