#pragma once

#include "apps/ombrix/Explanation.h"
#include "apps/ombrix/Program.h"

#include <functional>
#include <optional>
#include <string>
#include <string_view>

namespace ombrix {

/// What an explanation for people needs beside the explanation.
struct ExplanationTextWishes {
    bool namesPath = false; ///< whether its path stands above it, so that one is told from the next
    std::optional<std::string> home {}; ///< is written as "~"
    std::function<std::string(std::string_view path)> linkTarget {}; ///< where a terminal's link to a path leads
};

/// Prints the verdict, the steps and what would list the path, so that no word of a reason is lost on a narrow
/// terminal.
void printExplanation(Program& program, const Explanation& explanation, const ExplanationTextWishes& wishes);

} // namespace ombrix
