#include "tests/plugin/support/SourceMachine.h"

#include <doctest/doctest.h>

#include <limits>
#include <map>

using namespace tests;
using platform::Value;

namespace {

constexpr const char* key = "MediaBrowserThreadPriorityFolderMediaManager";

double priorityWhenStored(const Value& value)
{
    SourceMachine machine;
    machine.preferences.set("org.ombrix.browser", key, value);
    return machine.makeSource()->loadThreadPriority();
}

} // namespace

TEST_CASE("the load thread's priority is 0.5 where the host has no value for it")
{
    SourceMachine machine;
    CHECK(machine.makeSource()->loadThreadPriority() == 0.5);
}

TEST_CASE("a stored priority is taken from 0.0 to 1.0, both ends included")
{
    CHECK(priorityWhenStored(1.0) == 1.0);
    CHECK(priorityWhenStored(0.0) == 0.0);
    CHECK(priorityWhenStored(0.25) == 0.25);
    CHECK(priorityWhenStored(1) == 1.0);
    CHECK(priorityWhenStored(0) == 0.0);
}

TEST_CASE("a stored priority outside 0.0 to 1.0 leaves 0.5")
{
    CHECK(priorityWhenStored(1.0001) == 0.5);
    CHECK(priorityWhenStored(-0.1) == 0.5);
    CHECK(priorityWhenStored(2) == 0.5);
    CHECK(priorityWhenStored(-1) == 0.5);
    CHECK(priorityWhenStored(std::numeric_limits<double>::infinity()) == 0.5);
}

TEST_CASE("a stored priority that is not a number leaves 0.5")
{
    CHECK(priorityWhenStored(std::numeric_limits<double>::quiet_NaN()) == 0.5);
}

TEST_CASE("a stored boolean is a priority of 1 or 0")
{
    CHECK(priorityWhenStored(true) == 1.0);
    CHECK(priorityWhenStored(false) == 0.0);
}

TEST_CASE("a stored text is a priority as far as it reads as a decimal number")
{
    CHECK(priorityWhenStored("0.75") == 0.75);
    CHECK(priorityWhenStored(" \t\n+0.25") == 0.25);
    CHECK(priorityWhenStored(".5e0 and more") == 0.5);
    CHECK(priorityWhenStored("2.5e-1") == 0.25);
    CHECK(priorityWhenStored("1.") == 1.0);
    CHECK(priorityWhenStored("0.3.9") == 0.3);
    CHECK(priorityWhenStored("1e") == 1.0);
    CHECK(priorityWhenStored("0.7e+") == 0.7);
}

TEST_CASE("a stored text that does not start with a number is a priority of 0")
{
    for (const char* text :
        { "", "fast", "x1", "- 0.5", "--1", ".", "+", "e1", "inf", "INFINITY", "nan", "-nan", "0x1p-1" }) {
        CAPTURE(text);
        CHECK(priorityWhenStored(text) == 0.0);
    }
}

TEST_CASE("a stored text that reads as a number outside 0.0 to 1.0 leaves 0.5")
{
    const std::string large(400, '9');
    for (const std::string& text : { std::string("2"), std::string("-0.5"), std::string("1.0001"), std::string("1e400"),
             std::string("-1e400"), large, large + "e-1" }) {
        CAPTURE(text);
        CHECK(priorityWhenStored(platform::Text(text)) == 0.5);
    }
}

TEST_CASE("a stored text whose number is too small to tell from nothing counts as 0.0")
{
    const std::string zeros(400, '0');
    for (const std::string& text : { "0." + zeros + "1", "0." + zeros + "1e5", std::string("1e-400") }) {
        CAPTURE(text);
        CHECK(priorityWhenStored(platform::Text(text)) == 0.0);
    }
}

TEST_CASE("a stored priority of any other type counts as absent")
{
    CHECK(priorityWhenStored(Value::List { 1.0 }) == 0.5);
    CHECK(priorityWhenStored(Value::Dictionary { { "a", 1.0 } }) == 0.5);
    CHECK(priorityWhenStored(platform::Date { 1, 0 }) == 0.5);
    CHECK(priorityWhenStored(Value::Data { "1" }) == 0.5);
}

TEST_CASE("the stored priority is that of the host application's own defaults in the home folder")
{
    SourceMachine machine;
    machine.disk.file("home/Library/Preferences/org.ombrix.browser.plist",
        "<?xml version=\"1.0\" encoding=\"UTF-8\"?><plist version=\"1.0\"><dict>"
        "<key>MediaBrowserThreadPriorityFolderMediaManager</key><real>0.125</real></dict></plist>");
    machine.disk.file("home/Library/Preferences/org.ombrix.Montaro.plist",
        "<?xml version=\"1.0\" encoding=\"UTF-8\"?><plist version=\"1.0\"><dict>"
        "<key>MediaBrowserThreadPriorityFolderMediaManager</key><real>0.875</real></dict></plist>");
    CHECK(machine.makeSource()->loadThreadPriority() == 0.125);
}

TEST_CASE("a load runs at the priority that was stored")
{
    const std::map<std::string, double> priorities { { "0", 1.0 }, { "10", 0.25 }, { "19", 0.0 } };
    for (const auto& entry : priorities) {
        SourceMachine machine;
        machine.preferences.set("org.ombrix.browser", key, entry.second);
        const auto source = machine.makeSource();
        machine.load(*source);
        CHECK(machine.threads.niceValues.take() == std::vector<std::string> { entry.first });
    }
}
