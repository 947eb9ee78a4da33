#include "platform/formats/JsonWriter.h"

#include "platform/formats/Base64.h"
#include "platform/formats/Dates.h"
#include "platform/formats/Unicode.h"

#include <algorithm>
#include <charconv>
#include <cmath>
#include <cstring>

namespace platform {
namespace {

    constexpr std::uint64_t everyByte(std::uint64_t byte)
    {
        return byte * 0x0101010101010101;
    }

    /// 0 when all eight are ASCII and may stand in a string as they are. A byte that may not borrows from those above
    /// it, so which ones may not is not told.
    std::uint64_t unplainBytes(std::uint64_t eight)
    {
        const std::uint64_t controls = eight - everyByte(0x20);
        const std::uint64_t quotes = (eight ^ everyByte('"')) - everyByte(1);
        const std::uint64_t backslashes = (eight ^ everyByte('\\')) - everyByte(1);
        return (eight | controls | quotes | backslashes) & everyByte(0x80);
    }

    bool isPlain(char letter)
    {
        return static_cast<unsigned char>(letter) >= 0x20 && static_cast<unsigned char>(letter) < 0x80 && letter != '"'
            && letter != '\\';
    }

    std::uint64_t eightFrom(const char* letters)
    {
        std::uint64_t eight = 0;
        std::memcpy(&eight, letters, sizeof eight);
        return eight;
    }

    bool arePlain(const char* letters)
    {
        return unplainBytes(eightFrom(letters)) == 0;
    }

    /// Whether all of `text` is ASCII and may stand in a string as it is.
    bool isPlain(std::string_view text)
    {
        constexpr std::size_t step = sizeof(std::uint64_t);
        if (text.size() < step)
            return std::all_of(text.begin(), text.end(), [](char letter) { return isPlain(letter); });
        // One decision for all, for it is the usual one. The last eight are looked at once more where they overlap.
        std::uint64_t unplain = unplainBytes(eightFrom(text.data() + text.size() - step));
        for (std::size_t end = step; end < text.size(); end += step)
            unplain |= unplainBytes(eightFrom(text.data() + end - step));
        return unplain == 0;
    }

    /// How many bytes from `start` on may stand in a string as they are.
    std::size_t plainRun(std::string_view text, std::size_t start)
    {
        constexpr std::size_t step = sizeof(std::uint64_t);
        std::size_t end = start;
        while (end < text.size()) {
            if (text.size() - end >= step && arePlain(text.data() + end)) {
                end += step;
                continue;
            }
            // The last few bytes, looked at once more together with those before them.
            if (text.size() - end < step && text.size() >= step && arePlain(text.data() + text.size() - step))
                return text.size() - start;
            const bool isAscii = static_cast<unsigned char>(text[end]) < 0x80;
            const std::size_t length = isAscii ? isPlain(text[end]) : lengthOfValidSequence(text.substr(end));
            if (length == 0)
                break;
            end += length;
        }
        return end - start;
    }

    struct Escape {
        char letters[6];
        std::size_t length;
    };

    Escape escapeFor(char letter)
    {
        constexpr std::string_view digits = "0123456789abcdef";
        switch (letter) {
        case '"':
        case '\\':
            return { { '\\', letter }, 2 };
        case '\n':
            return { { '\\', 'n' }, 2 };
        case '\r':
            return { { '\\', 'r' }, 2 };
        case '\t':
            return { { '\\', 't' }, 2 };
        default:
            const auto byte = static_cast<unsigned char>(letter);
            return { { '\\', 'u', '0', '0', digits[byte >> 4], digits[byte & 15] }, 6 };
        }
    }

