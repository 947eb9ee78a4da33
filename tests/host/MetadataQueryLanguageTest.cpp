#include "host/OBMetadataQuery.h"

#include <doctest/doctest.h>

#include <string>
#include <string_view>
#include <vector>

namespace {

std::shared_ptr<const OBMetadataQuery> parsed(std::string_view text)
{
    OBMetadataQuery::ParseResult result = OBMetadataQuery::parse(text);
    CAPTURE(std::string(text));
    REQUIRE_MESSAGE(result.query != nullptr, result.problem);
    CHECK(result.problem.empty());
    return result.query;
}

bool matches(std::string_view query, std::string_view path)
{
    return parsed(query)->matchesByPath(path);
}

/// A query, what it matches, and what it does not.
struct Example {
    std::string query;
    std::vector<std::string> matching;
    std::vector<std::string> others;
};

void check(const std::vector<Example>& examples)
{
    for (const Example& example : examples) {
        CAPTURE(example.query);
        for (const std::string& path : example.matching) {
            CAPTURE(path);
            CHECK(matches(example.query, path));
        }
        for (const std::string& path : example.others) {
            CAPTURE(path);
            CHECK_FALSE(matches(example.query, path));
        }
    }
}

/// Whether a file called `name` has the name that `quoted`, with its modifiers, stands for.
void checkNames(const std::vector<Example>& examples)
{
    for (Example example : examples) {
        example.query = "kMDItemFSName = " + example.query;
        check({ example });
    }
}

void checkProblem(std::string_view text, std::string_view problem)
{
    CAPTURE(std::string(text));
    const OBMetadataQuery::ParseResult result = OBMetadataQuery::parse(text);
    CHECK(result.query == nullptr);
    CHECK(result.problem == problem);
}

} // namespace

TEST_CASE("a query for projects finds names with their extension, case ignored")
{
    check({ { "(kMDItemFSName = '*.mtrproject'c)",
        { "/a/CurrentVersion.mtrproject", "/a/B.MTRPROJECT", "/.mtrproject", "x.mtrproject" },
        { "/a/x.mtrproject/b", "/a/mtrproject", "/x.mtrproject.bak", "/x.mtrprojec" } } });
}

TEST_CASE("a query for a content type finds names with a movie's extension")
{
    check({ { "(kMDItemContentType = 'org.ombrix.movie')", { "/a/b.mov", "/a.MOV", "/a.m4v", "/x/.hid.mp4", "/a.3gp" },
        { "/a.avi", "/a", "/a.mov/b", "/mov" } } });
    check({ { "kMDItemContentType != 'org.ombrix.movie'", { "/a.avi", "/a" }, { "/a.mov" } } });
    check({ { "kMDItemContentType = '*'", { "/a.mov" }, { "/a.avi", "/a" } } });
}

TEST_CASE("a text is equal by one or two equal signs, and not equal by an exclamation mark before one")
{
    check({ { "kMDItemFSName = 'a.mov'", { "/b/a.mov" }, { "/b/A.mov", "/b/a.mov2", "/b/aXmov" } },
        { "kMDItemFSName == \"a.mov\"", { "/b/a.mov" }, { "/b/b.mov" } },
        { "kMDItemFSName != 'a.mov'", { "/b/A.mov", "/b/c" }, { "/b/a.mov" } },
        { "kMDItemPath = '/b/*.mov'", { "/b/a.mov", "/b/c/d.mov" }, { "/c/a.mov", "/b/a.mp4" } } });
}

TEST_CASE("an asterisk stands for any characters and a question mark for one")
{
    checkNames({ { "'*'", { "/a", "/\xFF" }, {} }, { "'a*'", { "/a", "/abc" }, { "/ba" } },
        { "'*a*b*'", { "/ab", "/xaxbx", "/aab" }, { "/ba", "/a" } }, { "'**.mov'", { "/x.mov" }, { "/x" } },
        { "'a?c'",
            { "/abc", "/a\u00E4c", "/a\U0001F600c",
                "/a\xFF"
                "c" },
            { "/ac", "/abbc",
                "/a\xFF\xFE"
                "c" } },
        { "'*ab'", { "/aab", "/abab" }, { "/aba" } }, { "'?*'", { "/a", "/ab" }, {} },
        { "'*.?ov'", { "/a.mov", "/a.b.nov" }, { "/a.ov" } } });
}

