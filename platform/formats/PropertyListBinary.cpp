// A binary property list is a table of objects that refer to each other by number. Each object is read once, however
// many refer to it, and the number of values that somebody who walks through the result would meet is counted as it
// grows: a few hundred bytes can otherwise stand for more values than any memory holds.

#include "platform/formats/PropertyListReaders.h"

#include "platform/formats/Duplicates.h"
#include "platform/formats/PropertyListObjects.h"
#include "platform/formats/Quoted.h"

#include <algorithm>
#include <optional>
#include <vector>

namespace platform {
namespace {

    constexpr std::size_t headerSize = 8;
    constexpr std::size_t trailerSize = 32;

    using FixedReader = std::optional<Value>(std::string_view);

    enum class State : std::uint8_t { unread, open, read };

    struct Object {
        Value value;
        std::uint32_t values = 1; // the object itself and all that it holds, shared ones each time
        std::uint16_t height = 0; // levels below it
        State state = State::unread;
    };

    /// A list or dictionary whose references are being followed.
    struct Container {
        std::size_t object = 0;
        std::size_t references = 0; // offset of the first; a dictionary's keys come before its values
        std::size_t count = 0;
        std::size_t next = 0;
        bool isDictionary = false;
        Value::List items;
        Value::Dictionary entries;
        std::size_t values = 1;
        std::size_t height = 0;
    };

    /// The four high bits of an object's first byte, and what the four low bits and a number after them tell.
    struct Header {
        unsigned type = 0;
        std::size_t count = 0;
        std::size_t content = 0; // offset of what follows
    };

    class BinaryReader {
    public:
        explicit BinaryReader(std::string_view bytes)
            : _bytes(bytes)
        {
        }

        PropertyListResult read();

    private:
        bool readTrailer();
        bool readObject(std::size_t number);
        bool readCount(Header& header);
        bool readSimple(std::size_t number, std::size_t offset);
        bool readFixed(std::size_t number, const Header& header, FixedReader* reader, std::string_view name);
        bool readBytes(std::size_t number, const Header& header);
        bool readAsciiText(std::size_t number, const Header& header);
        bool readWideText(std::size_t number, const Header& header);
        bool openContainer(std::size_t number, const Header& header);
        bool followReference();
        bool readKey(Container& container, std::size_t number);
        bool take(Container& container, std::size_t number);
        bool close();
        bool finish(std::size_t number, Value value);
        bool takeContent(const Header& header, std::size_t size);
        bool fail(std::size_t offset, const std::string& what);

        std::uint64_t numberAt(std::size_t offset, std::size_t size) const;
        std::size_t referenceAt(std::size_t offset) const;

        const std::string_view _bytes;
        std::size_t _offsetSize = 0;
        std::size_t _referenceSize = 0;
        std::size_t _table = 0; // offset of the table of offsets; objects end before it
        std::size_t _top = 0;
        std::size_t _contentRead = 0;
        std::size_t _mostValues = 0;
        std::vector<Object> _objects;
        std::vector<Container> _open;
        std::string _problem;
    };

    PropertyListResult BinaryReader::read()
    {
        bool isRight = readTrailer() && readObject(_top);
        while (isRight && !_open.empty())
            isRight = _open.back().next < _open.back().count ? followReference() : close();
        if (!isRight)
            return { {}, _problem };
        return { std::move(_objects[_top].value), {} };
    }

    bool BinaryReader::readTrailer()
    {
        if (_bytes.size() < headerSize + trailerSize + 2)
            return fail(_bytes.size(), "the file is cut short");
        if (_bytes.substr(0, headerSize) != "bplist00")
            return fail(0, "the file is of an unknown version");
        const std::size_t trailer = _bytes.size() - trailerSize;
        _offsetSize = numberAt(trailer + 6, 1);
        _referenceSize = numberAt(trailer + 7, 1);
        const std::uint64_t count = numberAt(trailer + 8, 8);
        const std::uint64_t top = numberAt(trailer + 16, 8);
        const std::uint64_t table = numberAt(trailer + 24, 8);
        if (_offsetSize < 1 || _offsetSize > 8 || _referenceSize < 1 || _referenceSize > 8)
            return fail(trailer + 6, "the trailer is damaged");
        if (table <= headerSize || table >= trailer || count == 0 || count > (trailer - table) / _offsetSize
            || top >= count)
            return fail(trailer + 8, "the trailer is damaged, or the file cut short");
        if (count > mostPropertyListValues)
            return fail(trailer + 8, "the property list holds too many values");
        _table = table;
        _top = top;
        // References that nobody shares take a byte each, so this leaves room to share, but none to multiply.
        _mostValues = std::min(mostPropertyListValues, 64 + 4 * _bytes.size());
        _objects.resize(count);
        return true;
    }

