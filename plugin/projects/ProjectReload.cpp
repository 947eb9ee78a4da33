// The last step of a reload of the projects: the new ones take the place of the old among the root's children.

#include "plugin/OBMontaroPlugin.h"
#include "plugin/Sorting.h"
#include "plugin/events/MontaroSupport.h"

#include "host/OBConstants.h"

#include <utility>

namespace {

/// The old projects and folders leave, the new ones come, everything else stays.
std::vector<OBMediaGroupRef> childrenWithProjects(const OBMediaGroupList& before, const OBMediaGroupRef& library)
{
    std::vector<OBMediaGroupRef> children;
    for (const OBMediaGroupRef& child : before) {
        const OBTypeIdentifierRef type = child->typeIdentifier();
        if (type != OBMontaroProjectGroupTypeIdentifier && type != OBMontaroFolderGroupTypeIdentifier)
            children.push_back(child);
    }
    const OBMediaGroupList found = library->childGroups();
    children.insert(children.end(), found.begin(), found.end());
    return sortedGroups(std::move(children), MontaroSupport::_MontaroRootGroupComparison);
}

} // namespace

OBMediaGroupList OBMontaroPlugin::_reloadMontaroProjects()
{
    return _reloadMontaroProjects(true);
}

void OBMontaroPlugin::finishReloadMontaroProjects(const OBMediaGroupRef& library)
{
    replaceProjects(library, ScanHistory::latestScan);
}

/// False when a scan that began later has put, or will put, its own result into the tree.
bool OBMontaroPlugin::replaceProjects(const OBMediaGroupRef& library, ScanHistory::Number scan)
{
    while (const OBMediaGroupRef root = rootMediaGroup()) {
        const OBMediaGroupList before = root->childGroups();
        if (_projectScans.isSuperseded(scan))
            return false;
        std::vector<OBMediaGroupRef> sorted = childrenWithProjects(before, library);
        // With the editor gone, a library that vanished together with it keeps showing.
        if ((sorted.empty() && !canLoadData()) || root->replaceChildGroups(before, OBMediaGroupList(std::move(sorted))))
            break;
    }
    return true;
}
