#include "tests/host/TestHost.h"

#include <doctest/doctest.h>

#include <string>
#include <thread>
#include <utility>
#include <vector>

using namespace tests;
using platform::Text;
using platform::Value;
using Lines = std::vector<std::string>;

namespace {

platform::StringTableAnswer tableWith(const char* title)
{
    return { Value::Dictionary { { "title", title }, { "empty", "" }, { "wrong", 5 } }, {} };
}

/// What a plug-in with English, German and Arabic texts answers for "title" to a user of these languages.
Text titleIn(TestHost& test, std::vector<std::string> languages)
{
    test.machine.languages.languages = std::move(languages);
    test.bundle().manifest.languages = { "en", "de", "ar" };
    test.bundle().tables["en"] = tableWith("Events");
    test.bundle().tables["de"] = tableWith("Ereignisse");
    if (test.bundle().tables.count("ar") == 0)
        test.bundle().tables["ar"] = tableWith("\xd8\xa3\xd8\xad\xd8\xaf\xd8\xa7\xd8\xab");
    return test.manager()->localizedString("title");
}

} // namespace

TEST_CASE("no text for a key is told from an empty text")
{
    TestHost test;
    test.bundle().tables["en"] = tableWith("Events");
    const auto manager = test.manager();
    CHECK(test.host().plugins().front().flaw == "");
    CHECK(manager->localizedString("title") == "Events");
    CHECK_FALSE(manager->localizedString("empty").isAbsent());
    CHECK(manager->localizedString("empty").empty());
    CHECK(manager->localizedString("nothing").isAbsent());
    CHECK(manager->localizedString("").isAbsent());
    CHECK(manager->localizedString("wrong").isAbsent());
    CHECK(manager->pluginBundle().localizedString("title") == "Events");
}

TEST_CASE("texts are in the first of the user's languages that the plug-in has")
{
    TestHost german;
    CHECK(titleIn(german, { "fr_CA", "fr", "de_AT", "de", "ar" }) == "Ereignisse");
    TestHost english;
    CHECK(titleIn(english, { "en_GB", "en", "de" }) == "Events");
}

TEST_CASE("texts are English for a user of no language that the plug-in has, and for one who names none")
{
    TestHost french;
    CHECK(titleIn(french, { "fr" }) == "Events");
    TestHost none;
    CHECK(titleIn(none, {}) == "Events");
}

TEST_CASE("a damaged table is logged, and the next language is used, or else English")
{
    TestHost test;
    test.bundle().tables["ar"] = { {}, "ar.strings.plist: cut short" };
    CHECK(titleIn(test, { "ar", "de" }) == "Ereignisse");
    CHECK(test.host().plugins().front().flaw == "ar.strings.plist: cut short");
    CHECK(test.log->lines() == Lines { "2 - ar.strings.plist: cut short" });

    TestHost alone;
    alone.bundle().tables["ar"] = { {}, "ar.strings.plist: cut short" };
    CHECK(titleIn(alone, { "ar" }) == "Events");
    CHECK(alone.log->lines() == Lines { "2 - ar.strings.plist: cut short" });
}

TEST_CASE("a plug-in whose only table is damaged has no texts and works")
{
    TestHost test;
    test.bundle().tables["en"] = { {}, "en.strings.plist: no property list" };
    CHECK(test.manager()->localizedString("title").isAbsent());
    CHECK(test.log->lines() == Lines { "2 - en.strings.plist: no property list" });
    const auto plugins = test.host().plugins();
    REQUIRE(plugins.size() == 1);
    CHECK(plugins[0].loaded);
    CHECK(plugins[0].reason == "");
    CHECK(plugins[0].flaw == "en.strings.plist: no property list");
}

TEST_CASE("the log is written outside of the host's locks when a damaged table is met")
{
    TestHost test;
    test.bundle().tables["en"] = { {}, "damaged" };
    Event answered;
    std::thread asking;
    bool wasAnswered = false;
    test.options.logSink = [&](std::string_view, int, const OBMediaManager*) {
        asking = std::thread([&] {
            test.host().plugins();
            answered.happen();
        });
        wasAnswered = answered.wait();
    };
    test.host();
    test.manager();
    asking.join();
    CHECK(wasAnswered);
}
