#include "apps/common/DidYouMean.h"
#include "apps/common/DisplayWidth.h"
#include "apps/common/HostileNames.h"
#include "apps/common/HumanText.h"
#include "apps/common/LoadWatch.h"
#include "apps/common/Style.h"
#include "apps/ombrix/ShellWord.h"

#include <doctest/doctest.h>

#include <cstdlib>
#include <ctime>

using namespace apps;

namespace {

constexpr platform::Date noonOn14November2026 { 1794657600, 0 };
constexpr std::int64_t day = 86400;

platform::Date daysLater(platform::Date date, std::int64_t days)
{
    return { date.seconds + days * day, 0 };
}

void useUTC()
{
    ::setenv("TZ", "UTC", 1);
    ::tzset();
}

StyleWishes onTerminal()
{
    StyleWishes wishes;
    wishes.isTerminal = true;
    wishes.term = "xterm";
    return wishes;
}

} // namespace

TEST_CASE("a letter takes the columns that a terminal gives it")
{
    CHECK(displayWidth("Trip") == 4);
    CHECK(displayWidth("東京の夜") == 8);
    CHECK(displayWidth("ｱ") == 1);
    CHECK(displayWidth("한") == 2);
    CHECK(displayWidth("é") == 1);
    CHECK(displayWidth("e\u0301") == 1);
    CHECK(displayWidth("…·–") == 3);
    CHECK(displayWidth("α") == 1);
}

TEST_CASE("emoji that are joined, coloured or paired to a flag take two columns")
{
    CHECK(displayWidth("😀") == 2);
    CHECK(displayWidth("👩‍👩‍👧‍👦") == 2);
    CHECK(displayWidth("👍🏽") == 2);
    CHECK(displayWidth("🇩🇪") == 2);
    CHECK(displayWidth("🇩🇪🇫🇷") == 4);
    CHECK(displayWidth("❤️") == 2);
}

TEST_CASE("a control character takes no column, and a byte that is no UTF-8 one")
{
    CHECK(displayWidth("\x1b") == 0);
    CHECK(displayWidth("\xff\xfe") == 2);
}

TEST_CASE("a text that is too long is cut at a letter and ends with an ellipsis")
{
    CHECK(cutAtEnd("Wedding", 7) == "Wedding");
    CHECK(cutAtEnd("Wedding", 5) == "Wedd…");
    CHECK(cutAtEnd("東京の夜", 6) == "東京…");
    CHECK(cutAtEnd("Wedding", 0).empty());
}

TEST_CASE("a name that is too long loses its middle and keeps its extension")
{
    CHECK(cutInMiddle("short.mov", 20) == "short.mov");
    CHECK(cutInMiddle("a very long name of a clip.mov", 16) == "a very lon…p.mov");
    for (int columns = 0; columns < 40; ++columns)
        CHECK(displayWidth(cutInMiddle("東京の夜 and a very long name 👩‍👩‍👧‍👦.mov", columns))
            <= columns);
}

TEST_CASE("padding counts columns, not bytes")
{
    CHECK(paddedAfter("夜", 4) == "夜  ");
    CHECK(paddedBefore("é", 3) == "  é");
    CHECK(paddedAfter("long", 2) == "long");
}

TEST_CASE("what could harm a terminal is shown by its code")
{
    CHECK(escapedText("Trip 東京 é") == "Trip 東京 é");
    CHECK(escapedText("a\x1b[31mb") == "a\\x1b[31mb");
    CHECK(escapedText("a\nb\tc\x7f") == "a\\x0ab\\x09c\\x7f");
    CHECK(escapedText("\u202egnp.exe") == "\\u202egnp.exe");
    CHECK(escapedText("\u2066x\u2069") == "\\u2066x\\u2069");
    CHECK(escapedText("a\u200eb\u200f\u061c\ufeff") == "a\\u200eb\\u200f\\u061c\\ufeff");
    CHECK(escapedText("a\u200bb\u200cc\u200dd\u2060") == "a\\u200bb\\u200cc\\u200dd\\u2060");
    CHECK(escapedText("a\U000e0041") == "a\\U000e0041");
    CHECK(escapedText("\xff"
                      "a")
        == "\\xffa");
    CHECK(escapedText("\u009b") == "\\xc2\\x9b");
}

