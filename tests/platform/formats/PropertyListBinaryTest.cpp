#include "platform/formats/PropertyList.h"

#include "tests/platform/formats/Damage.h"

#include <doctest/doctest.h>

#include <bit>
#include <limits>

using namespace platform;

namespace {

std::string number(std::uint64_t value, int size)
{
    std::string bytes;
    for (int index = size - 1; index >= 0; --index)
        bytes += static_cast<char>((value >> (8 * index)) & 0xFF);
    return bytes;
}

/// Objects as their bytes, with the table and the trailer put behind them.
std::string binaryList(const std::vector<std::string>& objects, int referenceSize = 1, std::uint64_t top = 0)
{
    std::string bytes = "bplist00";
    std::string table;
    for (const std::string& object : objects) {
        table += number(bytes.size(), 4);
        bytes += object;
    }
    const std::size_t tableStart = bytes.size();
    return bytes + table + std::string(6, '\0') + number(4, 1) + number(static_cast<std::uint64_t>(referenceSize), 1)
        + number(objects.size(), 8) + number(top, 8) + number(tableStart, 8);
}

std::string ascii(const std::string& text)
{
    return std::string(1, static_cast<char>(0x50 + text.size())) + text;
}

std::string realBytes(char marker, double real)
{
    return std::string(1, marker) + number(std::bit_cast<std::uint64_t>(real), 8);
}

Value valueOf(const std::string& object)
{
    const PropertyListResult result = readPropertyList(binaryList({ object }));
    CHECK(result.problem == "");
    return result.value;
}

std::string problemOf(const std::vector<std::string>& objects, int referenceSize = 1)
{
    const PropertyListResult result = readPropertyList(binaryList(objects, referenceSize));
    CHECK(result.value.isNull());
    return result.problem;
}

const std::string rightList = binaryList({ "\xD3\x01\x02\x03\x04\x05\x06", ascii("a"), ascii("b"), ascii("c"), "\x09",
    "\xA2\x04\x07", "\x62" + std::string("\x00\xE9\x30\x42", 4), std::string("\x11\x01\x00", 3) });

} // namespace

TEST_CASE("a binary property list is read with its references")
{
    const PropertyListResult result = readPropertyList(rightList);
    REQUIRE(result.problem == "");
    CHECK(result.value
        == Value(
            Value::Dictionary { { "a", true }, { "b", Value::List { true, 256 } }, { "c", "\xC3\xA9\xE3\x81\x82" } }));
}

TEST_CASE("the numbers of a binary property list have signs in eight bytes only")
{
    CHECK(valueOf("\x10\xFF") == Value(255));
    CHECK(valueOf("\x11\xFF\xFF") == Value(65535));
    CHECK(valueOf("\x12\xFF\xFF\xFF\xFF") == Value(std::int64_t { 4294967295 }));
    CHECK(valueOf("\x13\xFF\xFF\xFF\xFF\xFF\xFF\xFF\xFE") == Value(-2));
    CHECK(valueOf("\x14" + number(0, 8) + number(~std::uint64_t { 0 }, 8)) == Value(18446744073709551615.0));
    CHECK(valueOf("\x14" + number(0, 8) + number(5, 8)) == Value(5));
    CHECK(valueOf("\x14" + number(~std::uint64_t { 0 }, 8) + number(~std::uint64_t { 0 }, 8)) == Value(-1));
    CHECK(problemOf({ "\x14" + number(1, 8) + number(0, 8) })
        == "byte 8: an integer is out of range or of an unknown size");
    CHECK(problemOf({ "\x15" + std::string(32, '\0') }) == "byte 8: an integer is out of range or of an unknown size");
    CHECK(valueOf("\x22" + number(std::bit_cast<std::uint32_t>(1.5f), 4)) == Value(1.5));
    CHECK(valueOf(realBytes('\x23', -0.1)) == Value(-0.1));
    CHECK(problemOf({ "\x21\x01\x02" }) != "");
}

TEST_CASE("the dates of a binary property list count from 2001")
{
    CHECK(valueOf(realBytes('\x33', 0)) == Value(Date { 978307200, 0 }));
    CHECK(valueOf(realBytes('\x33', 1.5)) == Value(Date { 978307201, 500000000 }));
    CHECK(valueOf(realBytes('\x33', -0.25)) == Value(Date { 978307199, 750000000 }));
    CHECK(problemOf({ realBytes('\x33', std::numeric_limits<double>::infinity()) })
        == "byte 8: a date is out of range or of an unknown size");
    CHECK(problemOf({ realBytes('\x33', std::numeric_limits<double>::quiet_NaN()) }) != "");
    CHECK(problemOf({ realBytes('\x33', 1e300) }) != "");
    CHECK(problemOf({ "\x32\x01\x02\x03\x04" }) != "");
}

