// What the source asks the framework to watch for it, and what a change means.
//
// The surprises, all meant: which half a change belongs to is read off its path alone; the shared preferences that are
// compared with are not the editor's own file, which is the one that is watched; and the main thread reloads projects
// at once and events late, while any other thread sleeps for both.

#include "plugin/MontaroConstants.h"
#include "plugin/OBMontaroPlugin.h"

#include "host/OBConstants.h"
#include "host/OBPathWatcher.h"
#include "platform/FileSystem.h"
#include "platform/MainRunLoop.h"
#include "platform/Notifications.h"
#include "platform/PathText.h"

#include <algorithm>
#include <chrono>

using platform::RunLoopModes;
using platform::Text;

namespace {

/// How long a burst of changes is awaited before one reload answers it.
constexpr std::chrono::seconds reloadDelay { 5 };

// What a reload scans, in the words of whoever is told of it.
constexpr std::string_view projectsHalf = "projects";
constexpr std::string_view eventsHalf = "events";

/// Stands for a change of the events that no path tells: it is the path of nothing, and not in the projects.
constexpr std::string_view dummyPath = "XXX";

bool isFolder(const platform::FileSystem& fileSystem, std::string_view path)
{
    const auto status = fileSystem.status(path);
    return status && status->kind == platform::ItemKind::folder;
}

bool isAmongProjects(std::string_view path)
{
    while (!path.empty()) {
        const std::size_t end = std::min(path.find('/'), path.size());
        if (path.substr(0, end) == MontaroProjectsFolderName)
            return true;
        path.remove_prefix(std::min(end + 1, path.size()));
    }
    return false;
}

} // namespace

void OBMontaroPlugin::_watchPath(const Text& path)
{
    const auto watcher = OBPathWatcher::sharedPathWatcher();
    if (path && watcher && watcher->watchPathIsUnique_observer(path, this))
        watcher->watchPath_observer(path, this);
}

void OBMontaroPlugin::watchedPathChanged_fileChangedEventFlags(std::string_view path, std::uint64_t)
{
    if (path == expandingTilde(OBZunoPrefsPath)) {
        _checkMontaroPreferences();
        return;
    }
    const auto status = platform().fileSystem.status(path);
    if (status && status->kind != platform::ItemKind::folder) {
        refreshThumbnailOfRootObject(path);
        return;
    }
    if (isCancelLoadRequestPending())
        return;
    if (isAmongProjects(path))
        projectsChanged();
    else
        eventsChanged();
}

/// Has the framework draw a movie's picture again.
void OBMontaroPlugin::refreshThumbnailOfRootObject(std::string_view path)
{
    const OBMediaGroupRef root = rootMediaGroup();
    if (!root)
        return;
    root->mediaObjects().visit([&](OBMediaObject& object) {
        if (object.path() != path)
            return true;
        object.setThumbnailImage(object.thumbnailImage());
        return false;
    });
}

void OBMontaroPlugin::projectsChanged()
{
    if (_poolingProjectsReload.exchange(true))
        return;
    if (platform().mainRunLoop.isMainThread() || sleep(reloadDelay))
        performReload(projectsHalf, [this] { _reloadMontaroProjects(); });
}

void OBMontaroPlugin::eventsChanged()
{
    if (_poolingEventsReload.exchange(true))
        return;
    const auto reload = [this] { performReload(eventsHalf, [this] { _reloadMontaroEvents(); }); };
    if (platform().mainRunLoop.isMainThread())
        performAfterDelay(reloadDelay, RunLoopModes::commonAndModalPanel, reload);
    else if (sleep(reloadDelay))
        reload();
}

void OBMontaroPlugin::watchedQueryChanged_queryScope(
    const platform::Notification& notification, const std::vector<std::string>& scope)
{
    if (notification.name != platform::metadataQueryUpdatedNotification)
        return;
    const Text projects = _MontaroDefaultPath();
    const auto isProjects
        = [&](const std::string& folder) { return !folder.empty() && projects == std::string_view(folder); };
    if (std::none_of(scope.begin(), scope.end(), isProjects)) {
        watchedPathChanged_fileChangedEventFlags(dummyPath, 0);
        return;
    }
    if (_missingMontaroDefaultPath && isFolder(platform().fileSystem, projects))
        _missingMontaroDefaultPath = false;
    else if (!_missingMontaroDefaultPath && !platform().fileSystem.exists(projects))
        _missingMontaroDefaultPath = true;
    if (_poolingProjectsReload.exchange(true))
        return;
    if (sleep(reloadDelay))
        performReload(projectsHalf, [this] { _reloadMontaroProjects(); });
}