TEST_CASE("what joins pictures to one emoji is no harm")
{
    for (const char* emoji : { "👩‍👩‍👧‍👦", "❤️‍🔥", "👍🏽", "👩🏽‍⚕️",
             "🏳️‍🌈", "\U0001f3f4\U000e0067\U000e0062\U000e0065\U000e006e\U000e0067\U000e007f" })
        CHECK(escapedText(emoji) == emoji);
    CHECK(escapedText("😀\u200d") == "😀\\u200d");
    CHECK(escapedText("😀\u200da") == "😀\\u200da");
}

TEST_CASE("an escape is cut out whole and not in its middle")
{
    const std::string name = escapedName("ab\x1b\ncd\u202e.mov");
    for (int columns = 0; columns <= 25; ++columns) {
        for (const std::string& cut : { cutInMiddle(name, columns), cutAtEnd(name, columns) }) {
            std::string left = withoutMarks(cut);
            CAPTURE(left);
            CHECK(displayWidth(cut) <= columns);
            for (const char* whole : { "\\x1b", "\\x0a", "\\u202e" }) {
                if (const std::size_t at = left.find(whole); at != std::string::npos)
                    left.erase(at, std::string_view(whole).size());
            }
            CHECK(left.find('\\') == std::string::npos);
        }
    }
}

TEST_CASE("a line of progress that is cut holds whole escapes")
{
    OBLoadProgress progress;
    progress.pathAtWork = "/Volumes/a\x1b\x1b\x1b\x1b\x1b\x1b";
    for (int columns = 20; columns < 130; ++columns) {
        for (const std::string& line : { progressLine(progress, "a\x1b\x1b\x1b\x1b\x1b\x1b", {}, columns),
                 waitingProgress(progress, "a\x1b\x1b\x1b\x1b\x1b\x1b", {}, columns) }) {
            CAPTURE(line);
            CHECK(displayWidth(line) <= columns);
            for (std::size_t at = line.find('\\'); at != std::string::npos; at = line.find('\\', at + 1))
                CHECK(line.substr(at, 4) == "\\x1b");
        }
    }
}

TEST_CASE("a line of progress counts what the work finds by its name")
{
    OBLoadProgress progress;
    progress.itemsFound = 1'204;
    CHECK(progressLine(progress, "Stick", {}, 100).find("  1,204 clips  ") != std::string::npos);
    CHECK(progressLine(progress, "Stick", {}, 100, "hit").find("  1,204 hits  ") != std::string::npos);
}

TEST_CASE("an escaped name marks what was escaped in no column")
{
    const std::string escaped = escapedName("a\x1b");
    CHECK(withoutMarks(escaped) == "a\\x1b");
    CHECK(displayWidth(escaped) == 5);
}

