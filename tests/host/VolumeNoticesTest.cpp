#include "platform/Notifications.h"
#include "tests/host/TestHost.h"

#include <doctest/doctest.h>

#include <string>
#include <vector>

using namespace tests;
using Lines = std::vector<std::string>;

namespace {

/// Writes down the volumes that an application which follows changes is told of.
struct NoticesOfVolumes {
    NoticesOfVolumes()
    {
        test.machine.bare.volumes.local = { { "/", "Boot" }, { "/media/old", "Old" } };
        test.machine.bare.workspaceNotifications.addObserver(
            platform::volumeMountedNotification, nullptr, [this](const platform::Notification& notification) {
                notices.push_back(notification.userInfo.valueForKey(platform::mountedVolumePathKey).text()->string());
            });
    }
    void mount(const std::string& path)
    {
        test.machine.bare.volumes.local.push_back({ path, "Name" });
        test.machine.bare.volumes.tellMountsChanged();
    }

    TestHost test {};
    Lines notices {};
};

} // namespace

TEST_CASE("each volume that is mounted while changes are followed is told once, those that were there are not")
{
    NoticesOfVolumes volumes;
    OBObservation following = volumes.test.host().followChanges();
    volumes.test.machine.bare.volumes.tellMountsChanged();
    CHECK(volumes.notices.empty());
    volumes.mount("/media/new");
    volumes.test.machine.bare.volumes.tellMountsChanged();
    CHECK(volumes.notices == Lines { "/media/new" });
    volumes.test.machine.bare.volumes.local.pop_back();
    volumes.test.machine.bare.volumes.tellMountsChanged();
    volumes.mount("/media/new");
    CHECK(volumes.notices == Lines { "/media/new", "/media/new" });
    following = {};
    volumes.mount("/media/later");
    CHECK(volumes.notices.size() == 2);
}

TEST_CASE("mounts are not noticed while nobody follows changes")
{
    NoticesOfVolumes volumes;
    volumes.test.host();
    volumes.mount("/media/new");
    CHECK(volumes.notices.empty());
}
