#include "platform/formats/Json.h"

#include "platform/formats/Duplicates.h"
#include "platform/formats/Quoted.h"
#include "platform/formats/Unicode.h"

#include <rapidjson/memorystream.h>
#include <rapidjson/reader.h>

#include <algorithm>
#include <charconv>
#include <optional>

namespace platform {
namespace {

    constexpr std::size_t deepestLevel = 256;
    constexpr std::size_t mostValues = 1'000'000;

    struct Place {
        int line = 1;
        int column = 1;
    };

    /// Goes through the document once, from token to token, and knows the line.
    class Cursor {
    public:
        explicit Cursor(std::string_view bytes)
            : _bytes(bytes)
        {
        }

        /// Moves to `offset`, which lies not before the last one.
        Place moveTo(std::size_t offset)
        {
            for (; _offset < std::min(offset, _bytes.size()); ++_offset) {
                if (_bytes[_offset] == '\n') {
                    ++_place.line;
                    _place.column = 0;
                }
                ++_place.column;
            }
            return _place;
        }

        /// Moves to the first byte of the next token, and behind all of it, which ends at `end` or is one letter long.
        Place passToken(std::size_t end)
        {
            const std::size_t start = startOfNextToken();
            const Place place = moveTo(start);
            moveTo(std::max(end, start + 1));
            return place;
        }

        /// The text that begins at the next token, as it is written there, up to its end or that of its line; absent
        /// when that token is no text.
        std::optional<std::string_view> writtenText() const
        {
            const std::size_t start = startOfNextToken();
            if (start == _bytes.size() || _bytes[start] != '"')
                return std::nullopt;
            std::size_t end = start + 1;
            while (end < _bytes.size() && _bytes[end] != '"' && _bytes[end] != '\n')
                end += _bytes[end] == '\\' ? 2 : 1;
            return _bytes.substr(start + 1, std::min(end, _bytes.size()) - start - 1);
        }

    private:
        std::size_t startOfNextToken() const
        {
            return std::min(_bytes.find_first_not_of(" \t\r\n,:", _offset), _bytes.size());
        }

        std::string_view _bytes;
        std::size_t _offset = 0;
        Place _place;
    };

    std::string problemAt(Place place, std::string_view what)
    {
        return std::to_string(place.line) + ": " + std::string(what);
    }

    std::string_view reasonFor(const rapidjson::ParseResult& outcome, std::string_view bytes)
    {
        constexpr std::string_view controlCharacter = "a text holds a line break or another control character";
        switch (outcome.Code()) {
        case rapidjson::kParseErrorDocumentEmpty:
            return "the document is empty";
        case rapidjson::kParseErrorDocumentRootNotSingular:
            return "text follows the end of the document";
        case rapidjson::kParseErrorObjectMissName:
            return "a key in double quotes is missing";
        case rapidjson::kParseErrorObjectMissColon:
            return "a colon is missing after a key";
        case rapidjson::kParseErrorObjectMissCommaOrCurlyBracket:
            return "a comma or a closing brace is missing";
        case rapidjson::kParseErrorArrayMissCommaOrSquareBracket:
            return "a comma or a closing bracket is missing";
        case rapidjson::kParseErrorStringUnicodeEscapeInvalidHex:
        case rapidjson::kParseErrorStringUnicodeSurrogateInvalid:
        case rapidjson::kParseErrorStringEscapeInvalid:
            // Some versions of the parser tell a bare control character so.
            if (outcome.Offset() < bytes.size() && static_cast<unsigned char>(bytes[outcome.Offset()]) < 0x20)
                return controlCharacter;
            return "a text has a wrong escape";
        case rapidjson::kParseErrorStringMissQuotationMark:
            return "the closing quote of a text is missing";
        case rapidjson::kParseErrorStringInvalidEncoding:
            return controlCharacter;
        case rapidjson::kParseErrorNumberTooBig:
        case rapidjson::kParseErrorNumberMissFraction:
        case rapidjson::kParseErrorNumberMissExponent:
            return "a number is too big or incomplete";
        default:
            return "this is no JSON value";
        }
    }

