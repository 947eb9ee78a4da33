// Which folders may hold events. The list is made once and grows when a volume is mounted.

#include "plugin/MontaroConstants.h"
#include "plugin/OBMontaroPlugin.h"
#include "plugin/SearchFolders.h"
#include "plugin/SharedValues.h"

using platform::Locked;
using platform::Text;

Text OBMontaroPlugin::_MontaroDefaultEventsFolderPath()
{
    Text path = sharedValues().defaultEventsPath.load();
    if (!path) {
        path = folderInMovies(platform(), MontaroEventsFolderName);
        sharedValues().defaultEventsPath.store(path);
    }
    return path;
}

void OBMontaroPlugin::_prepareMontaroEventsSearchPaths()
{
    Locked guard(*_MontaroEventsSearchPathsLock);
    _MontaroEventsSearchPaths.store(std::make_shared<const std::vector<Text>>(
        foldersToSearch(platform(), _MontaroDefaultEventsFolderPath(), MontaroEventsFolderName)));
}
