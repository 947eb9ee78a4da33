#include "platform/common/LocalNotificationCenter.h"

#include <doctest/doctest.h>

#include <atomic>
#include <memory>
#include <string>
#include <thread>
#include <vector>

using platform::LocalNotificationCenter;
using platform::Notification;
using platform::NotificationCenter;

TEST_CASE_TEMPLATE("observers hear their name, in the order in which they were added", Center, LocalNotificationCenter)
{
    Center center;
    std::string heard;
    center.addObserver("mounted", nullptr, [&](const Notification&) { heard += "1"; });
    center.addObserver("other", nullptr, [&](const Notification&) { heard += "x"; });
    center.addObserver("mounted", nullptr, [&](const Notification&) { heard += "2"; });
    center.post({ "mounted" });
    CHECK(heard == "12");
}

TEST_CASE_TEMPLATE("an observer of one object hears of no other", Center, LocalNotificationCenter)
{
    Center center;
    const int object = 0;
    const int other = 0;
    int heard = 0;
    center.addObserver("changed", &object, [&](const Notification& notification) {
        CHECK(notification.object == &object);
        ++heard;
    });
    center.post({ "changed", &object });
    center.post({ "changed", &other });
    center.post({ "changed" });
    CHECK(heard == 1);
}

TEST_CASE_TEMPLATE("further facts reach the observer", Center, LocalNotificationCenter)
{
    Center center;
    platform::Value facts;
    center.addObserver("mounted", nullptr, [&](const Notification& notification) { facts = notification.userInfo; });
    center.post({ "mounted", nullptr, platform::Value::Dictionary { { "DevicePath", "/media/Stick" } } });
    CHECK(facts.valueForKey(platform::mountedVolumePathKey) == platform::Value("/media/Stick"));
}

TEST_CASE_TEMPLATE("a removed observer hears nothing more", Center, LocalNotificationCenter)
{
    Center center;
    int heard = 0;
    const NotificationCenter::Token token
        = center.addObserver("changed", nullptr, [&](const Notification&) { ++heard; });
    CHECK(token != 0);
    center.post({ "changed" });
    center.removeObserver(token);
    center.removeObserver(token);
    center.removeObserver(0);
    center.post({ "changed" });
    CHECK(heard == 1);
}

TEST_CASE_TEMPLATE("an observer may remove itself and others inside its own call", Center, LocalNotificationCenter)
{
    Center center;
    std::string heard;
    NotificationCenter::Token first = 0;
    NotificationCenter::Token second = 0;
    first = center.addObserver("changed", nullptr, [&](const Notification&) {
        heard += "1";
        center.removeObserver(first);
        center.removeObserver(second);
    });
    second = center.addObserver("changed", nullptr, [&](const Notification&) { heard += "2"; });
    center.addObserver("changed", nullptr, [&](const Notification&) { heard += "3"; });
    center.post({ "changed" });
    center.post({ "changed" });
    CHECK(heard == "133");
}

TEST_CASE_TEMPLATE(
    "an observer that is added while a notification is posted hears of the next", Center, LocalNotificationCenter)
{
    Center center;
    std::string heard;
    center.addObserver("changed", nullptr, [&](const Notification&) {
        heard += "1";
        if (heard.size() == 1)
            center.addObserver("changed", nullptr, [&](const Notification&) { heard += "2"; });
    });
    center.post({ "changed" });
    CHECK(heard == "1");
    center.post({ "changed" });
    CHECK(heard == "112");
}

TEST_CASE_TEMPLATE("an observer may post", Center, LocalNotificationCenter)
{
    Center center;
    std::string heard;
    center.addObserver("outer", nullptr, [&](const Notification&) {
        center.post({ "inner" });
        heard += "outer ";
    });
    center.addObserver("inner", nullptr, [&](const Notification&) { heard += "inner "; });
    center.post({ "outer" });
    CHECK(heard == "inner outer ");
}

TEST_CASE_TEMPLATE("what an observer owns may use the centre while it ends", Center, LocalNotificationCenter)
{
    Center center;
    int heard = 0;
    center.addObserver("ended", nullptr, [&](const Notification&) { ++heard; });
    std::shared_ptr<void> owned(nullptr, [&](void*) { center.post({ "ended" }); });
    const auto token = center.addObserver("changed", nullptr, [owned](const Notification&) {});
    owned.reset();
    center.removeObserver(token);
    CHECK(heard == 1);
}

TEST_CASE_TEMPLATE(
    "once an observer was removed no call begins, whichever thread posts", Center, LocalNotificationCenter)
{
    Center center;
    std::atomic<bool> isOver { false };
    std::vector<std::thread> posters;
    posters.reserve(3);
    for (int thread = 0; thread < 3; ++thread) {
        posters.emplace_back([&] {
            while (!isOver)
                center.post({ "changed" });
        });
    }
    std::atomic<int> calls { 0 };
    for (int round = 0; round < 300; ++round) {
        const auto token = center.addObserver("changed", nullptr, [&calls](const Notification&) { ++calls; });
        center.removeObserver(token);
    }
    isOver = true;
    for (std::thread& poster : posters)
        poster.join();
    const int callsBefore = calls;
    center.post({ "changed" });
    CHECK(calls == callsBefore);
}
