#pragma once

#include "apps/ombrix/TreeFold.h"
#include "apps/ombrix/TreeNodes.h"

#include <string>
#include <vector>

namespace ombrix {

/// What stands right of a name, each in a column of its own; empty where there is nothing to tell.
struct NodeFacts {
    std::string count {}; ///< "1,204"
    std::string unit {}; ///< "clips"
    std::string size {};
    std::string date {};
    std::string note {}; ///< behind the date
    std::string summary {}; ///< begins in the column of the dates, for groups of groups
};

/// `now` decides what "today" is.
NodeFacts factsOf(const std::vector<TreeNode>& nodes, const TreeLine& line, platform::Date now);

/// "… 1,961 more, back to Mar 2014"
std::string moreText(const std::vector<TreeNode>& nodes, const TreeLine& line);

} // namespace ombrix
