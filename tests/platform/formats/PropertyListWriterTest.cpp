#include "platform/formats/PropertyList.h"

#include "platform/NumberText.h"

#include <doctest/doctest.h>

#include <limits>

using namespace platform;

namespace {

const std::string head = "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n<plist version=\"1.0\">\n";

std::string body(const Value& value)
{
    const std::string xml = writeXmlPropertyList(value);
    REQUIRE(xml.substr(0, head.size()) == head);
    REQUIRE(xml.substr(xml.size() - 9) == "</plist>\n");
    return xml.substr(head.size(), xml.size() - head.size() - 9);
}

} // namespace

TEST_CASE("an XML property list is written with a tab a level")
{
    const Value value(Value::Dictionary { { "ProjectList",
        Value::List { Value::Dictionary {
            { "Name", "a & <b>" }, { "Duration", 2.5 }, { "Dimensions", Size { 640, 480 } } } } } });
    CHECK(body(value)
        == "<dict>\n\t<key>ProjectList</key>\n\t<array>\n\t\t<dict>\n\t\t\t<key>Name</key>\n\t\t\t<string>a &amp; "
           "&lt;b&gt;</string>\n"
           "\t\t\t<key>Duration</key>\n\t\t\t<real>2.5</real>\n\t\t\t<key>Dimensions</key>\n\t\t\t<string>{640, "
           "480}</string>\n"
           "\t\t</dict>\n\t</array>\n</dict>\n");
    CHECK(body(Value::Dictionary {}) == "<dict/>\n");
    CHECK(body(Value::List {}) == "<array/>\n");
}

TEST_CASE("what XML cannot hold is written as U+FFFD, and white space as a reference")
{
    const std::string fffd = "\xEF\xBF\xBD";
    CHECK(body("a\tb\nc\rd") == "<string>a&#9;b&#10;c&#13;d</string>\n");
    CHECK(body("\x01\x1B\x7F\xC2\x85") == "<string>" + fffd + fffd + fffd + fffd + "</string>\n");
    CHECK(body(Text(std::string_view("\0", 1))) == "<string>" + fffd + "</string>\n");
    CHECK(body("\xFF\xE2\x82") == "<string>" + fffd + fffd + fffd + "</string>\n");
    CHECK(body("\xEF\xBF\xBE\xEF\xBF\xBF") == "<string>" + fffd + fffd + "</string>\n");
    CHECK(body("\xC3\xA9\xF0\x9F\x8E\xAC") == "<string>\xC3\xA9\xF0\x9F\x8E\xAC</string>\n");
    CHECK(
        body(Value::Dictionary { { "a\nb", 1 } }) == "<dict>\n\t<key>a&#10;b</key>\n\t<integer>1</integer>\n</dict>\n");
}

TEST_CASE("what is null is left out")
{
    CHECK(
        body(Value::Dictionary { { "a", Value() }, { "b", true } }) == "<dict>\n\t<key>b</key>\n\t<true/>\n</dict>\n");
    CHECK(body(Value::List { Value(), Value() }) == "<array/>\n");
    CHECK(body(Value::Dictionary { { "a", Value() } }) == "<dict/>\n");
    CHECK(body(Value::List { Value(), 1 }) == "<array>\n\t<integer>1</integer>\n</array>\n");
}

TEST_CASE("every kind of value that was written is read back as it was")
{
    const Value value(Value::Dictionary { { "true", true }, { "false", false }, { "least", INT64_MIN },
        { "most", INT64_MAX }, { "third", 1.0 / 3 }, { "tiny", std::numeric_limits<double>::denorm_min() },
        { "huge", 1e300 }, { "infinite", -std::numeric_limits<double>::infinity() }, { "text", "\t<&>\r\n \xC3\xA9" },
        { "empty", "" }, { "date", Date { -5000000000, 0 } }, { "late", Date { 300000000000, 0 } },
        { "data", Value::Data { Text(std::string_view("\0\xFF\x01", 3)) } },
        { "list", Value::List { Value::List {}, 1 } } });
    const PropertyListResult result = readPropertyList(writeXmlPropertyList(value));
    CHECK(result.problem == "");
    CHECK(result.value == value);
}

TEST_CASE("a number is written whole or with the fewest digits that read back, never with an exponent")
{
    CHECK(platform::numberText(100000) == "100000");
    CHECK(platform::numberText(4096) == "4096");
    CHECK(platform::numberText(-0.5) == "-0.5");
    CHECK(platform::numberText(1.0 / 3) == "0.3333333333333333");
    CHECK(platform::numberText(1e-7) == "0.0000001");
    CHECK(platform::numberText(1e300).size() == 301);
    CHECK(platform::numberText(std::numeric_limits<double>::denorm_min()).substr(0, 4) == "0.00");
    CHECK(body(platform::Size { 100000, 2e5 }) == "<string>{100000, 200000}</string>\n");
}

TEST_CASE("any bytes at all make a property list that is read back")
{
    std::string bytes;
    for (int first = 0; first < 256; ++first) {
        for (int second = 0; second < 256; second += 3)
            bytes.append(1, static_cast<char>(first)).append(1, static_cast<char>(second));
    }
    CHECK(readPropertyList(writeXmlPropertyList(Value(Text(bytes)))).problem == "");
}
