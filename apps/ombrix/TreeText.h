#pragma once

#include "apps/ombrix/Program.h"
#include "apps/ombrix/TreeFold.h"
#include "apps/ombrix/TreeNodes.h"

#include <cstddef>
#include <functional>
#include <string>
#include <string_view>
#include <vector>

namespace ombrix {

/// What the text of a tree needs to know beside the tree.
struct TreeTextWishes {
    const apps::Style& style;
    std::optional<int> columns {}; ///< of the terminal; absent for a pipe
    platform::Date now {};
    /// The message for a group that is empty; absent for none.
    std::function<platform::Text(const OBMediaGroupRef&)> emptyMessage {};
    /// The command that shows all children of that group.
    std::function<std::string(const OBMediaGroupRef&)> unfoldingCommand {};
    /// The folder that a path leads to, for links.
    std::function<std::string(std::string_view)> linkTarget {};
};

/// Hands one line after the other to `print`: names in one column, facts in columns right of them. Answers how many
/// lines of the terminal they take, of which a command too long for one takes several.
std::size_t printTreeText(const std::vector<TreeNode>& nodes, const std::vector<TreeLine>& lines,
    const TreeTextWishes& wishes, const std::function<void(std::string_view)>& print);

} // namespace ombrix
