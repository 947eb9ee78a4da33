#pragma once

#include "platform/Calendar.h"

namespace platform {

/// The Gregorian calendar in the time zone of TZ, else /etc/localtime, with the names of LC_TIME.
class LinuxCalendar : public Calendar {
public:
    int yearOfDate(const Date& date) const override;
    std::string textOfDate(const Date& date, std::string_view format) const override;
};

} // namespace platform
