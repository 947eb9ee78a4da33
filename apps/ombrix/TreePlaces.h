#pragma once

#include "host/OBMediaGroup.h"
#include "host/OBMediaObject.h"

#include <cstddef>
#include <string>
#include <unordered_map>
#include <unordered_set>
#include <vector>

namespace ombrix {

/// One record of a tree, and where in the tree it stands.
struct TreePlace {
    OBMediaGroupRef group; ///< the group, or the group on which the object was set
    OBMediaObjectRef object {}; ///< null for a group
    std::vector<platform::Text> names {}; ///< of the groups above, from the root down
    std::size_t order = 0; ///< grows from each record of the tree to the next, depth first
};

/// The records of a tree that have one of some paths, or are one of some objects. Depth first: a group's own objects
/// before the groups in it.
class TreePlaces {
public:
    TreePlaces(const OBMediaGroupRef& root, const std::unordered_set<std::string>& paths,
        const std::unordered_set<const OBMediaObject*>& objects);

    /// Empty where there are none.
    const std::vector<TreePlace>& withPath(const std::string& path) const;
    const std::vector<TreePlace>& ofObject(const OBMediaObject* object) const;

private:
    std::unordered_map<std::string, std::vector<TreePlace>> _byPath;
    std::unordered_map<const OBMediaObject*, std::vector<TreePlace>> _byObject;
};

} // namespace ombrix
