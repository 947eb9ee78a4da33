#pragma once

#include "host/OBMediaGroup.h"

#include <functional>
#include <string>
#include <string_view>

namespace ombrix {

/// Calls `visitor` for `root` and everything below it, depth first, until it answers false. Takes no stack however deep
/// the tree is.
void visitDepthFirst(const OBMediaGroupRef& root, const std::function<bool(const OBMediaGroupRef&)>& visitor);

/// The first group with that ID or name, depth first; null when there is none.
OBMediaGroupRef groupWithID(const OBMediaGroupRef& root, std::string_view identifier);
OBMediaGroupRef groupWithName(const OBMediaGroupRef& root, std::string_view name);

/// ` (did you mean "…"?)` with an ID, or an ID or a name, of the tree; empty when none resembles what was typed.
std::string suggestedID(const OBMediaGroupRef& root, std::string_view typed);
std::string suggestedIDOrName(const OBMediaGroupRef& root, std::string_view typed);

} // namespace ombrix
