// How a load builds a new tree, and what the root group itself shows.
//
// The one surprise: on a load the root's children stand in scan order; only a later reload sorts them.

#include "plugin/MontaroConstants.h"
#include "plugin/OBMontaroPlugin.h"
#include "plugin/RepresentativeMovie.h"
#include "plugin/SearchFolders.h"
#include "plugin/SharedValues.h"

#include "host/OBConstants.h"
#include "host/OBPathWatcher.h"
#include "platform/FileSystem.h"

#include <utility>

using platform::Locked;
using platform::Text;

namespace {

constexpr const char* projectQuery = "(kMDItemFSName = '*.mtrproject'c)";
constexpr const char* movieQuery = "(kMDItemContentType = 'org.ombrix.movie')";
constexpr const char* projectFormatVersion = "6";

} // namespace

void OBMontaroPlugin::loadData()
{
    if (firstTimeCallingLoadData()) {
        const Text preferences = expandingTilde(MontaroPrefsPath);
        if (preferences && platform().fileSystem.exists(preferences))
            _watchPath(preferences);
        _watchPath(_MontaroDefaultPath());
        observeNotification(platform().workspaceNotifications, platform::volumeMountedNotification,
            [this](const platform::Notification& notification) { _fileSystemMounted(notification); });
    }
    OBMediaManager::loadData();
}

Text OBMontaroPlugin::expandingTilde(std::string_view path) const
{
    const auto home = platform().fileSystem.homeFolder();
    return home ? Text::joined(*home, path.substr(1)) : Text();
}

OBMediaGroupRef OBMontaroPlugin::performLoadData()
{
    if (!_MontaroSearchPaths.load())
        _prepareMontaroProjectsSearchPaths();
    if (!_MontaroEventsSearchPaths.load())
        _prepareMontaroEventsSearchPaths();

    OBMediaGroupRef root = OBMediaGroup::initWithTypeIdentifier(OBMontaroRootGroupTypeIdentifier);
    root->setName(OBMontaro);
    root->setParentID({});
    root->setID(OBMontaro);
    root->setIcon(sharedValues().smallAppIcon.load());
    root->setDynamicMediaObjects(false);

    registerQueries();
    root->setChildGroups(_reloadMontaroProjects(false));
    root->addChildGroup(_reloadMontaroEvents_updateRootMediaGroup(root->ID(), false));
    _setMediaObjectsForRootMediaGroup(root);
    return root;
}

/// The framework may be gone while the last load still runs; then there is nobody to register with.
void OBMontaroPlugin::registerQueries()
{
    const auto watcher = OBPathWatcher::sharedPathWatcher();
    if (!watcher)
        return;
    std::vector<std::string> projectScope;
    if (const Text path = _MontaroDefaultPath())
        projectScope.push_back(path.string());
    watcher->watchQuery_observer_queryScope_queryRunMode(
        projectQuery, this, std::move(projectScope), OBQueryRunModeLive);
    Locked guard(*_MontaroEventsSearchPathsLock);
    watcher->watchQuery_observer_queryScope_queryRunMode(
        movieQuery, this, stringsOf(*_MontaroEventsSearchPaths.load()), OBQueryRunModeLive);
}

/// A reload that began after this load's scan of its half, and ended before the load did, has changed the tree that
/// this one replaces.
void OBMontaroPlugin::rootMediaGroupInstalled(const OBMediaGroupRef&)
{
    const ScanHistory::Result projects = _projectScans.latest();
    if (projects.number > _projectScans.loaded())
        publish([&] { return replaceProjects(projects.library, projects.number); });
    const ScanHistory::Result events = _eventScans.latest();
    if (events.number > _eventScans.loaded())
        publish([&] { return replaceEvents(events.library, events.number); });
}

/// The children may be replaced meanwhile, by a reload of the other half; the objects are made of the last.
void OBMontaroPlugin::_setMediaObjectsForRootMediaGroup(const OBMediaGroupRef& root)
{
    OBMediaGroupList children;
    do {
        children = root->childGroups();
        root->setMediaObjects(mediaObjectsOfRoot(children));
    } while (!children.isSameAs(root->childGroups()));
}

OBMediaObjectList OBMontaroPlugin::mediaObjectsOfRoot(const OBMediaGroupList& children)
{
    const std::shared_ptr<const OBMediaObjectKind> kind = representativeKind(*this, projectFormatVersion);
    OBMediaObjectList objects;
    for (const OBMediaGroupRef& child : children) {
        const OBTypeIdentifierRef type = child->typeIdentifier();
        if (type == OBMontaroProjectLibraryGroupTypeIdentifier)
            continue;
        if (type != OBMontaroProjectGroupTypeIdentifier) {
            objects = objects.appending(child->mediaObjects());
            continue;
        }
        const ChosenMovie chosen = chooseRepresentativeMovies(*this, { &child, 1 }).front();
        if (chosen.movie)
            objects = objects.appending(makeRepresentative(kind, *child, chosen));
    }
    return objects;
}

bool OBMontaroPlugin::canLoadData()
{
    const Text path = getAppPath();
    return path && platform().fileSystem.exists(path);
}

OBMediaGroupList OBMontaroPlugin::mediaGroups()
{
    const MontaroFlatGroupList events = _flatEventGroupsList.load();
    const MontaroFlatGroupList projects = _flatProjectGroupsList.load();
    std::vector<OBMediaGroupRef> groups;
    for (const MontaroFlatGroupList& list : { events, projects }) {
        if (!list)
            continue;
        const OBMediaGroupList found = list->load();
        groups.insert(groups.end(), found.begin(), found.end());
    }
    return OBMediaGroupList(std::move(groups));
}

OBMediaGroupList OBMontaroPlugin::movieGroups()
{
    return mediaGroups();
}

Text OBMontaroPlugin::defaultNoDataMessage(const OBMediaGroupRef& group)
{
    if (!group)
        return {};
    if (group == rootMediaGroup() && group->childGroups().empty())
        return localizedString("defaultNoDataMessage");
    if (group->typeIdentifier() == OBMontaroProjectGroupTypeIdentifier && group->childGroups().empty()
        && group->mediaObjects().empty())
        return localizedString("MTProjectNotReady");
    return {};
}

/// Hands the installed tree to the framework again after `replace` has changed it. A load may install another tree
/// meanwhile; then that one is changed. False from `replace`: the tree is another scan's matter.
void OBMontaroPlugin::publish(const std::function<bool()>& replace)
{
    while (replace()) {
        const OBMediaGroupRef root = rootMediaGroup();
        if (!root)
            return;
        _setMediaObjectsForRootMediaGroup(root);
        if (setRootMediaGroup(root))
            return;
    }
}