    /// Hands on what stands for `text` between quotes.
    template <class Append> void escape(std::string_view text, const Append& append)
    {
        std::size_t position = 0;
        for (;;) {
            const std::size_t run = plainRun(text, position);
            append(text.substr(position, run));
            position += run;
            if (position == text.size())
                break;
            const char letter = text[position++];
            if (static_cast<unsigned char>(letter) >= 0x80) {
                append(replacementCharacter);
            } else {
                const Escape escape = escapeFor(letter);
                append(std::string_view(escape.letters, escape.length));
            }
        }
    }

} // namespace

JsonWriter::JsonWriter(Sink sink)
    : _sink(std::move(sink))
    , _block(std::make_unique_for_overwrite<char[]>(blockSize))
{
}

JsonWriter::~JsonWriter()
{
    flush();
}

void JsonWriter::key(std::string_view name)
{
    separate();
    quoted(name);
    append(':');
    _needsComma = false;
}

void JsonWriter::integer(std::int64_t integer)
{
    char digits[24];
    const std::to_chars_result end = std::to_chars(std::begin(digits), std::end(digits), integer);
    literal({ digits, static_cast<std::size_t>(end.ptr - digits) });
}

void JsonWriter::real(double real)
{
    if (!std::isfinite(real))
        return null();
    constexpr double largestWhole = 9007199254740992; // beyond it not every whole number is one of these
    const bool isWhole
        = std::abs(real) < largestWhole && real == std::floor(real) && (real != 0 || !std::signbit(real));
    char digits[40];
    char* last = std::end(digits) - 2;
    std::to_chars_result end
        = isWhole ? std::to_chars(digits, last, static_cast<std::int64_t>(real)) : std::to_chars(digits, last, real);
    const std::string_view shortest(digits, static_cast<std::size_t>(end.ptr - digits));
    if (isWhole || shortest.find_first_of(".e") == std::string_view::npos) {
        *end.ptr++ = '.';
        *end.ptr++ = '0';
    }
    literal({ digits, static_cast<std::size_t>(end.ptr - digits) });
}

void JsonWriter::string(std::string_view text)
{
    separate();
    quoted(text);
}

void JsonWriter::text(const Text& text)
{
    if (text.isAbsent())
        null();
    else
        string(text.view());
}

void JsonWriter::date(Date date)
{
    string(DateText(date, DateText::Fraction::nineDigits).view());
}

void JsonWriter::size(Size size)
{
    beginObject();
    plainKey("width");
    real(size.width);
    plainKey("height");
    real(size.height);
    endObject();
}

void JsonWriter::value(const Value& value)
{
    switch (value.kind()) {
    case Value::Kind::null:
        return null();
    case Value::Kind::boolean:
        return boolean(*value.boolean());
    case Value::Kind::integer:
        return integer(*value.integer());
    case Value::Kind::real:
        return real(*value.real());
    case Value::Kind::text:
        return text(*value.text());
    case Value::Kind::date:
        return date(*value.date());
    case Value::Kind::size:
        return size(*value.size());
    case Value::Kind::data:
        return string(encodeBase64(value.data()->bytes));
    case Value::Kind::list:
        beginList();
        for (const Value& item : *value.list())
            this->value(item);
        return endList();
    case Value::Kind::dictionary:
        beginObject();
        for (const Value::Entry& entry : *value.dictionary()) {
            key(entry.first);
            this->value(entry.second);
        }
        return endObject();
    }
}

void JsonWriter::json(std::span<const std::string_view> pieces)
{
    separate();
    for (const std::string_view piece : pieces)
        append(piece);
}

void JsonWriter::appendString(std::string& json, std::string_view text)
{
    if (isPlain(text))
        json.append(text);
    else
        escape(text, [&json](std::string_view bytes) { json.append(bytes); });
}

void JsonWriter::endDocument()
{
    append('\n');
    _needsComma = false;
}

void JsonWriter::flush()
{
    if (_length > 0)
        _sink({ _block.get(), _length });
    _length = 0;
}

void JsonWriter::begin(char bracket)
{
    separate();
    append(bracket);
    _needsComma = false;
}

void JsonWriter::end(char bracket)
{
    append(bracket);
    _needsComma = true;
}

void JsonWriter::literal(std::string_view text)
{
    separate();
    append(text);
}

void JsonWriter::quoted(std::string_view text)
{
    if (text.size() + 2 <= blockSize - _length && isPlain(text)) {
        char* end = _block.get() + _length;
        *end++ = '"';
        if (!text.empty())
            std::memcpy(end, text.data(), text.size());
        end[text.size()] = '"';
        _length += text.size() + 2;
        return;
    }
    append('"');
    escape(text, [this](std::string_view bytes) { append(bytes); });
    append('"');
}

void JsonWriter::separate()
{
    if (_needsComma)
        append(',');
    _needsComma = true;
}

void JsonWriter::append(char letter)
{
    if (_length == blockSize)
        flush();
    _block[_length++] = letter;
}

void JsonWriter::append(std::string_view bytes)
{
    if (bytes.size() > blockSize - _length)
        return appendBeyondBlock(bytes);
    std::copy(bytes.begin(), bytes.end(), _block.get() + _length);
    _length += bytes.size();
}

void JsonWriter::appendBeyondBlock(std::string_view bytes)
{
    flush();
    if (bytes.size() > blockSize)
        _sink(bytes);
    else
        append(bytes);
}

} // namespace platform
