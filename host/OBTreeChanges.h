#pragma once

#include "host/OBExport.h"
#include "host/OBMediaGroup.h"
#include "host/OBMediaObject.h"
#include "platform/Value.h"

#include <cstddef>
#include <memory>
#include <vector>

/// A tree as it stood at one moment, to be compared with what becomes of it: a published tree may be changed in place.
/// Immutable, cheap to copy; keeps the records alive. Any thread.
class OB_EXPORT OBTreeSnapshot {
public:
    /// Of no tree.
    OBTreeSnapshot() = default;
    /// Takes time in proportion to the groups, and to the runs of which their lists are made. `root` may be null.
    explicit OBTreeSnapshot(const OBMediaGroupRef& root);

private:
    friend struct OBTreeChanges;
    struct Tree;
    std::shared_ptr<const Tree> _tree;
};

/// A group or media object that came, went or changed.
struct OBTreeChange {
    OBMediaGroupRef group {}; ///< the one that it is about, or the innermost one that the object was set on
    OBMediaObjectRef object {}; ///< null where it is about a group
    platform::Text name {};
    platform::Text path {};
    platform::Text ID {}; ///< of a group
    platform::Text groupID {}; ///< of the group that it lies in, which for an object is `group`; absent for the root
    /// How many media objects a group had of its own, and has; 0 in the tree that it is not in.
    std::size_t objectsBefore = 0;
    std::size_t objectsNow = 0;
};

/// What became of a tree, each list in the order of the tree: a group before its own objects, these before its child
/// groups.
///
/// Groups are the same where ID and path are; objects where, in the same group, the path is. A group has changed when
/// its own objects are others or when its name, type, place, date or attributes are; one that stands at another place
/// among its siblings has not. An object counts in the innermost group that it was set on, for groups of groups repeat
/// what lies below them; representatives count nowhere.
struct OB_EXPORT OBTreeChanges {
    std::vector<OBTreeChange> added {};
    std::vector<OBTreeChange> removed {};
    std::vector<OBTreeChange> changed {}; ///< groups

    bool empty() const { return added.empty() && removed.empty() && changed.empty(); }

    /// Takes time in proportion to both trees; lists that both share are not looked through.
    static OBTreeChanges between(const OBTreeSnapshot& before, const OBTreeSnapshot& now);

private:
    class Comparison;
};
