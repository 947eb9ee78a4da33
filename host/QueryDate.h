#pragma once

#include "platform/Value.h"

#include <optional>
#include <string_view>

/// Reads a date of ISO 8601's extended form: "2011-03-03" is its first moment in UTC; "2011-03-03T10:00:00Z" may have a
/// fraction of up to nine digits and, in place of the Z, a distance from UTC such as "+01:00". Absent for anything
/// else, a day that no month has and a time without a zone included.
std::optional<platform::Date> queryDate(std::string_view text);