TEST_CASE("a character behind a backslash stands for itself")
{
    checkNames({ { R"('a\*')", { "/a*" }, { "/ab", "/a" } }, { R"('a\?')", { "/a?" }, { "/ab" } },
        { R"('it\'s')", { "/it's" }, { "/its" } }, { R"("it's")", { "/it's" }, {} }, { R"("a\"b")", { "/a\"b" }, {} },
        { R"('say "hi"')", { "/say \"hi\"" }, {} }, { R"('a\\b')", { "/a\\b" }, { "/ab" } },
        { R"('\a\b')", { "/ab" }, { "/\\a\\b" } } });
}

TEST_CASE("c leaves case out of account")
{
    checkNames({ { "'stra\u00DFe*'c", { "/STRA\u1E9EE.mov", "/Stra\u00DFe" }, { "/STRASSE" } },
        { "'\u00C4RGER'c", { "/\u00E4rger" }, { "/arger" } }, { "'\u03A3'c", { "/\u03C2" }, {} },
        { "'a'c", { "/A" }, { "/\u00C4" } },
        { "'\xC3*'c",
            { "/\xC3"
              "A" },
            { "/\xE3"
              "A" } } });
}

TEST_CASE("d leaves accents out of account, however they are written")
{
    checkNames({ { "'resume'd", { "/r\u00E9sum\u00E9", "/re\u0301sume\u0301" }, { "/R\u00E9sum\u00E9", "/resum" } },
        { "'r\u00E9sum?'d", { "/resume", "/resume\u0301", "/re\u0301sum\u1EC5" }, { "/resumes" } },
        { "'Hanoi*'cd", { "/h\u00E0n\u1ED9i.mov" }, { "/hano" } }, { "'\u304B'd", { "/\u304B" }, { "/\u304C" } },
        { "'o'd", { "/\u00F6" }, { "/\u00F8" } } });
}

TEST_CASE("accents count unless d is given, and so does how they are written")
{
    checkNames({ { "'caf\u00E9'c", { "/CAF\u00C9" }, { "/cafe", "/cafe\u0301" } } });
}

TEST_CASE("w finds whole words of a text")
{
    checkNames({ { "'trip'w", { "/my trip.mov", "/trip", "/a-trip-b", "/(trip)", "/x_trip" },
                     { "/trips.mov", "/atrip", "/Trip", "/trip2", "/tri" } },
        { "'trip'cw", { "/My TRIP.mov" }, { "/TRIPLE" } }, { "'sea trip'w", { "/a sea trip." }, { "/sea  trip" } },
        { "'tri*'w", { "/my trips.mov" }, { "/atrip" } }, { "'caf\u00E9'w", { "/caf\u00E9.mov" }, { "/caf\u00E9s" } },
        { "'cafe'wd", { "/cafe\u0301.mov" }, { "/cafe\u0301s" } },
        { "'e'w", { "/e" },
            { "/e\u0301",
                "/\xFF"
                "e" } },
        { "'\u65C5'w", { "/\u3010\u65C5\u3011" }, { "/\u65C5\u884C" } }, { "'.mov'w", { "/a.mov" }, {} } });
}

TEST_CASE("modifiers stand in any order and any number")
{
    checkNames({ { "'trip'wdc", { "/Tr\u00EDp 1" }, { "/trips" } }, { "'trip'ccc", { "/TRIP" }, {} } });
}

