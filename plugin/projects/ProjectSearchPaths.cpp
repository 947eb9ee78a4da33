// Which folders may hold projects.
//
// The one surprise: the list is made once. A volume that is mounted later is never searched for projects.

#include "plugin/MontaroConstants.h"
#include "plugin/OBMontaroPlugin.h"
#include "plugin/SearchFolders.h"
#include "plugin/SharedValues.h"

#include "platform/FileSystem.h"

using platform::Locked;
using platform::Text;

Text OBMontaroPlugin::_MontaroDefaultPath()
{
    Text path = sharedValues().defaultProjectsPath.load();
    if (!path) {
        path = folderInMovies(platform(), MontaroProjectsFolderName);
        sharedValues().defaultProjectsPath.store(path);
    }
    return path;
}

void OBMontaroPlugin::_prepareMontaroProjectsSearchPaths()
{
    Locked guard(*_MontaroSearchPathsLock);
    const Text defaultPath = _MontaroDefaultPath();
    _missingMontaroDefaultPath = !defaultPath || !platform().fileSystem.exists(defaultPath);
    _MontaroSearchPaths.store(
        std::make_shared<const std::vector<Text>>(foldersToSearch(platform(), defaultPath, MontaroProjectsFolderName)));
}
