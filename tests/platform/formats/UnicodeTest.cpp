#include "platform/formats/Unicode.h"
#include "platform/formats/Base64.h"
#include "platform/formats/Quoted.h"

#include <doctest/doctest.h>

using namespace platform;

TEST_CASE("a valid sequence is as long as its first byte says")
{
    CHECK(lengthOfValidSequence("a") == 1);
    CHECK(lengthOfValidSequence("\xC3\xA9x") == 2);
    CHECK(lengthOfValidSequence("\xE2\x82\xAC") == 3);
    CHECK(lengthOfValidSequence("\xF0\x9F\x8E\xAC") == 4);
    CHECK(lengthOfValidSequence("") == 0);
    CHECK(lengthOfValidSequence(std::string_view("\0", 1)) == 1);
}

TEST_CASE("overlong forms, surrogates, what lies above U+10FFFF and what is cut short begin no sequence")
{
    for (const char* bytes :
        { "\x80", "\xBF", "\xC0\x80", "\xC1\xBF", "\xE0\x9F\xBF", "\xED\xA0\x80", "\xED\xBF\xBF", "\xF0\x8F\xBF\xBF",
            "\xF4\x90\x80\x80", "\xF5\x80\x80\x80", "\xFF", "\xC3", "\xE2\x82", "\xF0\x9F\x8E", "\xE2\x28\xA1" }) {
        CAPTURE(bytes);
        CHECK(lengthOfValidSequence(bytes) == 0);
        CHECK_FALSE(decodeCharacter(bytes).isValid);
        CHECK(decodeCharacter(bytes).codePoint == 0xFFFD);
        CHECK(decodeCharacter(bytes).length == 1);
    }
}

TEST_CASE("every code point survives being written and read")
{
    int wrong = 0;
    for (char32_t codePoint = 0; codePoint <= 0x10FFFF; ++codePoint) {
        if (codePoint >= 0xD800 && codePoint <= 0xDFFF)
            continue;
        std::string text;
        appendCharacter(text, codePoint);
        const DecodedCharacter character = decodeCharacter(text);
        wrong += character.isValid && character.codePoint == codePoint && character.length == text.size() ? 0 : 1;
    }
    CHECK(wrong == 0);
}

TEST_CASE("what is no code point is written as U+FFFD")
{
    for (char32_t codePoint : { char32_t { 0xD800 }, char32_t { 0xDFFF }, char32_t { 0x110000 } }) {
        std::string text;
        appendCharacter(text, codePoint);
        CHECK(text == replacementCharacter);
    }
}

TEST_CASE("the valid prefix ends at the first byte that is no UTF-8")
{
    CHECK(lengthOfValidPrefix("") == 0);
    CHECK(lengthOfValidPrefix("plain text that is longer than a word") == 37);
    CHECK(lengthOfValidPrefix("caf\xC3\xA9 and more than eight bytes \xFF after") == 32);
    CHECK(lengthOfValidPrefix("\xFF") == 0);
    CHECK(lengthOfValidPrefix("12345678\xC3") == 8);
}

TEST_CASE("a quoted text is one line, valid, and not long")
{
    CHECK(quoted("name") == "\"name\"");
    CHECK(quoted("a\nb\x1B[0m\xFF")
        == "\"a\xEF\xBF\xBD"
           "b\xEF\xBF\xBD[0m\xEF\xBF\xBD\"");
    CHECK(quoted("\xC2\x85") == "\"\xEF\xBF\xBD\"");
    CHECK(quoted(std::string(500, 'x')).size() < 90);
    CHECK(quoted("") == "\"\"");
}

TEST_CASE("Base64 of RFC 4648 section 10 is written and read")
{
    const std::pair<const char*, const char*> pairs[]
        = { { "", "" }, { "f", "Zg==" }, { "fo", "Zm8=" }, { "foo", "Zm9v" }, { "foob", "Zm9vYg==" },
              { "fooba", "Zm9vYmE=" }, { "foobar", "Zm9vYmFy" }, { "\xFB\xFF", "+/8=" } };
    for (const auto& [bytes, text] : pairs) {
        CHECK(encodeBase64(bytes) == text);
        CHECK(decodeBase64(text) == std::optional<std::string>(bytes));
    }
    CHECK(decodeBase64(" Zm9v\n\tYg = = ") == std::optional<std::string>("foob"));
}

TEST_CASE("Base64 with a wrong letter or wrong padding is refused")
{
    for (const char* text :
        { "Z", "Zg", "Zg=", "Zg===", "Zm8", "Zm9v=", "Zm9vY", "Z*==", "Zg==Zg==", "=", "====", "Zm8=Zm8=" }) {
        CAPTURE(text);
        CHECK_FALSE(decodeBase64(text));
    }
}
