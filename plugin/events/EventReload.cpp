// The last step of a reload of the events: the new library takes the place of the old among the root's children.
//
// The one surprise: a library without a single clip is taken out and not put back.

#include "plugin/OBMontaroPlugin.h"
#include "plugin/Sorting.h"
#include "plugin/events/MontaroSupport.h"

#include "host/OBConstants.h"

#include <utility>

namespace {

/// The new library in the place of each old one, or behind everything where there was none.
std::vector<OBMediaGroupRef> childrenWithEvents(const OBMediaGroupList& before, const OBMediaGroupRef& library)
{
    const bool hasClips = library && !library->mediaObjects().empty();
    std::vector<OBMediaGroupRef> children;
    bool isPlaced = false;
    for (std::size_t index = 0; index < before.size(); ++index) {
        if (before[index]->typeIdentifier() != OBMontaroEventLibraryGroupTypeIdentifier) {
            children.push_back(before[index]);
        } else if (hasClips) {
            if (children.size() > index)
                children[index] = library;
            else
                children.push_back(library);
            isPlaced = true;
        }
    }
    if (!isPlaced && hasClips)
        children.push_back(library);
    return sortedGroups(std::move(children), MontaroSupport::_MontaroRootGroupComparison);
}

} // namespace

OBMediaGroupRef OBMontaroPlugin::_reloadMontaroEvents()
{
    const OBMediaGroupRef root = rootMediaGroup();
    return _reloadMontaroEvents_updateRootMediaGroup(root ? root->ID() : platform::Text(), true);
}

void OBMontaroPlugin::finishReloadMontaroEvents(const OBMediaGroupRef& library)
{
    replaceEvents(library, ScanHistory::latestScan);
}

/// False when a scan that began later has put, or will put, its own result into the tree.
bool OBMontaroPlugin::replaceEvents(const OBMediaGroupRef& library, ScanHistory::Number scan)
{
    while (const OBMediaGroupRef root = rootMediaGroup()) {
        const OBMediaGroupList before = root->childGroups();
        if (_eventScans.isSuperseded(scan))
            return false;
        std::vector<OBMediaGroupRef> sorted = childrenWithEvents(before, library);
        if (isCancelLoadRequestPending() || root->replaceChildGroups(before, OBMediaGroupList(std::move(sorted))))
            break;
    }
    return true;
}
