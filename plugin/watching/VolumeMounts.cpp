// What a mounted volume means for the events.
//
// The one surprise: the folder is sought below the fixed root of all volumes, under the name that people see, and not
// at the mount point itself.

#include "plugin/MontaroConstants.h"
#include "plugin/OBMontaroPlugin.h"
#include "plugin/SearchFolders.h"

#include "platform/Console.h"
#include "platform/Volumes.h"

#include <algorithm>
#include <exception>
#include <string>

using platform::Locked;
using platform::Text;

namespace {

bool isOnNetwork(std::string_view path)
{
    return path.starts_with("/Network") || path.starts_with("/private/Network");
}

} // namespace

void OBMontaroPlugin::_fileSystemMounted(const platform::Notification& notification)
{
    startThread("ob-mount", [this, notification] { _fileSystemMountedThreaded(notification); });
}

void OBMontaroPlugin::_fileSystemMountedThreaded(const platform::Notification& notification)
{
    try {
        const platform::Value mounted = notification.userInfo.valueForKey(platform::mountedVolumePathKey);
        const Text* devicePath = mounted.text();
        if (!devicePath || isOnNetwork(*devicePath))
            return;
        const std::string displayName = platform().volumes.displayName(*devicePath);
        if (displayName.empty())
            return;
        if (addEventsSearchPath(folderOnVolume(displayName, MontaroEventsFolderName)))
            watchedPathChanged_fileChangedEventFlags(*devicePath, 0);
    } catch (const std::exception& error) {
        platform().console.log(std::string("Error in _fileSystemMountedThreaded: ") + error.what());
    }
}

/// Adds a folder that is not listed yet; false before the first load has made the list.
bool OBMontaroPlugin::addEventsSearchPath(const Text& path)
{
    Locked guard(*_MontaroEventsSearchPathsLock);
    const MontaroSearchPaths paths = _MontaroEventsSearchPaths.load();
    if (!paths || std::find(paths->begin(), paths->end(), path) != paths->end())
        return false;
    auto extended = std::make_shared<std::vector<Text>>(*paths);
    extended->push_back(path);
    _MontaroEventsSearchPaths.store(std::move(extended));
    return true;
}
