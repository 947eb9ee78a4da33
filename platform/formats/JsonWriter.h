#pragma once

#include "platform/Value.h"

#include <cstddef>
#include <cstdint>
#include <cstring>
#include <functional>
#include <memory>
#include <span>
#include <string>
#include <string_view>

namespace platform {

/// Writes JSON in one pass, without a document in memory: what is written is collected in blocks of 64 KiB, and each
/// full block is handed to a sink.
///
/// The caller sees to it that keys stand in objects and that what was begun is ended; commas are written here. Every
/// document is valid UTF-8 whatever bytes the texts hold. One thread at a time.
class JsonWriter {
public:
    /// Takes the bytes written so far; they are valid during the call only.
    using Sink = std::function<void(std::string_view)>;

    explicit JsonWriter(Sink sink);
    JsonWriter(const JsonWriter&) = delete;
    JsonWriter& operator=(const JsonWriter&) = delete;
    /// Hands over what is left.
    ~JsonWriter();

    void beginObject() { begin('{'); }
    void endObject() { end('}'); }
    void beginList() { begin('['); }
    void endList() { end(']'); }
    /// The key of the value that is written next.
    void key(std::string_view name);
    /// The same for a name known to be short and of ASCII in which nothing has to be escaped: nobody looks for it.
    void plainKey(std::string_view name)
    {
        makeRoomFor(name.size() + 4);
        char* end = _block.get() + _length;
        if (_needsComma)
            *end++ = ',';
        *end++ = '"';
        std::memcpy(end, name.data(), name.size());
        end += name.size();
        *end++ = '"';
        *end++ = ':';
        _length = static_cast<std::size_t>(end - _block.get());
        _needsComma = false;
    }

    void null() { literal("null"); }
    void boolean(bool boolean) { literal(boolean ? "true" : "false"); }
    void integer(std::int64_t integer);
    /// The shortest text that reads back as the same number, with a fraction or an exponent (1920.0); null for what is
    /// no finite number.
    void real(double real);
    /// Each byte that is no UTF-8 is written as U+FFFD.
    void string(std::string_view text);
    /// Null for an absent text.
    void text(const Text& text);
    /// A text in UTC with nine digits of fraction.
    void date(Date date);
    /// {"width", "height"}
    void size(Size size);
    /// Any value by its kind; data as Base64.
    void value(const Value& value);

    /// A value whose JSON stands ready, in pieces.
    void json(std::span<const std::string_view> pieces);
    /// Appends what `string` puts between the quotes.
    static void appendString(std::string& json, std::string_view text);

    /// Ends a document with a line feed; another one may follow.
    void endDocument();
    /// Hands what was collected to the sink.
    void flush();

private:
    static constexpr std::size_t blockSize = 64 * 1024;

    /// At most a block.
    void makeRoomFor(std::size_t length)
    {
        if (length > blockSize - _length)
            flush();
    }
    void begin(char bracket);
    void end(char bracket);
    void literal(std::string_view text);
    void quoted(std::string_view text);
    void separate();
    void append(char letter);
    void append(std::string_view bytes);
    void appendBeyondBlock(std::string_view bytes);

    const Sink _sink;
    const std::unique_ptr<char[]> _block;
    std::size_t _length = 0;
    bool _needsComma = false;
};

} // namespace platform