    /// Takes the parser's events and builds the tree; each answer is whether to go on.
    class Builder {
    public:
        using Ch = char;

        Builder(std::string_view bytes, const rapidjson::MemoryStream& stream)
            : _cursor(bytes)
            , _stream(stream)
        {
        }

        bool Null() { return addLeaf(newNode(JsonNode::Kind::null)); }
        bool Bool(bool boolean)
        {
            JsonNode node = newNode(JsonNode::Kind::boolean);
            node.boolean = boolean;
            return addLeaf(std::move(node));
        }
        // Numbers arrive as text, see RawNumber.
        bool Int(int) { return false; }
        bool Uint(unsigned) { return false; }
        bool Int64(std::int64_t) { return false; }
        bool Uint64(std::uint64_t) { return false; }
        bool Double(double) { return false; }
        bool RawNumber(const char* digits, rapidjson::SizeType length, bool)
        {
            JsonNode node = newNode(JsonNode::Kind::integer);
            const char* end = digits + length;
            if (const auto outcome = std::from_chars(digits, end, node.integer);
                outcome.ec == std::errc() && outcome.ptr == end) {
                node.real = static_cast<double>(node.integer);
                return addLeaf(std::move(node));
            }
            node.kind = JsonNode::Kind::real;
            node.integer = 0;
            if (std::from_chars(digits, end, node.real).ec != std::errc())
                return fail({ node.line, node.column }, keyAtWork() + "a number is out of range");
            return addLeaf(std::move(node));
        }
        bool String(const char* bytes, rapidjson::SizeType length, bool)
        {
            JsonNode node = newNode(JsonNode::Kind::text);
            node.text.assign(bytes, length);
            return checkText(node.text, { node.line, node.column }) && addLeaf(std::move(node));
        }
        bool Key(const char* bytes, rapidjson::SizeType length, bool)
        {
            const Place place = _cursor.passToken(_stream.Tell());
            _open.back().members.push_back({ std::string(bytes, length), place.line, place.column, {} });
            return checkText(_open.back().members.back().key, place);
        }
        bool StartObject() { return open(JsonNode::Kind::object); }
        bool EndObject(rapidjson::SizeType)
        {
            const std::vector<JsonMember>& members = _open.back().members;
            const auto keyAt = [&](std::size_t index) { return std::string_view(members[index].key); };
            if (const auto repeated = firstRepeatedKey(members.size(), keyAt)) {
                const JsonMember& member = members[*repeated];
                return fail({ member.line, member.column }, "key " + quoted(member.key) + " occurs twice");
            }
            return close();
        }
        bool StartArray() { return open(JsonNode::Kind::list); }
        bool EndArray(rapidjson::SizeType) { return close(); }

        /// What a message about the place where the parser stopped begins with: the key whose text or value it is in,
        /// or which is the last before it. Empty where no key is near.
        std::string keyAtWork() const
        {
            for (auto level = _open.rbegin(); level != _open.rend(); ++level) {
                if (level->kind != JsonNode::Kind::object)
                    continue;
                const bool isBetweenMembers = level->members.empty() || level->members.back().value.line > 0;
                if (!isBetweenMembers)
                    return namedKey(level->members.back().key);
                if (const auto key = _cursor.writtenText())
                    return namedKey(*key);
                if (!level->members.empty())
                    return "after " + namedKey(level->members.back().key);
            }
            return {};
        }

        JsonNode takeRoot() { return std::move(_root); }
        const std::string& problem() const { return _problem; }

    private:
        JsonNode newNode(JsonNode::Kind kind)
        {
            const Place place = _cursor.passToken(_stream.Tell());
            JsonNode node;
            node.kind = kind;
            node.line = place.line;
            node.column = place.column;
            return node;
        }

        bool fail(Place place, const std::string& what)
        {
            _problem = problemAt(place, what);
            return false;
        }

        static std::string namedKey(std::string_view key) { return "key " + quoted(key) + ": "; }

