#pragma once

#include "host/OBMediaGroup.h"

#include <string>
#include <string_view>

namespace ombrix {

/// The first group with that ID or name, depth first; null when there is none.
OBMediaGroupRef groupWithID(const OBMediaGroupRef& root, std::string_view identifier);
OBMediaGroupRef groupWithName(const OBMediaGroupRef& root, std::string_view name);

/// ` (did you mean "…"?)` with an ID, or an ID or a name, of the tree; empty when none resembles what was typed.
std::string suggestedID(const OBMediaGroupRef& root, std::string_view typed);
std::string suggestedIDOrName(const OBMediaGroupRef& root, std::string_view typed);

} // namespace ombrix
