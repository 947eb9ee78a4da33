#include "tests/plugin/support/SourceMachine.h"

#include <doctest/doctest.h>

#include <limits>

using namespace tests;
using platform::Value;

namespace {

constexpr const char* key = "ZREventLibraryModule.arrangeEventsByMostRecent";
constexpr const char* plistHead = "<?xml version=\"1.0\" encoding=\"UTF-8\"?><plist version=\"1.0\">";

bool mostRecentFirstWhenStored(const Value& value)
{
    SourceMachine machine;
    machine.preferences.set("org.ombrix.Montaro", key, value);
    return machine.makeSource()->inspection()->mostRecentEventFirst().value();
}

void storePreferences(const SourceMachine& machine, const std::string& content)
{
    machine.disk.file("home/Library/Preferences/org.ombrix.Montaro.plist", plistHead + content + "</plist>");
}

} // namespace

TEST_CASE("the most recent events come first where the editor has stored nothing")
{
    SourceMachine machine;
    CHECK(machine.makeSource()->inspection()->mostRecentEventFirst() == true);
    storePreferences(machine, "<dict><key>other</key><false/></dict>");
    CHECK(machine.makeSource()->inspection()->mostRecentEventFirst() == true);
}

TEST_CASE("the editor's stored boolean says whether the most recent events come first")
{
    CHECK(mostRecentFirstWhenStored(true));
    CHECK_FALSE(mostRecentFirstWhenStored(false));
}

TEST_CASE("a stored number is true unless it is zero, also when it is not a number at all")
{
    CHECK(mostRecentFirstWhenStored(1));
    CHECK(mostRecentFirstWhenStored(-7));
    CHECK_FALSE(mostRecentFirstWhenStored(0));
    CHECK(mostRecentFirstWhenStored(0.25));
    CHECK_FALSE(mostRecentFirstWhenStored(0.0));
    CHECK_FALSE(mostRecentFirstWhenStored(-0.0));
    CHECK(mostRecentFirstWhenStored(std::numeric_limits<double>::quiet_NaN()));
}

TEST_CASE("a stored text is true when it begins with Y, T or a digit but zero, after white space, a sign and zeros")
{
    for (const char* text : { "Y", "yes", "T", "true", "1", "9", " \t\n+0007", "-1", "0Y", "-t", "YIKES" }) {
        CAPTURE(text);
        CHECK(mostRecentFirstWhenStored(text));
    }
    for (const char* text : { "", "no", "N", "false", "0", "-0", "+", "on", "- 1", "++1", "00x", ".5", "ja" }) {
        CAPTURE(text);
        CHECK_FALSE(mostRecentFirstWhenStored(text));
    }
}

TEST_CASE("a stored value that is neither boolean, number nor text leaves the most recent events first")
{
    CHECK(mostRecentFirstWhenStored(Value::List { false }));
    CHECK(mostRecentFirstWhenStored(Value::Dictionary { { "a", false } }));
    CHECK(mostRecentFirstWhenStored(platform::Date { 0, 0 }));
    CHECK(mostRecentFirstWhenStored(Value::Data { "0" }));
}

TEST_CASE("checking the preferences sees what the editor has written, changed and removed meanwhile")
{
    SourceMachine machine;
    const auto source = machine.makeSource();
    const auto checked = [&] {
        source->_checkMontaroPreferences();
        return source->inspection()->mostRecentEventFirst().value();
    };
    storePreferences(machine, "<dict><key>ZREventLibraryModule.arrangeEventsByMostRecent</key><false/></dict>");
    CHECK(source->inspection()->mostRecentEventFirst() == true);
    CHECK_FALSE(checked());
    storePreferences(
        machine, "<dict><key>ZREventLibraryModule.arrangeEventsByMostRecent</key><integer>1</integer></dict>");
    CHECK(checked());
    storePreferences(
        machine, "<dict><key>ZREventLibraryModule.arrangeEventsByMostRecent</key><string>no</string></dict>");
    CHECK_FALSE(checked());
    storePreferences(machine, "<dict/>");
    CHECK(checked());
}

TEST_CASE("preferences that cannot be read leave the most recent events first, and the reason is logged once")
{
    SourceMachine machine;
    machine.disk.file("home/Library/Preferences/org.ombrix.Montaro.plist", "no property list");
    const auto source = machine.makeSource();
    source->_checkMontaroPreferences();
    CHECK(source->inspection()->mostRecentEventFirst() == true);
    const auto log = machine.takeLog();
    REQUIRE(log.size() == 1);
    CHECK(log[0].level == 2);
    CHECK(log[0].message.find("org.ombrix.Montaro.plist") != std::string::npos);
}
