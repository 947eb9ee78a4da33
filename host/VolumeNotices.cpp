#include "host/VolumeNotices.h"

#include "host/FrameworkCore.h"
#include "host/WorkCause.h"
#include "platform/Clock.h"
#include "platform/Notifications.h"
#include "platform/Volumes.h"

#include <algorithm>
#include <utility>

using platform::Locked;
using platform::Text;
using platform::Value;

void VolumeNotices::start()
{
    {
        Locked guard(_lock);
        _mounted = _core.platform().volumes.localVolumes();
    }
    _watch = _core.platform().volumes.watchMounts([this] { mountsChanged(); });
    // What was mounted between the two is new as well.
    if (_watch)
        mountsChanged();
}

void VolumeNotices::stop()
{
    _watch = nullptr;
}

void VolumeNotices::mountsChanged()
{
    std::vector<std::string> added;
    {
        Locked guard(_lock);
        std::vector<std::string> now = _core.platform().volumes.localVolumes();
        for (const std::string& volume : now) {
            if (std::find(_mounted.begin(), _mounted.end(), volume) == _mounted.end())
                added.push_back(volume);
        }
        _mounted = std::move(now);
    }
    for (const std::string& volume : added) {
        const WorkCause cause({ "mounted: " + volume, _core.platform().clock.now() });
        _core.platform().workspaceNotifications.post({ platform::volumeMountedNotification, nullptr,
            Value::Dictionary { { Text(platform::mountedVolumePathKey), Text(volume) } } });
    }
}
