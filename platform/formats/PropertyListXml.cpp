// Expat tells the elements, and a stack of open containers takes them; nothing here calls itself, so no depth of
// nesting can exhaust the stack. Once something is wrong, every further event is ignored.

#include "platform/formats/PropertyListReaders.h"

#include "platform/formats/Base64.h"
#include "platform/formats/Dates.h"
#include "platform/formats/Duplicates.h"
#include "platform/formats/Quoted.h"

#include <expat.h>

#include <algorithm>
#include <array>
#include <charconv>
#include <cmath>
#include <limits>
#include <memory>
#include <optional>
#include <vector>

namespace platform {
namespace {

    constexpr std::string_view whiteSpace = " \t\r\n";

    enum class Element { plist, dictionary, array, key, string, data, date, integer, real, isTrue, isFalse };

    constexpr std::array<std::string_view, 11> elementNames { "plist", "dict", "array", "key", "string", "data", "date",
        "integer", "real", "true", "false" };

    std::string tag(Element element)
    {
        return "<" + std::string(elementNames[static_cast<std::size_t>(element)]) + ">";
    }

    std::optional<Element> elementNamed(std::string_view name)
    {
        const auto found = std::find(elementNames.begin(), elementNames.end(), name);
        if (found == elementNames.end())
            return {};
        return static_cast<Element>(found - elementNames.begin());
    }

    bool isContainer(Element element)
    {
        return element == Element::plist || element == Element::dictionary || element == Element::array;
    }

    std::string_view trimmed(std::string_view text)
    {
        const std::size_t start = text.find_first_not_of(whiteSpace);
        return start == std::string_view::npos ? std::string_view()
                                               : text.substr(start, text.find_last_not_of(whiteSpace) - start + 1);
    }

    bool takeSign(std::string_view& text)
    {
        const bool isNegative = !text.empty() && text.front() == '-';
        if (isNegative || (!text.empty() && text.front() == '+'))
            text.remove_prefix(1);
        return isNegative;
    }

    /// Decimal, or hexadecimal after 0x.
    std::optional<Value> integerValue(std::string_view text)
    {
        const bool isNegative = takeSign(text);
        const bool isHexadecimal = text.substr(0, 2) == "0x" || text.substr(0, 2) == "0X";
        if (isHexadecimal)
            text.remove_prefix(2);
        std::uint64_t size = 0;
        const char* end = text.data() + text.size();
        const std::from_chars_result outcome = std::from_chars(text.data(), end, size, isHexadecimal ? 16 : 10);
        if (outcome.ec != std::errc() || outcome.ptr != end)
            return {};
        constexpr auto largest = static_cast<std::uint64_t>(std::numeric_limits<std::int64_t>::max());
        if (size <= largest)
            return Value(isNegative ? -static_cast<std::int64_t>(size) : static_cast<std::int64_t>(size));
        if (isNegative)
            return size == largest + 1 ? std::optional(Value(std::numeric_limits<std::int64_t>::min())) : std::nullopt;
        return Value(static_cast<double>(size));
    }

    std::optional<Value> realValue(std::string_view text)
    {
        const bool isNegative = takeSign(text);
        if (text.empty() || text.front() == '-' || text.find('(') != std::string_view::npos)
            return {};
        double size = 0;
        const char* end = text.data() + text.size();
        const std::from_chars_result outcome = std::from_chars(text.data(), end, size);
        if (outcome.ec != std::errc() || outcome.ptr != end)
            return {};
        return Value(std::copysign(size, isNegative ? -1.0 : 1.0));
    }

    std::optional<Value> leafValue(Element element, std::string_view text)
    {
        switch (element) {
        case Element::string:
            return Value(text);
        case Element::data:
            if (const std::optional<std::string> bytes = decodeBase64(text))
                return Value(Value::Data { Text(*bytes) });
            return {};
        case Element::date:
            if (const std::optional<Date> date = readDate(trimmed(text)))
                return Value(*date);
            return {};
        case Element::integer:
            return integerValue(trimmed(text));
        case Element::real:
            return realValue(trimmed(text));
        case Element::isTrue:
        case Element::isFalse:
            return trimmed(text).empty() ? std::optional(Value(element == Element::isTrue)) : std::nullopt;
        default:
            return {};
        }
    }

