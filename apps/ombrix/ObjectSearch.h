#pragma once

#include "host/OBMediaGroup.h"
#include "host/OBMediaObject.h"

#include <string_view>

namespace ombrix {

/// A media object, and the group on which it was set.
struct FoundObject {
    OBMediaObjectRef object {};
    OBMediaGroupRef group {};
};

/// The first media object with that path below `root`, depth first, a group's own objects before its children's.
FoundObject objectWithPath(const OBMediaGroupRef& root, std::string_view path);

/// The first of those set on `group` itself.
OBMediaObjectRef ownObjectWithPath(const OBMediaGroup& group, std::string_view path);

} // namespace ombrix