        bool checkText(std::string_view text, Place place)
        {
            // An escape can name half of a surrogate pair, which no UTF-8 holds.
            return lengthOfValidPrefix(text) == text.size() || fail(place, keyAtWork() + "a text has a wrong escape");
        }

        bool addLeaf(JsonNode node)
        {
            if (++_values > mostValues)
                return fail({ node.line, node.column }, "the document holds too many values");
            add(std::move(node));
            return true;
        }

        void add(JsonNode node)
        {
            if (_open.empty())
                _root = std::move(node);
            else if (_open.back().kind == JsonNode::Kind::object)
                _open.back().members.back().value = std::move(node);
            else
                _open.back().items.push_back(std::move(node));
        }

        bool open(JsonNode::Kind kind)
        {
            JsonNode node = newNode(kind);
            const Place place { node.line, node.column };
            if (_open.size() == deepestLevel)
                return fail(place, "the document is nested too deeply");
            if (++_values > mostValues)
                return fail(place, "the document holds too many values");
            _open.push_back(std::move(node));
            return true;
        }

        bool close()
        {
            _cursor.passToken(_stream.Tell());
            JsonNode node = std::move(_open.back());
            _open.pop_back();
            add(std::move(node));
            return true;
        }

        Cursor _cursor;
        const rapidjson::MemoryStream& _stream;
        std::vector<JsonNode> _open;
        JsonNode _root;
        std::string _problem;
        std::size_t _values = 0;
    };

    /// How parsing `bytes` ended.
    struct Parsing {
        explicit Parsing(std::string_view bytes)
            : stream(bytes.data() ? bytes.data() : "", bytes.size())
            , builder(bytes, stream)
        {
            // Its own conversion to the nearest real relies on undefined behaviour for some spellings of zero.
            constexpr unsigned flags = rapidjson::kParseIterativeFlag | rapidjson::kParseNumbersAsStringsFlag;
            outcome = rapidjson::Reader().Parse<flags>(stream, builder);
        }

        rapidjson::MemoryStream stream;
        Builder builder;
        rapidjson::ParseResult outcome {};
    };

    /// What is wrong with the byte at `offset`, told with the key it belongs to.
    std::string problemWithByte(std::string_view bytes, std::size_t offset, std::string_view what)
    {
        const std::string key = Parsing(bytes.substr(0, offset)).builder.keyAtWork();
        return problemAt(Cursor(bytes).moveTo(offset), key + std::string(what));
    }

    std::string problemWithBytes(std::string_view bytes)
    {
        if (bytes.size() > largestJsonDocument)
            return "1: the document is larger than 16 MiB";
        // The parser takes a zero byte for the end of the document.
        if (const std::size_t zero = bytes.find('\0'); zero != std::string_view::npos)
            return problemWithByte(bytes, zero, "the document holds a zero byte");
        if (const std::size_t end = lengthOfValidPrefix(bytes); end != bytes.size())
            return problemWithByte(bytes, end, "the document is not UTF-8");
        return {};
    }

} // namespace

const JsonNode* JsonNode::member(std::string_view key) const noexcept
{
    for (const JsonMember& member : members) {
        if (member.key == key)
            return &member.value;
    }
    return nullptr;
}

JsonResult readJson(std::string_view bytes)
{
    constexpr std::string_view mark = "\xEF\xBB\xBF";
    if (bytes.substr(0, mark.size()) == mark)
        bytes.remove_prefix(mark.size());
    JsonResult result;
    result.problem = problemWithBytes(bytes);
    if (!result.problem.empty())
        return result;

    Parsing parsing(bytes);
    const rapidjson::ParseResult& outcome = parsing.outcome;
    if (!parsing.builder.problem().empty())
        result.problem = parsing.builder.problem();
    else if (outcome.IsError())
        result.problem = problemAt(Cursor(bytes).moveTo(outcome.Offset()),
            parsing.builder.keyAtWork() + std::string(reasonFor(outcome, bytes)));
    else
        result.root = parsing.builder.takeRoot();
    return result;
}

} // namespace platform
