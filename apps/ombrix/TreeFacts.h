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
    std::string newest {}; ///< goes on with the summary where there is room: " · newest 14 Nov 2026"
};

/// `now` decides what "today" is.
NodeFacts factsOf(const std::vector<TreeNode>& nodes, const TreeLine& line, platform::Date now);

/// "… 1,961 more"
std::string moreText(const TreeLine& line);
/// ", back to Mar 2014" of what the line hides; empty where nothing there has a date.
std::string ageText(const std::vector<TreeNode>& nodes, const TreeLine& line);

} // namespace ombrix