TEST_CASE("and binds closer than or, and not closer than both")
{
    const std::string a = "kMDItemFSName = '*a*'";
    const std::string b = "kMDItemFSName = '*b*'";
    const std::string c = "kMDItemFSName = '*c*'";
    check({ { a + " && " + b, { "/ab" }, { "/a", "/b" } }, { a + "||" + b, { "/a", "/b" }, { "/c" } },
        { a + " || " + b + " && " + c, { "/a", "/bc" }, { "/b", "/c" } },
        { a + " && " + b + " || " + c, { "/c", "/ab" }, { "/a", "/b" } },
        { "(" + a + " || " + b + ") && " + c, { "/ac", "/bc" }, { "/a", "/c" } },
        { "!" + a + " && " + b, { "/b" }, { "/ab", "/c" } }, { "!(" + a + " && " + b + ")", { "/a", "/b" }, { "/ab" } },
        { "! ! " + a, { "/a" }, { "/b" } }, { "!!!(" + a + ")", { "/b" }, { "/a" } },
        { "((" + a + "))", { "/a" }, { "/b" } }, { a + "&&" + b + "&&" + c, { "/abc" }, { "/ab", "/bc" } },
        { "\t(\n" + a + "\r )", { "/a" }, { "/b" } } });
}

TEST_CASE("a query knows whether the path alone answers it")
{
    for (const char* text : { "kMDItemFSName = 'a'", "kMDItemPath = 'a'", "kMDItemContentType = 'a'",
             "!(kMDItemFSName = 'a' || kMDItemPath = 'b'd)" })
        CHECK(parsed(text)->asksOnlyForNamePathOrType());
    for (const char* text : { "kMDItemFSSize > 1", "kMDItemFSName = 'a' || kMDItemFSSize > 1",
             "!(kMDItemFSName = 'a' && (kMDItemPath = 'b' || kMDItemPixelWidth = 1))" }) {
        CHECK_FALSE(parsed(text)->asksOnlyForNamePathOrType());
        CHECK_FALSE(parsed(text)->matchesByPath("/a"));
    }
}

TEST_CASE("a bad query is told with the column of what is wrong")
{
    checkProblem("", "column 1: the query is empty");
    checkProblem("  ", "column 1: the query is empty");
    checkProblem("kMDItemName = 'a'", "column 1: unknown attribute \"kMDItemName\"");
    checkProblem("(kMDItemFSName='a' && fsname='b')", "column 23: unknown attribute \"fsname\"");
    checkProblem("kMDItemFSName", "column 14: =, ==, !=, <, >, <= or >= is missing after kMDItemFSName");
    checkProblem("kMDItemFSName 'a'", "column 15: =, ==, !=, <, >, <= or >= is missing after kMDItemFSName");
    checkProblem("kMDItemFSName =", "column 16: kMDItemFSName is a text: compare it with a text in quotes");
    checkProblem("kMDItemFSName === 'a'", "column 17: kMDItemFSName is a text: compare it with a text in quotes");
    checkProblem("= 'a'", "column 1: the name of an attribute is missing here");
    checkProblem("kMDItemFSName = 'a' &&", "column 23: the name of an attribute is missing here");
    checkProblem("kMDItemFSName = 'a' & kMDItemFSName = 'b'", "column 21: && or || is missing here");
    checkProblem("kMDItemFSName = 'a'  'b'", "column 22: && or || is missing here");
    checkProblem("kMDItemFSName = 'a", "column 17: this quoted text has no end");
    checkProblem("kMDItemFSName = 'a\\'", "column 17: this quoted text has no end");
    checkProblem("kMDItemFSName = 'a\\", "column 17: this quoted text has no end");
    checkProblem("kMDItemFSName = 'a'cx", "column 21: unknown modifier \"x\" (known are c, d and w)");
    checkProblem("kMDItemFSName = 'a'C", "column 20: unknown modifier \"C\" (known are c, d and w)");
    checkProblem(" (kMDItemFSName = 'a'", "column 2: this \"(\" is not closed");
    checkProblem("kMDItemFSName = 'a')", "column 20: this \")\" closes nothing");
    checkProblem("(kMDItemFSName = 'a' 'b')", "column 22: && or || is missing here");
    checkProblem("()", "column 2: the name of an attribute is missing here");
}

TEST_CASE("a column counts characters, and each byte that is no UTF-8 as one")
{
    checkProblem("kMDItemFSName = '\u00E4\U0001F600' x", "column 22: && or || is missing here");
    checkProblem("kMDItemFSName = '\xFF\xFE' x", "column 22: && or || is missing here");
}

