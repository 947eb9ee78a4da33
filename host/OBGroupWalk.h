#pragma once

#include "host/OBMediaGroup.h"

#include <cstddef>
#include <limits>
#include <vector>

/// Where a group stands in a walk over a tree.
struct OBGroupPlace {
    static constexpr std::size_t nowhere = std::numeric_limits<std::size_t>::max();

    std::size_t index = 0; ///< in the order of the walk; the root's is 0
    std::size_t parent = nowhere; ///< the index of the group that holds it; `nowhere` for the root
    std::size_t depth = 0; ///< the root's is 0
};

/// Calls `visit` with `root` and everything below it, a group before its child groups, each with its place, until it
/// answers false. A null root has nothing to visit.
///
/// However deep a tree is, it takes no more of the thread's stack. The child groups of a group are those that it had
/// when it was visited; the tree may change meanwhile. Any thread.
template <class Visit> void OBWalkGroups(const OBMediaGroupRef& root, const Visit& visit)
{
    struct Level {
        OBMediaGroupList groups;
        std::size_t parent;
        std::size_t next = 0;
    };
    if (!root || !visit(root, OBGroupPlace()))
        return;
    std::size_t visited = 1;
    std::vector<Level> levels { { root->childGroups(), 0 } };
    while (!levels.empty()) {
        Level& innermost = levels.back();
        if (innermost.next == innermost.groups.size()) {
            levels.pop_back();
            continue;
        }
        const OBMediaGroupRef group = innermost.groups[innermost.next++];
        const OBGroupPlace place { visited++, innermost.parent, levels.size() };
        if (!visit(group, place))
            return;
        levels.push_back({ group->childGroups(), place.index });
    }
}
