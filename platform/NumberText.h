#pragma once

#include <array>
#include <charconv>
#include <cmath>
#include <limits>
#include <string>

namespace platform {

/// A number as people write it: whole ones without a fraction, others with the fewest digits that read back as the same
/// number, never with an exponent. "nan", "+infinity" and "-infinity" are those of property lists.
inline std::string numberText(double number)
{
    if (std::isnan(number))
        return "nan";
    if (std::isinf(number))
        return number < 0 ? "-infinity" : "+infinity";
    constexpr int longest = std::numeric_limits<double>::max_exponent10 - std::numeric_limits<double>::min_exponent10
        + std::numeric_limits<double>::max_digits10 + 3;
    std::array<char, longest + 1> digits {};
    const auto end = std::to_chars(digits.data(), digits.data() + digits.size(), number, std::chars_format::fixed).ptr;
    return std::string(digits.data(), end);
}

} // namespace platform