TEST_CASE("counts are grouped by thousands and shortened from a million on")
{
    CHECK(countText(0) == "0");
    CHECK(countText(999) == "999");
    CHECK(countText(1204) == "1,204");
    CHECK(countText(210417) == "210,417");
    CHECK(countText(1'040'000) == "1.0 M");
    CHECK(countText(1'250'000'000) == "1,250.0 M");
    CHECK(quantityText(1, "movie") == "1 movie");
    CHECK(quantityText(0, "movie") == "0 movies");
}

TEST_CASE("sizes are told in decimal units")
{
    CHECK(sizeText(0) == "0 bytes");
    CHECK(sizeText(1) == "1 byte");
    CHECK(sizeText(999) == "999 bytes");
    CHECK(sizeText(1500) == "1.5 kB");
    CHECK(sizeText(310'000'000) == "310 MB");
    CHECK(sizeText(999'600) == "1.0 MB");
    CHECK(sizeText(1'900'000'000) == "1.9 GB");
    CHECK(sizeText(12'000'000'000) == "12.0 GB");
    CHECK(sizeText(18'446'744'073'709'551'615ULL) == "18.4 EB");
}

TEST_CASE("durations are told in the unit that fits")
{
    using namespace std::chrono_literals;
    CHECK(durationText(31ms) == "31 ms");
    CHECK(durationText(3s) == "3 s");
    CHECK(durationText(130s) == "2 min");
}

TEST_CASE("a date is told by its day, and one of today by its time")
{
    useUTC();
    CHECK(dateText(noonOn14November2026, noonOn14November2026) == "today 12:00");
    CHECK(dateText(noonOn14November2026, daysLater(noonOn14November2026, 1)) == "14 Nov 2026");
    CHECK(monthText(noonOn14November2026) == "Nov 2026");
}

TEST_CASE("a range of dates repeats nothing")
{
    useUTC();
    const platform::Date first = noonOn14November2026;
    CHECK(dateRangeText(first, first, {}) == "14 Nov 2026");
    CHECK(dateRangeText(first, daysLater(first, 3), {}) == "14 – 17 Nov 2026");
    CHECK(dateRangeText(first, daysLater(first, 3), "2026") == "14 – 17 Nov");
    CHECK(dateRangeText(first, daysLater(first, 20), "2026") == "14 Nov – 4 Dec");
    CHECK(dateRangeText(first, daysLater(first, 60), "2027") == "14 Nov 2026 – 13 Jan 2027");
}

TEST_CASE("a date that no calendar holds harms nothing")
{
    CHECK(!dateText({ INT64_MAX, 0 }, noonOn14November2026).empty());
}

TEST_CASE("the option decides on colours before NO_COLOR, that before CLICOLOR_FORCE, that before the terminal")
{
    StyleWishes wishes = onTerminal();
    CHECK(Style(wishes).isColored());
    wishes.term = "dumb";
    CHECK_FALSE(Style(wishes).isColored());
    wishes.colorForce = "1";
    CHECK(Style(wishes).isColored());
    wishes.noColor = "1";
    CHECK_FALSE(Style(wishes).isColored());
    wishes.color = When::always;
    CHECK(Style(wishes).isColored());
    wishes = onTerminal();
    wishes.color = When::never;
    CHECK_FALSE(Style(wishes).isColored());
    wishes = onTerminal();
    wishes.isTerminal = false;
    CHECK_FALSE(Style(wishes).isColored());
    wishes.colorForce = "0";
    CHECK_FALSE(Style(wishes).isColored());
}

TEST_CASE("names are links where colours are on, and where links are asked for")
{
    StyleWishes wishes = onTerminal();
    CHECK(Style(wishes).hasLinks());
    wishes.noColor = "1";
    CHECK_FALSE(Style(wishes).hasLinks());
    wishes.hyperlink = When::always;
    CHECK(Style(wishes).hasLinks());
    CHECK(fileLink("host", "/a b/ü#") == "file://host/a%20b/%C3%BC%23");
}

TEST_CASE("an escaped part of a name is dim and the rest as the name")
{
    const Style style(onTerminal());
    CHECK(style.plain(style.name("a\x1b")) == "a\x1b[2m\\x1b\x1b[0m");
    StyleWishes plain = onTerminal();
    plain.color = When::never;
    CHECK(Style(plain).plain(Style(plain).name("a\x1b")) == "a\\x1b");
}

TEST_CASE("a name that goes to no terminal keeps its bytes, also those that mark escapes")
{
    const std::string name("a\x01\x02\x1b\n", 5);
    const Style style { StyleWishes() };
    CHECK(style.plain(style.name(name)) == name);
    CHECK(style.bold(style.name(name)) == name);
}

TEST_CASE("a word for a shell is quoted only where it has to be")
{
    CHECK(ombrix::shellWord("Trip") == "Trip");
    CHECK(ombrix::shellWord("Anna & Tom") == "'Anna & Tom'");
    CHECK(ombrix::shellWord("it's") == "'it'\\''s'");
    CHECK(ombrix::shellWord("") == "''");
    CHECK(ombrix::shellWord("a\nb") == "$'a\\012b'");
}

TEST_CASE("a word that resembles one of several is answered with it")
{
    constexpr std::string_view words[] { "tree", "groups" };
    CHECK(didYouMean("tre", words) == " (did you mean \"tree\"?)");
    CHECK(didYouMean("xyzzy", words).empty());
    const std::string path = "/" + std::string(100, 'a') + "/Weddings";
    const std::string_view paths[] { path };
    CHECK(didYouMean("Weddinks", paths) == " (did you mean \"" + path + "\"?)");
    constexpr std::string_view hostile[] { "Tr\u202eip" };
    CHECK(didYouMean("Tr\u202eipp", hostile) == " (did you mean \"Tr\\u202eip\"?)");
}