    bool BinaryReader::readObject(std::size_t number)
    {
        const std::size_t entry = _table + number * _offsetSize;
        const std::uint64_t offset = numberAt(entry, _offsetSize);
        if (offset < headerSize || offset >= _table)
            return fail(entry, "an object lies outside the file");
        Header header;
        const auto first = static_cast<std::uint8_t>(_bytes[offset]);
        header.type = first >> 4;
        header.count = first & 15;
        header.content = offset + 1;
        switch (header.type) {
        case 0x0:
            return readSimple(number, offset);
        case 0x1:
            return readFixed(number, header, integerFromBytes, "an integer");
        case 0x2:
            return readFixed(number, header, realFromBytes, "a real");
        case 0x3:
            return readFixed(number, header, dateFromBytes, "a date");
        case 0x8:
            ++header.count;
            return readBytes(number, header);
        case 0x4:
            return readCount(header) && readBytes(number, header);
        case 0x5:
            return readCount(header) && readAsciiText(number, header);
        case 0x6:
            return readCount(header) && readWideText(number, header);
        case 0xA:
        case 0xD:
            return readCount(header) && openContainer(number, header);
        default:
            return fail(offset, "an object is of an unknown type");
        }
    }

    /// A count of 15 stands for one that follows as an integer.
    bool BinaryReader::readCount(Header& header)
    {
        if (header.count != 15)
            return true;
        const auto first = header.content < _table ? static_cast<std::uint8_t>(_bytes[header.content]) : 0u;
        const std::size_t size = std::size_t { 1 } << (first & 3);
        if ((first & 0xFC) != 0x10 || _table - header.content - 1 < size)
            return fail(header.content, "the count of an object is damaged");
        header.count = numberAt(header.content + 1, size);
        header.content += 1 + size;
        return true;
    }

    bool BinaryReader::readSimple(std::size_t number, std::size_t offset)
    {
        switch (static_cast<std::uint8_t>(_bytes[offset])) {
        case 0x00:
            return finish(number, Value());
        case 0x08:
            return finish(number, Value(false));
        case 0x09:
            return finish(number, Value(true));
        default:
            return fail(offset, "an object is of an unknown type");
        }
    }

    bool BinaryReader::readFixed(std::size_t number, const Header& header, FixedReader* reader, std::string_view name)
    {
        const std::size_t size = std::size_t { 1 } << header.count;
        if (size > _table - header.content)
            return fail(header.content, std::string(name) + " is cut short");
        std::optional<Value> value = reader(_bytes.substr(header.content, size));
        if (!value)
            return fail(header.content - 1, std::string(name) + " is out of range or of an unknown size");
        return finish(number, std::move(*value));
    }

    bool BinaryReader::readBytes(std::size_t number, const Header& header)
    {
        if (!takeContent(header, 1))
            return false;
        return finish(number, Value(Value::Data { Text(_bytes.substr(header.content, header.count)) }));
    }

    bool BinaryReader::readAsciiText(std::size_t number, const Header& header)
    {
        if (!takeContent(header, 1))
            return false;
        const std::string_view text = _bytes.substr(header.content, header.count);
        const auto isForeign = [](char letter) { return static_cast<unsigned char>(letter) >= 0x80; };
        if (std::any_of(text.begin(), text.end(), isForeign))
            return fail(header.content, "a text in ASCII holds another character");
        return finish(number, Value(text));
    }

    bool BinaryReader::readWideText(std::size_t number, const Header& header)
    {
        if (!takeContent(header, 2))
            return false;
        const std::optional<std::string> text = textFromUtf16(_bytes.substr(header.content, 2 * header.count));
        if (!text)
            return fail(header.content, "a text holds half of a character");
        return finish(number, Value(std::string_view(*text)));
    }

