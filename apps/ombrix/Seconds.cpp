#include "apps/ombrix/Seconds.h"

#include <algorithm>
#include <charconv>
#include <cmath>
#include <cstdint>

namespace ombrix {

std::optional<std::chrono::nanoseconds> durationOfSeconds(std::string_view typed)
{
    constexpr double longest = 10.0 * 366 * 24 * 3600;
    double seconds = 0;
    const char* const end = typed.data() + typed.size();
    const auto [rest, error] = std::from_chars(typed.data(), end, seconds, std::chars_format::fixed);
    if (error != std::errc() || rest != end || !std::isfinite(seconds) || std::signbit(seconds))
        return std::nullopt;
    return std::chrono::nanoseconds(static_cast<std::int64_t>(std::min(seconds, longest) * 1e9));
}

} // namespace ombrix
