// Event libraries become one library group.

#include "plugin/MontaroConstants.h"
#include "plugin/SharedValues.h"
#include "plugin/events/EventScan.h"

#include "host/OBConstants.h"
#include "host/OBPathWatcher.h"
#include "platform/PathText.h"

using platform::Locked;
using platform::Text;

OBMediaGroupRef OBMontaroPlugin::_reloadMontaroEvents_updateRootMediaGroup(const Text& parentID, bool updateRoot)
{
    _poolingEventsReload = false;
    EventScan scan { ScanReport(*this), std::make_shared<platform::Snapshot<OBMediaGroupList>>() };
    _flatEventGroupsList.store(scan.flatGroups);

    {
        Locked guard(*_MontaroEventsSearchPathsLock);
        const MontaroSearchPaths paths = _MontaroEventsSearchPaths.load();
        for (const Text& path : paths ? *paths : std::vector<Text>()) {
            if (isCancelLoadRequestPending())
                break;
            // Asked of the folder that holds the library, while the library is what is watched.
            const Text parent = platform::pathByRemovingLastComponent(path);
            const auto watcher = OBPathWatcher::sharedPathWatcher();
            if (watcher && watcher->watchPathIsUnique_observer(parent, this))
                _watchPath(path);
        }
    }
    if (isCancelLoadRequestPending())
        return nullptr;

    const Text libraryName = localizedString("MontaroEventLibrary");
    const OBMediaGroupRef library = OBMediaGroup::initWithTypeIdentifier(OBMontaroEventLibraryGroupTypeIdentifier);
    library->setName(libraryName);
    library->setID(libraryName);
    library->setParentID(parentID);
    library->setIcon(sharedValues().eventIcon.load());
    if (!isCancelLoadRequestPending() && updateRoot) {
        finishReloadMontaroEvents(library);
        if (const OBMediaGroupRef root = rootMediaGroup()) {
            _setMediaObjectsForRootMediaGroup(root);
            setRootMediaGroup(root);
        }
    }
    return library;
}
