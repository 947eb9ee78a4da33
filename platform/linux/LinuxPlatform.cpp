#include "platform/linux/LinuxPlatform.h"

#include "platform/common/FileMetadataIndex.h"
#include "platform/common/FileMovies.h"
#include "platform/common/FilePreferences.h"
#include "platform/common/LinkTable.h"
#include "platform/common/LinkedFileSystem.h"
#include "platform/common/LocalNotificationCenter.h"
#include "platform/linux/LinuxBundles.h"
#include "platform/linux/LinuxCalendar.h"
#include "platform/linux/LinuxClock.h"
#include "platform/linux/LinuxFileSystem.h"
#include "platform/linux/LinuxLanguages.h"
#include "platform/linux/LinuxMainRunLoop.h"
#include "platform/linux/LinuxThreads.h"
#include "platform/linux/LinuxVolumes.h"
#include "platform/linux/LinuxWorkspace.h"
#include "platform/linux/StandardErrorConsole.h"
#include "platform/linux/watching/LinuxPathWatching.h"

namespace platform {

// The volumes ask the linked files where a path leads, and the links are those of the volumes: each holds the other and
// asks it nothing before both are there.
struct LinuxPlatform::Roles {
    LinuxFileSystem realFiles {};
    LinuxVolumes volumes { linkedFiles };
    LinkTable links { {}, volumes, realFiles };
    LinkedFileSystem linkedFiles { realFiles, links };
    LinuxThreads threads {};
    LinuxWorkspace workspace { linkedFiles, threads };
    FilePreferences preferences { linkedFiles };
    FileMovies movies { linkedFiles };
    FileMetadataIndex metadataIndex { linkedFiles, movies };
    LocalNotificationCenter notifications {};
    LocalNotificationCenter workspaceNotifications {};
    LinuxClock clock {};
    LinuxCalendar calendar {};
    LinuxMainRunLoop mainRunLoop {};
    StandardErrorConsole console {};
    LinuxBundles bundles { linkedFiles };
    LinuxLanguages languages {};
    LinuxPathWatching pathWatching { linkedFiles, volumes, clock, threads };
};

LinuxPlatform::LinuxPlatform()
    : _roles(std::make_unique<Roles>())
{
}

LinuxPlatform::~LinuxPlatform() = default;

Platform LinuxPlatform::platform()
{
    return { _roles->linkedFiles, _roles->pathWatching, _roles->volumes, _roles->workspace, _roles->preferences,
        _roles->metadataIndex, _roles->movies, _roles->notifications, _roles->workspaceNotifications, _roles->clock,
        _roles->calendar, _roles->threads, _roles->mainRunLoop, _roles->console, _roles->bundles, _roles->languages };
}

} // namespace platform