    bool BinaryReader::openContainer(std::size_t number, const Header& header)
    {
        const bool isDictionary = header.type == 0xD;
        const std::size_t space = (_table - header.content) / _referenceSize;
        if (header.count > space / (isDictionary ? 2 : 1))
            return fail(header.content, "a list or dictionary is cut short");
        if (_open.size() >= deepestPropertyList)
            return fail(header.content, "the property list is nested too deeply");
        Container& container = _open.emplace_back();
        container.object = number;
        container.references = header.content;
        container.count = header.count;
        container.isDictionary = isDictionary;
        _objects[number].state = State::open;
        return true;
    }

    bool BinaryReader::followReference()
    {
        Container& container = _open.back();
        const std::size_t place = container.references + container.next * _referenceSize;
        if (container.isDictionary && container.entries.size() == container.next) {
            const std::size_t key = referenceAt(place);
            if (key >= _objects.size())
                return fail(place, "a reference leads to no object");
            if (!readKey(container, key))
                return false;
        }
        const std::size_t valuePlace = place + (container.isDictionary ? container.count * _referenceSize : 0);
        const std::size_t number = referenceAt(valuePlace);
        if (number >= _objects.size())
            return fail(valuePlace, "a reference leads to no object");
        if (_objects[number].state == State::open)
            return fail(valuePlace, "a list or dictionary holds itself");
        if (_objects[number].state == State::read)
            return take(container, number);
        // A container is taken when it has been closed; this reference is followed once more then.
        return readObject(number);
    }

    bool BinaryReader::readKey(Container& container, std::size_t number)
    {
        const std::size_t place = container.references + container.next * _referenceSize;
        const std::size_t level = _open.size();
        if (_objects[number].state == State::unread && !readObject(number))
            return false;
        if (_open.size() != level || !_objects[number].value.text())
            return fail(place, "the key of a dictionary is no text");
        // Reading a text opens no container, so `container` still stands where it stood.
        container.entries.emplace_back(*_objects[number].value.text(), Value());
        return true;
    }

    bool BinaryReader::take(Container& container, std::size_t number)
    {
        const Object& object = _objects[number];
        container.values += object.values + (container.isDictionary ? 1 : 0);
        container.height = std::max<std::size_t>(container.height, object.height + 1u);
        if (container.values > _mostValues)
            return fail(container.references, "the property list stands for too many values");
        if (_open.size() + container.height > deepestPropertyList + 1)
            return fail(container.references, "the property list is nested too deeply");
        if (container.isDictionary)
            container.entries.back().second = object.value;
        else
            container.items.push_back(object.value);
        ++container.next;
        return true;
    }

    bool BinaryReader::close()
    {
        Container container = std::move(_open.back());
        _open.pop_back();
        const auto keyAt = [&](std::size_t index) { return container.entries[index].first.view(); };
        if (const auto repeated = firstRepeatedKey(container.entries.size(), keyAt))
            return fail(
                container.references + *repeated * _referenceSize, "key " + quoted(keyAt(*repeated)) + " occurs twice");
        Object& object = _objects[container.object];
        object.values = static_cast<std::uint32_t>(container.values);
        object.height = static_cast<std::uint16_t>(container.height);
        return finish(container.object,
            container.isDictionary ? Value(std::move(container.entries)) : Value(std::move(container.items)));
    }

    bool BinaryReader::finish(std::size_t number, Value value)
    {
        _objects[number].value = std::move(value);
        _objects[number].state = State::read;
        return true;
    }

    /// Whether `header.count` units of `size` bytes follow. Counts them: objects that lie over each other would let a
    /// short file hold much text.
    bool BinaryReader::takeContent(const Header& header, std::size_t size)
    {
        if (header.count > (_table - header.content) / size)
            return fail(header.content, "a text or data is cut short");
        _contentRead += header.count * size;
        return _contentRead <= _bytes.size() || fail(header.content, "objects lie over each other");
    }

    bool BinaryReader::fail(std::size_t offset, const std::string& what)
    {
        _problem = "byte " + std::to_string(offset) + ": " + what;
        return false;
    }

    std::uint64_t BinaryReader::numberAt(std::size_t offset, std::size_t size) const
    {
        return numberFromBytes(_bytes.substr(offset, size));
    }

    std::size_t BinaryReader::referenceAt(std::size_t offset) const
    {
        return numberAt(offset, _referenceSize);
    }

} // namespace

PropertyListResult readBinaryPropertyList(std::string_view bytes)
{
    return BinaryReader(bytes).read();
}

} // namespace platform
