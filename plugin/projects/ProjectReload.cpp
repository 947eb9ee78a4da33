// The last step of a reload of the projects: the new ones take the place of the old among the root's children.

#include "plugin/OBMontaroPlugin.h"
#include "plugin/Sorting.h"
#include "plugin/events/MontaroSupport.h"

#include "host/OBConstants.h"

#include <utility>

OBMediaGroupList OBMontaroPlugin::_reloadMontaroProjects()
{
    return _reloadMontaroProjects(true);
}

void OBMontaroPlugin::finishReloadMontaroProjects(const OBMediaGroupRef& library)
{
    const OBMediaGroupRef root = rootMediaGroup();
    if (!root)
        return;
    std::vector<OBMediaGroupRef> children;
    for (const OBMediaGroupRef& child : root->childGroups()) {
        const OBTypeIdentifierRef type = child->typeIdentifier();
        if (type != OBMontaroProjectGroupTypeIdentifier && type != OBMontaroFolderGroupTypeIdentifier)
            children.push_back(child);
    }
    const OBMediaGroupList found = library->childGroups();
    children.insert(children.end(), found.begin(), found.end());

    std::vector<OBMediaGroupRef> sorted
        = sortedGroups(std::move(children), MontaroSupport::_MontaroRootGroupComparison);
    // With the editor gone, a library that vanished together with it keeps showing.
    if (sorted.empty() && !canLoadData())
        return;
    root->setChildGroups(OBMediaGroupList(std::move(sorted)));
}