    /// An element that holds others, and what it holds so far.
    struct Container {
        Element element = Element::plist;
        Value::List items;
        Value::Dictionary entries; // the last one's value is still missing while `awaitsValue`
        std::vector<std::uint32_t> keyLines;
        bool awaitsValue = false;
    };

    class XmlReader {
    public:
        explicit XmlReader(std::string_view bytes);
        PropertyListResult read();

    private:
        static XmlReader& reader(void* data) { return *static_cast<XmlReader*>(data); }

        void startElement(std::string_view name);
        void endElement();
        void addText(std::string_view text);
        std::string problemWithStart(Element element) const;
        void endContainer();
        void endLeaf();
        void addValue(Value value);
        void fail(const std::string& what);
        void failAtLine(std::size_t line, const std::string& what);
        std::size_t line() const { return _linesSkipped + XML_GetCurrentLineNumber(_parser.get()); }

        const std::unique_ptr<std::remove_pointer_t<XML_Parser>, decltype(&XML_ParserFree)> _parser;
        std::string_view _bytes;
        std::size_t _linesSkipped = 0;
        std::vector<Container> _open;
        std::optional<Element> _leaf;
        std::string _text;
        std::size_t _values = 0;
        PropertyListResult _result;
    };

    XmlReader::XmlReader(std::string_view bytes)
        : _parser(XML_ParserCreate(nullptr), &XML_ParserFree)
        , _bytes(bytes)
    {
        constexpr std::string_view mark = "\xEF\xBB\xBF";
        if (_bytes.substr(0, mark.size()) == mark)
            _bytes.remove_prefix(mark.size());
        // An XML declaration must be the very first thing; editors leave white space before it all the same.
        const std::size_t start = std::min(_bytes.find_first_not_of(whiteSpace), _bytes.size());
        _linesSkipped = static_cast<std::size_t>(
            std::count(_bytes.begin(), _bytes.begin() + static_cast<std::ptrdiff_t>(start), '\n'));
        _bytes.remove_prefix(start);
    }

    PropertyListResult XmlReader::read()
    {
        XML_Parser parser = _parser.get();
        if (!parser)
            return { {}, "there is no memory to read the property list" };
        XML_SetUserData(parser, this);
        XML_SetElementHandler(
            parser, [](void* data, const XML_Char* name, const XML_Char**) { reader(data).startElement(name); },
            [](void* data, const XML_Char*) { reader(data).endElement(); });
        XML_SetCharacterDataHandler(parser, [](void* data, const XML_Char* text, int length) {
            reader(data).addText({ text, static_cast<std::size_t>(length) });
        });
        XML_SetEntityDeclHandler(parser,
            [](void* data, const XML_Char*, int, const XML_Char*, int, const XML_Char*, const XML_Char*,
                const XML_Char*, const XML_Char*) { reader(data).fail("the property list declares an entity"); });
        // Without this, an entity that only an outer document type could declare would vanish from the text.
        XML_SetSkippedEntityHandler(
            parser, [](void* data, const XML_Char* name, int) { reader(data).fail("unknown entity " + quoted(name)); });

        const XML_Status status = XML_Parse(parser, _bytes.data(), static_cast<int>(_bytes.size()), XML_TRUE);
        if (status != XML_STATUS_OK && _result.problem.empty())
            fail(XML_ErrorString(XML_GetErrorCode(parser)));
        if (!_result.problem.empty())
            _result.value = {};
        return std::move(_result);
    }

