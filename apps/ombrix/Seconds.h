#pragma once

#include <chrono>
#include <optional>
#include <string_view>

namespace ombrix {

/// The duration that `typed` seconds are, such as "60" or "0.5"; absent for what is no such number. At most ten years.
std::optional<std::chrono::nanoseconds> durationOfSeconds(std::string_view typed);

} // namespace ombrix
