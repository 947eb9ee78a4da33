#pragma once

#include "platform/Value.h"

#include <array>
#include <optional>
#include <string_view>

namespace platform {

/// A date as text, without an allocation.
class DateText {
public:
    enum class Fraction { none, nineDigits };

    /// UTC as ISO 8601 has it, such as 2011-03-03T10:00:00.123456789Z. Years outside 0 to 9999 have a sign and at
    /// least six digits.
    DateText(Date date, Fraction fraction) noexcept;

    std::string_view view() const noexcept { return { _letters.data(), _length }; }

private:
    std::array<char, 48> _letters;
    std::size_t _length = 0;
};

/// Reads what `DateText` writes; the fraction may be absent, or have one to nine digits. Absent for anything else, a
/// day that no month has or a leap second included.
std::optional<Date> readDate(std::string_view text) noexcept;

} // namespace platform