TEST_CASE("texts, data and archive references of a binary property list keep their kinds")
{
    CHECK(valueOf("\x50") == Value(""));
    CHECK(valueOf(std::string("\x53"
                              "a\0b",
              4))
        == Value(Text(std::string("a\0b", 3))));
    CHECK(valueOf("\x5F\x10\x14"
                  "twenty letters there")
        == Value("twenty letters there"));
    CHECK(valueOf("\x62\xD8\x3C\xDF\xAC") == Value("\xF0\x9F\x8E\xAC"));
    CHECK(valueOf("\x42\xFF\x01") == Value(Value::Data { Text("\xFF\x01") }));
    CHECK(valueOf("\x80\x07") == Value(Value::Data { Text("\x07") }));
    CHECK(valueOf(std::string(1, '\0')).isNull());
    CHECK(valueOf("\x08") == Value(false));
    CHECK(problemOf({ "\x51\xE9" }) != "");
    CHECK(problemOf({ "\x61\xD8\x3C" }) == "byte 9: a text holds half of a character");
    CHECK(problemOf({ "\x61\xDF\xAC" }) != "");
    CHECK(problemOf({ "\x62\xD8\x3C\x41\x41" }) != "");
}

TEST_CASE("objects of an unknown type are refused")
{
    for (int first = 0; first < 256; ++first) {
        const int type = first >> 4;
        const bool isKnown = first == 0x00 || first == 0x08 || first == 0x09 || (type >= 1 && type <= 6) || type == 8
            || type == 0xA || type == 0xD;
        if (isKnown)
            continue;
        CAPTURE(first);
        CHECK(problemOf({ std::string(1, static_cast<char>(first)) + std::string(40, '\0') })
            == "byte 8: an object is of an unknown type");
    }
}

TEST_CASE("a container that holds itself is refused")
{
    CHECK(problemOf({ std::string("\xA1\x00", 2) }) == "byte 9: a list or dictionary holds itself");
    CHECK(problemOf({ "\xA1\x01", "\xA1\x02", std::string("\xA1\x00", 2) }).find("holds itself") != std::string::npos);
    CHECK(problemOf({ std::string("\xD1\x01\x00", 3), ascii("a") }).find("holds itself") != std::string::npos);
    CHECK(problemOf({ std::string("\xD1\x00\x01", 3), ascii("a") }).find("no text") != std::string::npos);
}

TEST_CASE("the keys of a binary dictionary are texts, each once")
{
    CHECK(problemOf({ "\xD1\x01\x01", "\x09" }) == "byte 9: the key of a dictionary is no text");
    CHECK(problemOf({ "\xD1\x01\x02", std::string("\xA1\x02", 2), "\x09" }).find("no text") != std::string::npos);
    CHECK(problemOf({ "\xD2\x01\x01\x02\x02", ascii("a"), "\x09" }) == "byte 10: key \"a\" occurs twice");
    CHECK(problemOf({ "\xD2\x01\x03\x02\x02", ascii("a"), "\x09", ascii("a") }) == "byte 10: key \"a\" occurs twice");
}

TEST_CASE("children shared level by level stand for too many values, and are refused at once")
{
    std::vector<std::string> objects;
    for (char level = 1; level <= 26; ++level)
        objects.push_back(std::string("\xA2") + level + level);
    objects.push_back("\x09");
    const std::string bomb = binaryList(objects);
    CHECK(bomb.size() < 300);
    CHECK(readPropertyList(bomb).problem.find("too many values") != std::string::npos);

    std::string shared = "\xA8";
    for (int index = 0; index < 8; ++index)
        shared += '\x01';
    CHECK(readPropertyList(binaryList({ shared, "\xA2\x02\x02", ascii("x") })).value.list()->size() == 8);
}

TEST_CASE("60,000 references to one long text share it")
{
    const int count = 60'000;
    std::string list = "\xAF\x12" + number(count, 4);
    for (int index = 0; index < count; ++index)
        list += number(1, 1);
    const std::string text = "\x5F\x12" + number(count, 4) + std::string(count, 'x');
    const PropertyListResult result = readPropertyList(binaryList({ list, text }));
    REQUIRE(result.problem == "");
    REQUIRE(result.value.list()->size() == count);
    CHECK(result.value.list()->front().text()->view().data() == result.value.list()->back().text()->view().data());
}

