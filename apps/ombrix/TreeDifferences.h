#pragma once

#include "apps/ombrix/TreeDocument.h"

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace ombrix {

/// One place at which a tree that was followed is not what a fresh load finds.
struct TreeDifference {
    enum class Kind : std::uint8_t {
        missing, ///< only the fresh tree has it
        surplus, ///< only the followed tree has it
        changed, ///< both have it, not alike
        reordered, ///< what both have in a group stands in another order
    };

    Kind kind = Kind::changed;
    std::optional<std::size_t> followedGroup {}; ///< the group itself, or the one that holds the object
    std::optional<std::size_t> freshGroup {}; ///< likewise
    bool isOfObjects = false;
    std::string_view followedObject {}; ///< of an object; empty where the tree has none
    std::string_view freshObject {};
    std::string_view key {}; ///< of a change: what is not alike
};

/// The two trees; both outlive what is said of them.
struct ComparedTrees {
    const TreeDocument& followed;
    const TreeDocument& fresh;
};

/// What differs between two trees, both sorted as the source sorts them, byte by byte. Groups are known by their IDs,
/// objects by their paths.
std::vector<TreeDifference> differencesOf(const ComparedTrees& trees);

/// One line for people.
std::string textOf(const TreeDifference& difference, const ComparedTrees& trees);

} // namespace ombrix
