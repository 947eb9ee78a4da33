#include "apps/ombrix/ObjectSearch.h"

#include "host/OBGroupWalk.h"

#include <cstddef>

namespace ombrix {

OBMediaObjectRef ownObjectWithPath(const OBMediaGroup& group, std::string_view path)
{
    const OBMediaObjectList objects = group.ownMediaObjects();
    std::size_t index = 0;
    bool isFound = false;
    objects.visit([&](OBMediaObject& object) {
        isFound = object.path() == path;
        if (!isFound)
            ++index;
        return !isFound;
    });
    return isFound ? objects[index] : nullptr;
}

FoundObject objectWithPath(const OBMediaGroupRef& root, std::string_view path)
{
    FoundObject found;
    OBWalkGroups(root, [&](const OBMediaGroupRef& group, const OBGroupPlace&) {
        found = { ownObjectWithPath(*group, path), group };
        return !found.object;
    });
    return found.object ? found : FoundObject();
}

} // namespace ombrix
