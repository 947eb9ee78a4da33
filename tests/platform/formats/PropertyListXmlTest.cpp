#include "platform/formats/PropertyList.h"

#include "tests/platform/formats/Damage.h"

#include <doctest/doctest.h>

#include <cmath>

using namespace platform;

namespace {

Value valueOf(const std::string& element)
{
    const PropertyListResult result = readPropertyList("<plist>" + element + "</plist>");
    CHECK_MESSAGE(result.problem == "", element);
    return result.value;
}

std::string problemOf(const std::string& element)
{
    const PropertyListResult result = readPropertyList("<plist>" + element + "</plist>");
    CHECK(result.value.isNull());
    return result.problem;
}

const std::string rightList
    = "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n<!DOCTYPE plist PUBLIC \"-//example//list//EN\" \"list.dtd\">\n"
      "<plist version=\"1.0\"><!-- c --><dict>\n<key>flag</key><true/>\n<key>list</key><array><integer>1</integer>"
      "<real>2.5</real><false/></array><key>t</key><string>a &amp; \xC3\xA9 &#x41;<![CDATA[<b>]]></string>\n"
      "<key>d</key><date>2011-03-03T10:00:00Z</date><key>b</key><data>\n\tZm9v\n\tYg==\n\t</data><key>e</key><dict/></"
      "dict></plist>\n";

} // namespace

TEST_CASE("an XML property list is read with every type")
{
    const PropertyListResult result = readPropertyList(rightList);
    REQUIRE(result.problem == "");
    CHECK(result.value
        == Value(Value::Dictionary { { "flag", true }, { "list", Value::List { 1, 2.5, false } },
            { "t", "a & \xC3\xA9 A<b>" }, { "d", Date { 1299146400, 0 } }, { "b", Value::Data { Text("foob") } },
            { "e", Value::Dictionary {} } }));
}

TEST_CASE("integers are decimal or hexadecimal, and larger than a sign allows become reals")
{
    CHECK(valueOf("<integer> 42\n</integer>") == Value(42));
    CHECK(valueOf("<integer>+7</integer>") == Value(7));
    CHECK(valueOf("<integer>-0x10</integer>") == Value(-16));
    CHECK(valueOf("<integer>0XfF</integer>") == Value(255));
    CHECK(valueOf("<integer>-9223372036854775808</integer>") == Value(INT64_MIN));
    CHECK(valueOf("<integer>9223372036854775807</integer>") == Value(INT64_MAX));
    CHECK(valueOf("<integer>18446744073709551615</integer>") == Value(18446744073709551615.0));
    for (const char* text :
        { "", " ", "abc", "1.5", "1 2", "--1", "0x", "18446744073709551616", "-9223372036854775809", "1e3" }) {
        CAPTURE(text);
        CHECK(problemOf("<integer>" + std::string(text) + "</integer>").substr(0, 8) == "line 1, ");
    }
}

TEST_CASE("reals are read the same in every locale")
{
    CHECK(valueOf("<real>1.5</real>") == Value(1.5));
    CHECK(valueOf("<real> -1e-3 </real>") == Value(-0.001));
    CHECK(valueOf("<real>+3</real>") == Value(3.0));
    CHECK(std::isnan(*valueOf("<real>nan</real>").real()));
    CHECK(*valueOf("<real>-infinity</real>").real() < -1e308);
    CHECK(*valueOf("<real>+infinity</real>").real() > 1e308);
    for (const char* text : { "", "1,5", "x", "1.5.5", "1e999", "+-1", "--1", "nan(1)", "1 2" }) {
        CAPTURE(text);
        CHECK(problemOf("<real>" + std::string(text) + "</real>") != "");
    }
}

TEST_CASE("wrong dates, data and booleans are refused")
{
    CHECK(problemOf("<date>2011-02-30T00:00:00Z</date>")
        == "line 1, column 34: \"2011-02-30T00:00:00Z\" is no valid <date>");
    CHECK(problemOf("<date>yesterday</date>") != "");
    CHECK(problemOf("<data>Zg=</data>") != "");
    CHECK(problemOf("<true>x</true>") != "");
    CHECK(valueOf("<true> </true>") == Value(true));
}

