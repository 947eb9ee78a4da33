#pragma once

#include "apps/common/NameSearch.h"
#include "apps/ombrix/Program.h"

#include <cstddef>

namespace ombrix {

/// Prints the first `count` hits as a table for people: name, kind, the groups around it, path.
void printFindText(Program& program, const apps::FoundNames& found, std::size_t count);

} // namespace ombrix
