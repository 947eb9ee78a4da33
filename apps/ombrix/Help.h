#pragma once

#include "apps/ombrix/CommandTable.h"

#include <string>

namespace ombrix {

/// One screen: at most 40 lines of 80 columns.
std::string helpText();
std::string helpText(const CommandInfo& command);
/// "ombrix 1.0.0 (host interface 1.0)"
std::string versionText();

} // namespace ombrix
