#pragma once

#include <cstddef>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

/// Which folder may include what: arrows point one way, from the programs down to the roles.
namespace house {

/// One `#include` line.
struct Include {
    std::string name; ///< between the brackets or quotes
    bool isQuoted = false; ///< a header of this tree; else one from elsewhere
    std::size_t line = 0; ///< from 1
};

/// The `#include` lines of a file's text, in order.
std::vector<Include> includesIn(std::string_view text);

/// The rule that the include breaks in the file at `path` (from the root of the tree), or nothing when it may stand.
/// A file outside the folders that have rules may include anything.
std::optional<std::string> brokenRule(std::string_view path, const Include& include);

} // namespace house
