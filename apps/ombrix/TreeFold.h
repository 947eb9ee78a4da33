#pragma once

#include "apps/ombrix/TreeNodes.h"

#include <cstddef>
#include <vector>

namespace ombrix {

/// One line of a tree: a node, or what stands for the children of a node that are not shown.
struct TreeLine {
    std::size_t node = 0; ///< the node, or the one whose children are hidden
    std::size_t hidden = 0; ///< how many of its last children are hidden; 0 for a line of the node itself
    std::size_t firstHidden = 0; ///< the node that is the first of them
    bool isFolded = false; ///< the node has children, none of which is shown
    bool isLast = true; ///< no line with the same parent follows
};

/// A line for every node.
std::vector<TreeLine> unfoldedLines(const std::vector<TreeNode>& nodes);

/// At most `most` lines, which are shared out so that every part of the tree shows something; all where they suffice.
/// The last child of the first node is always shown: that is where the events are.
std::vector<TreeLine> foldedLines(const std::vector<TreeNode>& nodes, std::size_t most);

} // namespace ombrix
