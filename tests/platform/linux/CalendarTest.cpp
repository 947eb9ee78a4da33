#include "platform/linux/LinuxCalendar.h"
#include "tests/platform/linux/Environment.h"

#include <doctest/doctest.h>

#include <climits>
#include <cstdint>
#include <ctime>
#include <optional>
#include <string>

using platform::Date;
using platform::LinuxCalendar;
using namespace tests;

namespace {

/// The time zone of this process while this object lives.
class TimeZone {
public:
    explicit TimeZone(const std::string& zone)
    {
        _environment.emplace();
        _environment->set("TZ", zone);
        tzset();
    }
    ~TimeZone()
    {
        _environment.reset();
        tzset();
    }
    TimeZone(const TimeZone&) = delete;
    TimeZone& operator=(const TimeZone&) = delete;

private:
    std::optional<Environment> _environment {};
};

/// The years of the second before `seconds` and of that second, in a time zone.
std::string yearsAround(std::int64_t seconds, const std::string& zone)
{
    const TimeZone inZone(zone);
    const LinuxCalendar calendar;
    return std::to_string(calendar.yearOfDate({ seconds - 1, 999'999'999 })) + " "
        + std::to_string(calendar.yearOfDate({ seconds, 0 }));
}

constexpr std::int64_t hour = 3600;
constexpr std::int64_t newYear2011 = 1'293'840'000; // in UTC
constexpr std::int64_t newYear1970 = 0;
constexpr std::int64_t newYear0 = -62'167'219'200;
constexpr std::int64_t newYear10000 = 253'402'300'800;

} // namespace

TEST_CASE("a year begins at midnight where the user lives")
{
    CHECK(yearsAround(newYear2011, "UTC0") == "2010 2011");
    CHECK(yearsAround(newYear2011 - 14 * hour, "EAST-14") == "2010 2011");
    CHECK(yearsAround(newYear2011 + 12 * hour, "WEST+12") == "2010 2011");
    CHECK(yearsAround(newYear2011 - 5 * hour - hour / 2, "HALF-5:30") == "2010 2011");
    CHECK(yearsAround(newYear2011 + 8 * hour, "SUMMER+8LIGHT,M3.2.0,M11.1.0") == "2010 2011");
    CHECK(yearsAround(newYear2011, "EAST-14") == "2011 2011");
    CHECK(yearsAround(newYear2011, "WEST+12") == "2010 2010");
}

TEST_CASE("in summer of the southern half of the world a year begins an hour earlier")
{
    CHECK(yearsAround(newYear2011 - 11 * hour, "SOUTH-10LIGHT,M10.1.0,M4.1.0/3") == "2010 2011");
}

TEST_CASE("years before the epoch, around 0 and beyond 9999 are those of the Gregorian calendar")
{
    CHECK(yearsAround(newYear1970, "UTC0") == "1969 1970");
    CHECK(yearsAround(newYear0, "UTC0") == "-1 0");
    CHECK(yearsAround(newYear10000, "UTC0") == "9999 10000");
}

TEST_CASE("a date that no calendar can count is in the earliest or the latest year")
{
    const LinuxCalendar calendar;
    CHECK(calendar.yearOfDate({ INT64_MIN, 0 }) == INT_MIN);
    CHECK(calendar.yearOfDate({ INT64_MAX, 0 }) == INT_MAX);
    CHECK(calendar.textOfDate({ INT64_MAX, 0 }, "%Y") == "");
}

TEST_CASE("a date is written by the format, in local time")
{
    const Date date { 1'299'146'400, 500'000'000 };
    const LinuxCalendar calendar;
    Environment environment;
    environment.set("LC_ALL", "C");
    {
        const TimeZone zone("UTC0");
        CHECK(calendar.textOfDate(date, "%B %e, %Y %H:%M:%S") == "March  3, 2011 10:00:00");
        CHECK(calendar.textOfDate(date, "%A %d %b") == "Thursday 03 Mar");
    }
    const TimeZone zone("EAST-14");
    CHECK(calendar.textOfDate(date, "%Y-%m-%d %H:%M") == "2011-03-04 00:00");
}

TEST_CASE("without a format, or with one too long to be written, a date has no text")
{
    const LinuxCalendar calendar;
    CHECK(calendar.textOfDate({ 0, 0 }, "") == "");
    CHECK(calendar.textOfDate({ 0, 0 }, std::string(10'000, 'x')) == "");
    CHECK(calendar.textOfDate({ 0, 0 }, "x").size() == 1);
}

TEST_CASE("names of a language that is not installed are those of the C locale")
{
    Environment environment;
    environment.set("LC_ALL", "xx_XX.UTF-8");
    const TimeZone zone("UTC0");
    CHECK(LinuxCalendar().textOfDate({ 1'299'146'400, 0 }, "%B") == "March");
}
