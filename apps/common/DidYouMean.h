#pragma once

#include <span>
#include <string>
#include <string_view>

namespace apps {

/// ` (did you mean "tree"?)` with the candidate that `word` most resembles; empty when it resembles none.
std::string didYouMean(std::string_view word, std::span<const std::string_view> candidates);

/// The same for options, such as "--all": what resembles is what follows the hyphens.
std::string didYouMeanOption(std::string_view word, std::span<const std::string_view> candidates);

} // namespace apps
