#include "platform/formats/FoldedText.h"
#include "platform/formats/Unicode.h"

#include <doctest/doctest.h>

#include <string>
#include <utility>
#include <vector>

using namespace platform;

namespace {

/// Long enough that bytes are folded many at once.
std::string padded(const std::string& text)
{
    return std::string(40, 'x') + text + std::string(40, 'x');
}

} // namespace

TEST_CASE("case and accents are folded away, whether they are one character or several")
{
    const std::vector<std::pair<std::string, std::string>> cases {
        { "IMG_0042", "img_0042" },
        { "@[`{AZ", "@[`{az" },
        { "Café", "cafe" },
        { "Cafe\u0301", "cafe" },
        { "ÅNGSTRÖM", "angstrom" },
        { "A\u030aNGSTRO\u0308M", "angstrom" },
        { "mañana", "manana" },
        { "Smørrebrød", "smørrebrød" },
        { "Straße", "strasse" },
        { "GRÜẞE", "grusse" },
        { "ﬁnal", "final" },
        { "Ελλάδα", "ελλαδα" },
        { "ΣΊΣΥΦΟΣ", "σισυφοσ" },
        { "Й", "и" },
        { "İstanbul", "istanbul" },
        { "Tiếng Việt", "tieng viet" },
        { "\u05e9\u05c1\u05b8", "\u05e9" },
    };
    for (const auto& [given, folded] : cases) {
        const auto& text = given; // what is captured is shown by a function of its own
        CAPTURE(text);
        CHECK(foldedText(text) == folded);
        CHECK(foldedText(padded(text)) == padded(folded));
        CHECK(foldedText(folded) == folded);
    }
}

TEST_CASE("what makes another letter is no accent, and is the same however it is written")
{
    for (const std::string text : { "東京の夜", "が", "한국", "कि", "ไม่", "🎬 👩‍👩‍👧" }) {
        CAPTURE(text);
        CHECK(foldedText(text) == text);
    }
    CHECK(foldedText("か\u3099") == "が");
    CHECK(foldedText("\u1112\u1161\u11ab") == "한");
    CHECK(foldedText("ß か\u3099 É") == "ss が e");
}

TEST_CASE("every white space is a blank")
{
    CHECK(foldedText("a\tb\nc\u00a0d\u3000e\u2003f") == "a b c d e f");
}

TEST_CASE("a byte that is no UTF-8 is found by itself and never inside a character")
{
    CHECK(foldedText("Z\xfcrich") == "z\xff\xfcrich");
    CHECK(foldedText("\xc3") == "\xff\xc3");
    CHECK(foldedText("\u00f8").find(foldedText("\xb8")) == std::string::npos);
    CHECK(foldedText("a\xb8É\xc3").find(foldedText("\xb8")) == 1);
    CHECK(foldedText("\uffff\U0010ffff") == "\uffff\U0010ffff");
}

TEST_CASE("a word may begin at the start and behind what is neither letter nor digit")
{
    const std::string text = foldedText("beach_sunset 2b–über東京\xfcz");
    const auto mayBegin = [&text](const std::string& word) { return wordMayBeginAt(text, text.find(word)); };
    CHECK(mayBegin("beach"));
    CHECK(mayBegin("sunset"));
    CHECK(mayBegin("2b"));
    CHECK(mayBegin("uber"));
    CHECK_FALSE(mayBegin("each"));
    CHECK_FALSE(mayBegin("b–"));
    CHECK_FALSE(mayBegin("京"));
    CHECK_FALSE(mayBegin("z"));
}

TEST_CASE("bytes are folded one for one where only those that are ASCII are asked for")
{
    std::string folded = "A";
    CHECK(appendFoldedAscii(folded, "B" + std::string(64, 'C')));
    CHECK(folded == "Ab" + std::string(64, 'c'));
    CHECK_FALSE(appendFoldedAscii(folded, "É"));
    CHECK(folded.size() == 68);
    std::string many(100, 'D');
    many[37] = '\xc3';
    folded.clear();
    CHECK_FALSE(appendFoldedAscii(folded, many));
    CHECK(folded.substr(30, 10) == std::string("ddddddd\xc3") + "dd");
}

TEST_CASE("every character that folds by itself folds as it does among others")
{
    constexpr char32_t afterLast = 0x110000;
    constexpr std::size_t surely = 60'000; // ideographs alone are more
    std::size_t count = 0;
    std::string different;
    for (char32_t character = 0x80; character < afterLast; ++character) {
        std::string text = "aE";
        appendCharacter(text, character);
        const std::size_t end = text.size();
        text += "B";
        std::string folded = "before";
        std::vector<FoldedCharacter> others;
        if (!appendFoldedOneByOne(folded, text, others)) {
            if (folded != "before" || !others.empty())
                appendCharacter(different, character);
            continue;
        }
        ++count;
        // A letter that becomes two has the text folded as a whole.
        if (folded + "ss" != "before" + foldedText(text + "ß") || others.size() != 1 || others[0].end != end
            || others[0].foldedEnd != folded.size() - 1)
            appendCharacter(different, character);
    }
    CHECK(different == "");
    CHECK(count > surely);
}

TEST_CASE("a text is not folded one by one where a character becomes several, joins another or is no UTF-8")
{
    std::string folded;
    std::vector<FoldedCharacter> others;
    for (const char* text : { "Fête Straße", "か\u3099", "Z\xfcrich" })
        CHECK_FALSE(appendFoldedOneByOne(folded, text, others));
    CHECK(folded == "");
    CHECK(others.empty());
    CHECK(appendFoldedOneByOne(folded, "Fête À", others));
    CHECK(folded == "fete a");
    CHECK(others.size() == 2);
}
