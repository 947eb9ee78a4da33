// What the source asks the framework to watch for it.

#include "plugin/OBMontaroPlugin.h"

#include "host/OBPathWatcher.h"

void OBMontaroPlugin::_watchPath(const platform::Text& path)
{
    const auto watcher = OBPathWatcher::sharedPathWatcher();
    if (path && watcher && watcher->watchPathIsUnique_observer(path, this))
        watcher->watchPath_observer(path, this);
}