TEST_CASE("objects that lie over each other are refused")
{
    std::string bytes = "bplist00";
    const std::string list = "\xAF\x11" + number(2000, 2);
    const std::size_t listStart = bytes.size();
    bytes += list;
    for (int index = 0; index < 2000; ++index)
        bytes += number(static_cast<std::uint64_t>(index) + 1, 2);
    const std::size_t textStart = bytes.size();
    bytes += "\x5F\x12" + number(100'000, 4) + std::string(100'000, 'x');
    const std::size_t table = bytes.size();
    bytes += number(listStart, 4);
    for (int index = 0; index < 2000; ++index)
        bytes += number(textStart, 4);
    bytes += std::string(6, '\0') + number(4, 1) + number(2, 1) + number(2001, 8) + number(0, 8) + number(table, 8);
    CHECK(readPropertyList(bytes).problem.find("lie over each other") != std::string::npos);
}

TEST_CASE("binary nesting is bounded, also through a child that was read before")
{
    const auto chain = [](std::uint64_t levels) {
        std::vector<std::string> objects;
        for (std::uint64_t level = 1; level < levels; ++level)
            objects.push_back("\xA1" + number(level, 2));
        objects.push_back("\xA0");
        return readPropertyList(binaryList(objects, 2)).problem;
    };
    CHECK(chain(256) == "");
    CHECK(chain(258).find("nested too deeply") != std::string::npos);
    CHECK(chain(60'000).find("nested too deeply") != std::string::npos);

    std::vector<std::string> objects { "\xA2" + number(201, 2) + number(1, 2) };
    for (std::uint64_t level = 1; level <= 200; ++level)
        objects.push_back("\xA1" + number(level + 1, 2));
    for (std::uint64_t level = 201; level < 350; ++level)
        objects.push_back("\xA1" + number(level + 1, 2));
    objects.push_back("\xA0");
    CHECK(problemOf(objects, 2).find("nested too deeply") != std::string::npos);
}

TEST_CASE("sizes and offsets are checked before anything is allocated")
{
    const std::string huge = number(~std::uint64_t { 0 } >> 1, 8);
    for (const char* marker : { "\x4F\x13", "\x5F\x13", "\x6F\x13", "\xAF\x13", "\xDF\x13" }) {
        CHECK(problemOf({ marker + huge }).find("cut short") != std::string::npos);
        CHECK(problemOf({ marker + number(~std::uint64_t { 0 }, 8) }).find("cut short") != std::string::npos);
    }
    CHECK(problemOf({ "\x5F" }) != "");
    CHECK(problemOf({ "\x5F\x20" }) != "");
    CHECK(problemOf({ "\xA1\x05" }) == "byte 9: a reference leads to no object");
    for (std::size_t field : { 6u, 7u, 8u, 16u, 24u }) {
        std::string bytes = rightList;
        bytes[bytes.size() - 32 + field] = '\xFF';
        CAPTURE(field);
        CHECK(readPropertyList(bytes).problem != "");
    }
    CHECK(readPropertyList("bplist00").problem != "");
    CHECK(readPropertyList("bplist01" + rightList.substr(8)).problem == "byte 0: the file is of an unknown version");
}

TEST_CASE("a binary property list of 200,000 keys is read at once")
{
    const std::uint64_t count = 200'000;
    std::vector<std::string> objects { "\xDF\x12" + number(count, 4), "\x09" };
    for (std::uint64_t index = 0; index < count; ++index)
        objects[0] += number(index + 2, 3);
    for (std::uint64_t index = 0; index < count; ++index)
        objects[0] += number(1, 3);
    for (std::uint64_t index = 0; index < count; ++index)
        objects.push_back(ascii("k" + std::to_string(index)));
    const PropertyListResult result = readPropertyList(binaryList(objects, 3));
    CHECK(result.problem == "");
    CHECK(result.value.dictionary()->size() == count);
}

TEST_CASE("a damaged binary property list is read or refused with one line")
{
    forEachDamage(rightList, [](const std::string& damaged) {
        const PropertyListResult result = readPropertyList(damaged);
        CHECK(result.problem.find('\n') == std::string::npos);
        CHECK((result.problem.empty() || result.value.isNull()));
        if (damaged.size() < rightList.size())
            CHECK(result.problem != "");
    });
}