TEST_CASE("the structure of a property list is kept to")
{
    for (const char* element :
        { "", "<dict><true/></dict>", "<dict><key>a</key></dict>", "<dict><key>a</key><key>b</key><true/></dict>",
            "<key>a</key>", "<array><key>a</key></array>", "<true/><true/>", "<string><b/></string>", "<set/>",
            "<plist/>", "<array>text</array>", "<dict>text</dict>", "text", "<string>&nbsp;</string>",
            "<dict><key>a</key><true/><key>a</key><false/></dict>", "<array>", "<string>\x01</string>",
            "<string>&#0;</string>", "<string>\xFF</string>" }) {
        CAPTURE(element);
        CHECK(problemOf(element) != "");
    }
    CHECK(readPropertyList("<dict/>").problem == "line 1, column 1: the outermost element is <dict>, not <plist>");
    CHECK(readPropertyList("<plist><true/></plist>x").problem != "");
    CHECK(readPropertyList("<plist><true/></plist><plist/>").problem != "");
    CHECK(readPropertyList("<plist><true/></plist> \n<!-- end -->").problem == "");
    CHECK(readPropertyList("").problem == "the property list is empty");
    CHECK(readPropertyList(" \n").problem != "");
    CHECK(readPropertyList("<html/>").problem == "line 1, column 1: unknown element \"html\"");
}

TEST_CASE("a problem names the line, white space that was skipped at the start included")
{
    CHECK(readPropertyList("\n\n<?xml version=\"1.0\"?>\n<plist>\n  <sett/></plist>").problem
        == "line 5, column 3: unknown element \"sett\"");
    CHECK(problemOf("<dict>\n<key>a</key><true/>\n<key>a</key>\n<true/>\n</dict>") == "line 3: key \"a\" occurs twice");
}

TEST_CASE("a mark or white space at the start, and UTF-16, are read")
{
    CHECK(readPropertyList("\xEF\xBB\xBF" + rightList).problem == "");
    CHECK(readPropertyList("\xEF\xBB\xBF\n " + rightList).problem == "");
    CHECK(readPropertyList("\r\n\t " + rightList).problem == "");
    std::string wide = "\xFF\xFE";
    for (char letter : std::string("<plist><string>x</string></plist>"))
        wide.append(1, letter).append(1, '\0');
    CHECK(readPropertyList(wide).value == Value("x"));
}

TEST_CASE("entities of a property list's own are refused, inner and outer ones alike")
{
    const std::string end = "]><plist><string>&e;</string></plist>";
    CHECK(readPropertyList("<!DOCTYPE plist [<!ENTITY e \"x\">" + end).problem
        == "line 1, column 29: the property list declares an entity");
    CHECK(readPropertyList("<!DOCTYPE plist [<!ENTITY e SYSTEM \"/etc/hostname\">" + end).problem != "");
    CHECK(readPropertyList("<!DOCTYPE plist [<!ENTITY % p SYSTEM \"/etc/hostname\">%p;" + end).problem != "");
    CHECK(readPropertyList("<!DOCTYPE plist SYSTEM \"list.dtd\"><plist><string>a&e;b</string></plist>")
              .problem.find("unknown entity \"e\"")
        != std::string::npos);
    CHECK(readPropertyList("<!DOCTYPE plist [<!ELEMENT plist ANY>]><plist><true/></plist>").value == Value(true));
}

TEST_CASE("XML nesting is bounded, and a hundred thousand levels are no danger")
{
    const auto nested = [](int levels) {
        std::string text = "<plist>";
        for (int level = 0; level < levels; ++level)
            text += "<array>";
        for (int level = 0; level < levels; ++level)
            text += "</array>";
        return readPropertyList(text + "</plist>").problem;
    };
    CHECK(nested(256) == "");
    CHECK(nested(257).find("nested too deeply") != std::string::npos);
    CHECK(nested(100'000).find("nested too deeply") != std::string::npos);
}

TEST_CASE("200,000 keys and two million entities of an XML property list are read at once")
{
    std::string keys = "<dict>";
    for (int index = 0; index < 200'000; ++index)
        keys += "<key>a key of a preference " + std::to_string(index) + "</key><integer>1</integer>";
    CHECK(valueOf(keys + "</dict>").dictionary()->size() == 200'000);
    std::string entities;
    for (int index = 0; index < 2'000'000; ++index)
        entities += "&amp;";
    CHECK(valueOf("<string>" + entities + "</string>") == Value(Text(std::string(2'000'000, '&'))));
}

TEST_CASE("an XML property list that is too large is refused")
{
    CHECK(readPropertyList(std::string(largestPropertyList + 1, ' ')).problem
        == "the property list is larger than 64 MiB");
    std::string values = "<array>";
    for (int index = 0; index < 1'000'000; ++index)
        values += "<true/>";
    CHECK(problemOf(values + "</array>").find("too many values") != std::string::npos);
}

TEST_CASE("a damaged XML property list is read or refused with one line")
{
    forEachDamage(rightList, [](const std::string& damaged) {
        const PropertyListResult result = readPropertyList(damaged);
        CHECK(result.problem.find('\n') == std::string::npos);
        CHECK((result.problem.empty() || result.value.isNull()));
        if (damaged.size() < rightList.size() - 1)
            CHECK(result.problem != "");
    });
}