    void XmlReader::startElement(std::string_view name)
    {
        if (!_result.problem.empty())
            return;
        const std::optional<Element> element = elementNamed(name);
        if (!element)
            return fail("unknown element " + quoted(name));
        if (const std::string problem = problemWithStart(*element); !problem.empty())
            return fail(problem);
        if (++_values > mostPropertyListValues)
            return fail("the property list holds too many values");
        if (!isContainer(*element)) {
            _leaf = *element;
            _text.clear();
        } else if (_open.size() > deepestPropertyList) {
            fail("the property list is nested too deeply");
        } else {
            _open.emplace_back().element = *element;
        }
    }

    std::string XmlReader::problemWithStart(Element element) const
    {
        if (_leaf)
            return tag(element) + " cannot stand inside " + tag(*_leaf);
        if (_open.empty())
            return element == Element::plist ? "" : "the outermost element is " + tag(element) + ", not <plist>";
        const Container& container = _open.back();
        const bool takesKey = container.element == Element::dictionary && !container.awaitsValue;
        if (element == Element::plist)
            return "<plist> cannot stand inside another element";
        if (element == Element::key && container.awaitsValue)
            return "key " + quoted(container.entries.back().first) + " has no value";
        if (element == Element::key && !takesKey)
            return "<key> cannot stand outside a <dict>";
        if (takesKey && element != Element::key)
            return tag(element) + " stands in a <dict> without a key";
        if (container.element == Element::plist && !container.items.empty())
            return "<plist> holds a second value";
        return {};
    }

    void XmlReader::endElement()
    {
        if (!_result.problem.empty())
            return;
        if (_leaf)
            endLeaf();
        else
            endContainer();
    }

    void XmlReader::endLeaf()
    {
        const Element element = *_leaf;
        _leaf.reset();
        if (element == Element::key) {
            Container& dictionary = _open.back();
            dictionary.entries.emplace_back(Text(_text), Value());
            dictionary.keyLines.push_back(static_cast<std::uint32_t>(line()));
            dictionary.awaitsValue = true;
        } else if (std::optional<Value> value = leafValue(element, _text)) {
            addValue(std::move(*value));
        } else {
            fail(quoted(trimmed(_text)) + " is no valid " + tag(element));
        }
    }

    void XmlReader::endContainer()
    {
        Container container = std::move(_open.back());
        _open.pop_back();
        if (container.element == Element::plist) {
            if (container.items.empty())
                return fail("<plist> holds no value");
            _result.value = std::move(container.items.front());
        } else if (container.element == Element::array) {
            addValue(Value(std::move(container.items)));
        } else {
            if (container.awaitsValue)
                return fail("key " + quoted(container.entries.back().first) + " has no value");
            const auto keyAt = [&](std::size_t index) { return container.entries[index].first.view(); };
            if (const auto repeated = firstRepeatedKey(container.entries.size(), keyAt))
                return failAtLine(container.keyLines[*repeated], "key " + quoted(keyAt(*repeated)) + " occurs twice");
            addValue(Value(std::move(container.entries)));
        }
    }

    void XmlReader::addValue(Value value)
    {
        Container& container = _open.back();
        if (container.element == Element::dictionary) {
            container.entries.back().second = std::move(value);
            container.awaitsValue = false;
        } else {
            container.items.push_back(std::move(value));
        }
    }

    void XmlReader::addText(std::string_view text)
    {
        if (!_result.problem.empty())
            return;
        if (_leaf)
            _text.append(text);
        else if (!trimmed(text).empty())
            fail("text " + quoted(trimmed(text)) + " stands outside any value");
    }

    void XmlReader::fail(const std::string& what)
    {
        const auto column = std::to_string(XML_GetCurrentColumnNumber(_parser.get()) + 1);
        failAtLine(line(), what);
        _result.problem.insert(_result.problem.find(':'), ", column " + column);
    }

    void XmlReader::failAtLine(std::size_t line, const std::string& what)
    {
        _result.problem = "line " + std::to_string(line) + ": " + what;
        XML_StopParser(_parser.get(), XML_FALSE);
    }

} // namespace

PropertyListResult readXmlPropertyList(std::string_view bytes)
{
    return XmlReader(bytes).read();
}

} // namespace platform