TEST_CASE("only like is compared with like")
{
    const std::string date = "column 25: kMDItemFSCreationDate is a date: compare it with "
                             "$time.iso(\"2011-03-03T10:00:00Z\")";
    checkProblem("kMDItemFSName = 5", "column 17: kMDItemFSName is a text: compare it with a text in quotes");
    checkProblem("kMDItemFSName < 'a'", "column 15: kMDItemFSName is a text: only =, == and != compare it");
    for (const char* value : { "'5'", "5x", "1.2.3", "--1", "+-1", "inf", "nan", "", "0x10", "+", "5 5" })
        CHECK_FALSE(OBMetadataQuery::parse("kMDItemFSSize > " + std::string(value)).problem.empty());
    checkProblem(
        "kMDItemFSSize > '5'", "column 17: kMDItemFSSize is a number: compare it with a number, such as 1024 or 1.5");
    checkProblem("kMDItemFSSize > 1e999", "column 17: this number is too large or too small");
    checkProblem("kMDItemFSCreationDate > '2011'", date);
    checkProblem("kMDItemFSCreationDate > 2011", date);
    checkProblem("kMDItemFSCreationDate > $time.now", date);
}

TEST_CASE("a date that is none is told")
{
    for (const char* text : { "2011-03-03T10:00:00", "2011-3-3", "2011-02-29", "2011-13-01", "2011-03-03T25:00:00Z",
             "2011-03-03T10:60:00Z", "2011-03-03 10:00:00Z", "2011-03-03T10:00Z", "2011-03-03T10:00:00.Z", "", "x",
             "2011-03-03T10:00:00.0123456789Z", "2011-03-03T10:00:00+1:00", "2011-03-03T10:00:00ZZ", "2011-03-03Z",
             "0000-00-00", "\u00E4" }) {
        CAPTURE(text);
        const std::string query = "kMDItemFSCreationDate > $time.iso(\"" + std::string(text) + "\")";
        CHECK(OBMetadataQuery::parse(query).problem
            == "column 25: no date: write it as in $time.iso(\"2011-03-03T10:00:00Z\")");
    }
    for (const char* text : { "$time.iso(2011-03-03", "$time.iso('2011-03-03'", "$time.iso()", "$time.iso(\"\")" })
        CHECK(OBMetadataQuery::parse("kMDItemFSCreationDate > " + std::string(text)).query == nullptr);
}

TEST_CASE("parentheses may stand a hundred deep inside each other, and no deeper")
{
    const auto nested
        = [](std::size_t depth) { return std::string(depth, '(') + "kMDItemFSName = 'a'" + std::string(depth, ')'); };
    CHECK(matches(nested(100), "/a"));
    checkProblem(nested(101), "column 101: more than 100 parentheses inside each other");
    checkProblem(std::string(1'000'000, '('), "column 101: more than 100 parentheses inside each other");
    CHECK(matches(std::string(1'000'000, '!') + "kMDItemFSName = 'a'", "/a"));
}

TEST_CASE("a query of very many comparisons is answered")
{
    std::string text = "kMDItemFSName = 'b'";
    for (int count = 0; count < 20'000; ++count)
        text += " || kMDItemFSName = 'a'";
    CHECK(matches(text, "/a"));
    CHECK_FALSE(matches(text, "/c"));
}

TEST_CASE("every query that is cut short is told in one line or is a query")
{
    const std::string whole = "!(kMDItemFSName == \"a\\\"*?\"cdw || kMDItemFSSize >= -1.5e3) && "
                              "kMDItemFSCreationDate < $time.iso('2011-03-03T10:00:00.5+01:00')";
    CHECK(OBMetadataQuery::parse(whole).query != nullptr);
    for (std::size_t length = 0; length < whole.size(); ++length) {
        const OBMetadataQuery::ParseResult result = OBMetadataQuery::parse(std::string_view(whole).substr(0, length));
        CHECK((result.query == nullptr) != result.problem.empty());
        CHECK(result.problem.find('\n') == std::string::npos);
    }
}
