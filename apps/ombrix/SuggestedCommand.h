#pragma once

#include "apps/ombrix/Arguments.h"

#include <string>
#include <string_view>

namespace ombrix {

/// A command to be typed as it stands, on the machine and source of this run: "ombrix tree 'Anna & Tom' --machine
/// FILE".
std::string suggestedCommand(const Arguments& arguments, std::string_view command, std::string_view operand = {});

/// The arguments by which another run of the program gets the machine and source of this run.
std::vector<std::string> machineArguments(const Arguments& arguments);

} // namespace ombrix
