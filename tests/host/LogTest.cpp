#include "host/OBConstants.h"
#include "host/OBLog.h"
#include "tests/host/TestHost.h"

#include <doctest/doctest.h>

#include <string>
#include <vector>

using namespace tests;
using Lines = std::vector<std::string>;

TEST_CASE("a message reaches the application's log with its level and sender")
{
    TestHost test;
    const OBMediaManager* sender = nullptr;
    test.options.logSink = [&sender, log = test.log](std::string_view message, int level, const OBMediaManager* by) {
        log->write(std::to_string(level) + " " + std::string(message));
        sender = by;
    };
    const auto manager = test.manager();
    OBLog("Montaro was found", 2, manager.get());
    CHECK(sender == manager.get());
    OBLog("", 7, nullptr);
    CHECK(sender == nullptr);
    CHECK(test.log->lines() == Lines { "2 Montaro was found", "7 " });
}

TEST_CASE("a message goes nowhere without a host, or with a host that has no log")
{
    TestHost test;
    OBLog("before", 1, nullptr);
    test.host();
    OBLog("during", 1, nullptr);
    test.endHost();
    OBLog("after", 1, nullptr);
    CHECK(test.log->lines() == Lines { "1 - during" });

    TestHost silent;
    silent.options.logSink = nullptr;
    silent.host();
    OBLog("unheard", 1, nullptr);
    CHECK(silent.log->lines().empty());
}

TEST_CASE("why preferences cannot be read is logged at level 2, once, and they count as absent")
{
    TestHost test;
    test.machine.preferences.domains["org.test.Damaged"] = { {}, "/home/ann/x.plist: cut short" };
    test.machine.preferences.domains["org.test.Other"] = { {}, "/home/ann/y.plist: not permitted" };
    const auto manager = test.manager();
    const auto second = test.manager();
    CHECK(manager->preferencesOfDomain("org.test.Damaged").isNull());
    CHECK(manager->preferencesOfDomain("org.test.Damaged").isNull());
    CHECK(second->preferencesOfDomain("org.test.Damaged").isNull());
    CHECK(test.log->lines() == Lines { "2 manager /home/ann/x.plist: cut short" });
    manager->preferencesOfDomain("org.test.Other");
    CHECK(test.log->count("2 manager /home/ann/y.plist: not permitted") == 1);
}

TEST_CASE("preferences that were never stored are absent without a word")
{
    TestHost test;
    test.machine.preferences.domains["org.test.Good"] = { platform::Value::Dictionary { { "key", "value" } }, {} };
    const auto manager = test.manager();
    CHECK(manager->preferencesOfDomain("org.test.Never").isNull());
    CHECK(manager->preferencesOfDomain("org.test.Good").valueForKey("key") == platform::Value("value"));
    CHECK(test.log->lines().empty());
}

TEST_CASE("the log may be used while it is being written to")
{
    TestHost test;
    int depth = 0;
    test.options.logSink = [&depth](std::string_view, int, const OBMediaManager*) {
        if (++depth < 3)
            OBLog("again", 2, nullptr);
    };
    test.machine.preferences.domains["org.test.Damaged"] = { {}, "damaged" };
    const auto manager = test.manager();
    manager->preferencesOfDomain("org.test.Damaged");
    CHECK(depth == 3);
}
