#include "host/OBTextComparison.h"

#include <doctest/doctest.h>

#include <string>
#include <string_view>
#include <utility>
#include <vector>

namespace {

/// Checks that the texts compare so, and the other way round the other way round.
void checkOrder(std::string_view left, std::string_view right, int expected)
{
    CAPTURE(std::string(left));
    CAPTURE(std::string(right));
    CHECK(OBCaseInsensitiveCompare(left, right) == expected);
    CHECK(OBCaseInsensitiveCompare(right, left) == -expected);
}

} // namespace

TEST_CASE("texts that differ in case alone are equal")
{
    const std::vector<std::pair<const char*, const char*>> cases {
        { "", "" },
        { "Trip", "tRIP" },
        { "\u00C4rger", "\u00E4RGER" },
        { "\u03A3", "\u03C3" },
        { "\u03A3", "\u03C2" },
        { "\u03C2", "\u03C3" },
        { "\u212A", "k" }, // Kelvin sign
        { "\u212B", "\u00E5" }, // Angstrom sign
        { "\u00B5", "\u03BC" }, // micro sign
        { "\u017F", "S" }, // long s
        { "\u1E9E", "\u00DF" }, // sharp s
        { "\u0178", "\u00FF" },
        { "\u0401", "\u0451" },
        { "\u13A0", "\uAB70" }, // Cherokee, whose small letters fold to the capital ones
        { "\u13F8", "\u13F0" },
        { "\u10A0", "\u2D00" }, // Georgian
        { "\u1C90", "\u10D0" },
        { "\u2160", "\u2170" }, // Roman one
        { "\u24B6", "\u24D0" },
        { "\uFF21", "\uFF41" },
        { "\uA64A", "\u1C88" },
        { "\U00010400", "\U00010428" }, // Deseret
        { "\U000104B0", "\U000104D8" },
        { "\U00010C80", "\U00010CC0" },
        { "\U000118A0", "\U000118C0" },
        { "\U00016E40", "\U00016E60" },
        { "\U0001E900", "\U0001E922" }, // Adlam
        { "\u01C4", "\u01C6" },
        { "\u01C5", "\u01C6" },
        { "\u1F88", "\u1F80" },
    };
    for (const auto& [left, right] : cases)
        checkOrder(left, right, 0);
}

TEST_CASE("letters that fold to several, or only in one language, are apart")
{
    checkOrder("SS", "\u00DF", -1);
    checkOrder("I", "\u0130", -1); // I with a dot above, in no locale
    checkOrder("i", "\u0130", -1);
    checkOrder("i", "\u0131", -1); // dotless i
    checkOrder("fi", "\uFB01", -1); // ligature
    checkOrder("n", "\u0149", -1);
    checkOrder("\u0131", "\u0130", 1);
}

TEST_CASE("accents count")
{
    checkOrder("a", "\u00E4", -1);
    checkOrder("a\u0308", "\u00E4", -1);
}

TEST_CASE("texts are ordered by the code points of their folded letters")
{
    checkOrder("a", "B", -1);
    checkOrder("A", "b", -1);
    checkOrder("_", "a", -1);
    checkOrder("_", "A", -1); // what stands between the capital and the small letters comes before both
    checkOrder("Z", "[", 1);
    checkOrder("9", "A", -1);
    checkOrder("\u00E9", "z", 1);
    checkOrder("\uFFFD", "\U00010000", -1);
    checkOrder("\uFF5E", "\U0001F600", -1);
}

TEST_CASE("a text that is the beginning of another comes first")
{
    checkOrder("", "a", -1);
    checkOrder("Trip", "TRIP 2", -1);
    checkOrder("trip", std::string_view("TRIP\0", 5), -1);
    checkOrder(std::string_view("a\0b", 3), std::string_view("A\0B", 3), 0);
}

TEST_CASE("each byte that is no UTF-8 counts as one replacement character")
{
    const std::vector<std::pair<std::string, int>> cases {
        { "\xFF", 1 },
        { "\x80", 1 },
        { "\xC3", 1 },
        { "\xC0\xAF", 2 }, // longer than need be
        { "\xE0\x80\xAF", 3 },
        { "\xF0\x80\x80\xAF", 4 },
        { "\xED\xA0\x80", 3 }, // a surrogate
        { "\xF4\x90\x80\x80", 4 }, // beyond the last code point
        { "\xF5\x80\x80\x80", 4 },
        { "\xE2\x84", 2 }, // cut short
        { "\xF0\x9F\x98", 3 },
        { "\xFE\xFF", 2 },
    };
    for (const auto& [bytes, count] : cases) {
        std::string replacements;
        for (int index = 0; index < count; ++index)
            replacements += "\uFFFD";
        checkOrder(bytes, replacements, 0);
        checkOrder(bytes + "A", replacements + "a", 0);
        checkOrder("x" + bytes + "a", "X" + replacements + "B", -1);
    }
    checkOrder("\xC3\x28", "\uFFFD(", 0);
    checkOrder("\xFF", "\xFE", 0);
}

TEST_CASE("the order is one: no code point is before and after another")
{
    std::vector<std::string> letters;
    for (const char* letter : { "K", "k", "\u212A", "\u03C2", "\u03A3", "\u13A0", "\uAB70", "\u0130", "\xFF", "\uFFFD",
             "\U00010400", "\U00010428", "_", "" })
        letters.emplace_back(letter);
    for (const std::string& a : letters) {
        for (const std::string& b : letters) {
            for (const std::string& c : letters) {
                if (OBCaseInsensitiveCompare(a, b) <= 0 && OBCaseInsensitiveCompare(b, c) <= 0)
                    CHECK(OBCaseInsensitiveCompare(a, c) <= 0);
            }
        }
    }
}
