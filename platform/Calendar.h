#pragma once

#include "platform/Value.h"

#include <string>
#include <string_view>

namespace platform {

/// The user's calendar: what a point in time is called where the user lives. Any thread. None throws.
class Calendar {
public:
    virtual ~Calendar() = default;

    /// The Gregorian year of `date` in local time.
    virtual int yearOfDate(const Date& date) const = 0;

    /// `date` in local time, written by `format`, which is that of strftime(3), with the names of the user's language.
    /// Empty when the calendar cannot write it.
    virtual std::string textOfDate(const Date& date, std::string_view format) const = 0;
};

} // namespace platform
