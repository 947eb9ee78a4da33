// The last step of a reload of the events: the new library takes the place of the old among the root's children.
//
// The one surprise: a library without a single clip is taken out and not put back.

#include "plugin/OBMontaroPlugin.h"
#include "plugin/Sorting.h"
#include "plugin/events/MontaroSupport.h"

#include "host/OBConstants.h"

#include <utility>

OBMediaGroupRef OBMontaroPlugin::_reloadMontaroEvents()
{
    const OBMediaGroupRef root = rootMediaGroup();
    return _reloadMontaroEvents_updateRootMediaGroup(root ? root->ID() : platform::Text(), true);
}

void OBMontaroPlugin::finishReloadMontaroEvents(const OBMediaGroupRef& library)
{
    const OBMediaGroupRef root = rootMediaGroup();
    if (!root)
        return;
    const bool hasClips = library && !library->mediaObjects().empty();
    const OBMediaGroupList before = root->childGroups();
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

    std::vector<OBMediaGroupRef> sorted
        = sortedGroups(std::move(children), MontaroSupport::_MontaroRootGroupComparison);
    if (!isCancelLoadRequestPending())
        root->setChildGroups(OBMediaGroupList(std::move(sorted)));
}
