#include "platform/formats/JsonWriter.h"

#include "platform/formats/Json.h"

#include <doctest/doctest.h>

#include <limits>
#include <vector>

using namespace platform;

namespace {

template <typename Write> std::string written(Write write)
{
    std::string text;
    {
        JsonWriter json([&](std::string_view bytes) { text += bytes; });
        write(json);
    }
    return text;
}

std::string writtenText(std::string_view text)
{
    return written([&](JsonWriter& json) { json.string(text); });
}

std::string writtenReal(double real)
{
    return written([&](JsonWriter& json) { json.real(real); });
}

} // namespace

TEST_CASE("commas stand between values, and nowhere else")
{
    const std::string text = written([](JsonWriter& json) {
        json.beginObject();
        json.key("a");
        json.beginList();
        json.integer(1);
        json.beginList();
        json.endList();
        json.beginObject();
        json.endObject();
        json.null();
        json.endList();
        json.key("b");
        json.boolean(true);
        json.key("c");
        json.text(Text());
        json.endObject();
        json.endDocument();
        json.boolean(false);
        json.endDocument();
    });
    CHECK(text == "{\"a\":[1,[],{},null],\"b\":true,\"c\":null}\nfalse\n");
}

TEST_CASE("a key that needs no escape is written as any other, wherever a block ends")
{
    const auto keys = [](void (JsonWriter::*key)(std::string_view)) {
        return written([key](JsonWriter& json) {
            json.beginObject();
            for (int number = 0; number < 20'000; ++number) {
                (json.*key)("name");
                json.integer(number);
            }
            json.endObject();
        });
    };
    CHECK(keys(&JsonWriter::plainKey) == keys(&JsonWriter::key));
}

TEST_CASE("a real is as short as it can be and shows that it is one")
{
    CHECK(writtenReal(1920) == "1920.0");
    CHECK(writtenReal(0) == "0.0");
    CHECK(writtenReal(-0.0) == "-0.0");
    CHECK(writtenReal(0.1) == "0.1");
    CHECK(writtenReal(1.0 / 3) == "0.3333333333333333");
    CHECK(writtenReal(1e300) == "1e+300");
    CHECK(writtenReal(100000) == "100000.0");
    CHECK(writtenReal(9007199254740991) == "9007199254740991.0");
    CHECK(writtenReal(-300000) == "-300000.0");
    CHECK(writtenReal(-123456.5) == "-123456.5");
    CHECK(writtenReal(std::numeric_limits<double>::infinity()) == "null");
    CHECK(writtenReal(std::numeric_limits<double>::quiet_NaN()) == "null");
    CHECK(written([](JsonWriter& json) { json.integer(INT64_MIN); }) == "-9223372036854775808");
}

TEST_CASE("quotes, backslashes and control characters are escaped")
{
    CHECK(writtenText("a\"b\\c\nd\re\tf\x01g\x1F") == "\"a\\\"b\\\\c\\nd\\re\\tf\\u0001g\\u001f\"");
    CHECK(writtenText(std::string_view("\0", 1)) == "\"\\u0000\"");
    CHECK(writtenText("") == "\"\"");
    CHECK(writtenText("\x7F/") == "\"\x7F/\"");
    CHECK(writtenText("caf\xC3\xA9 \xF0\x9F\x8E\xAC") == "\"caf\xC3\xA9 \xF0\x9F\x8E\xAC\"");
}

TEST_CASE("each byte that is no UTF-8 is written as U+FFFD")
{
    CHECK(writtenText("a\xFF\xFE"
                      "b")
        == "\"a\xEF\xBF\xBD\xEF\xBF\xBD"
           "b\"");
    CHECK(writtenText("\xE2\x82") == "\"\xEF\xBF\xBD\xEF\xBF\xBD\"");
    CHECK(writtenText("\xED\xA0\x80") == "\"\xEF\xBF\xBD\xEF\xBF\xBD\xEF\xBF\xBD\"");
    CHECK(writtenText("12345678\xC3") == "\"12345678\xEF\xBF\xBD\"");
}

TEST_CASE("every byte at every place of a word is written as it is alone")
{
    for (int byte = 0; byte < 256; ++byte) {
        const std::string alone = writtenText(std::string(1, static_cast<char>(byte)));
        const std::string content = alone.substr(1, alone.size() - 2);
        for (std::size_t place = 0; place < 17; ++place) {
            std::string text(17, 'x');
            text.replace(place, 1, 1, static_cast<char>(byte));
            std::string expected(17, 'x');
            expected.replace(place, 1, content);
            CHECK(writtenText(text) == "\"" + expected + "\"");
        }
    }
}

TEST_CASE("what stands ready in pieces is a value like any other, wherever a block ends")
{
    std::string expected = "[";
    const std::string text = written([&](JsonWriter& json) {
        json.beginList();
        for (int number = 0; number < 20'000; ++number) {
            const std::string digits = std::to_string(number);
            const std::vector<std::string_view> pieces { "{\"a\":", digits, "", "}" };
            json.json(pieces);
            expected += (number ? ",{\"a\":" : "{\"a\":") + digits + "}";
        }
        json.endList();
    });
    CHECK(text == expected + "]");
}

TEST_CASE("what is appended as part of a string is what a string holds between its quotes")
{
    for (const std::string_view text : { "", "plain", "a text of more than one word", "a\"b\\c\n\x01", "caf\xC3\xA9",
             "\xFF and eight more", "Caf\xC3\xA9 \xC3 \"quoted\"" }) {
        std::string json = "before ";
        JsonWriter::appendString(json, text);
        CHECK("\"" + json.substr(7) + "\"" == writtenText(text));
    }
}

TEST_CASE("a document of many blocks arrives whole, in blocks of 64 KiB at most or as long as one text")
{
    const std::string longText(200'000, 'l');
    std::vector<std::size_t> blocks;
    std::string text;
    std::string expected = "[";
    {
        JsonWriter json([&](std::string_view bytes) {
            blocks.push_back(bytes.size());
            text += bytes;
        });
        json.beginList();
        for (int index = 0; index < 50'000; ++index) {
            json.string("number " + std::to_string(index));
            expected += (index ? ",\"number " : "\"number ") + std::to_string(index) + "\"";
        }
        json.string(longText);
        json.endList();
    }
    expected += ",\"" + longText + "\"]";
    CHECK(text == expected);
    CHECK(blocks.size() > 10);
    CHECK(blocks.size() < 30);
}

TEST_CASE("a value is written by its kind, a date as a text and a size as an object")
{
    const Value value(Value::Dictionary { { "date", Date { 1299146400, 123456789 } }, { "size", Size { 1920, 1080.5 } },
        { "list", Value::List { 1, 1.0, true, "x", Value() } }, { "data", Value::Data { Text("foo") } },
        { "empty", Value::Dictionary {} } });
    CHECK(written([&](JsonWriter& json) { json.value(value); })
        == "{\"date\":\"2011-03-03T10:00:00.123456789Z\",\"size\":{\"width\":1920.0,\"height\":1080.5},"
           "\"list\":[1,1.0,true,\"x\",null],\"data\":\"Zm9v\",\"empty\":{}}");
}

TEST_CASE("what is written reads back as the same text")
{
    std::string all;
    for (int byte = 1; byte < 128; ++byte)
        all += static_cast<char>(byte);
    const JsonResult result = readJson(writtenText(all));
    CHECK(result.problem == "");
    CHECK(result.root.text == all);
}
