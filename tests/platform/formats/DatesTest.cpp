#include "platform/formats/Dates.h"

#include <doctest/doctest.h>

#include <limits>
#include <string>

using namespace platform;

namespace {

std::string textOf(Date date)
{
    return std::string(DateText(date, DateText::Fraction::nineDigits).view());
}

} // namespace

TEST_CASE("a date is written in UTC with nine digits of fraction")
{
    CHECK(textOf({ 1299146400, 123456789 }) == "2011-03-03T10:00:00.123456789Z");
    CHECK(textOf({ 0, 0 }) == "1970-01-01T00:00:00.000000000Z");
    CHECK(textOf({ 951782400, 1 }) == "2000-02-29T00:00:00.000000001Z");
    CHECK(DateText({ 1299146400, 999999999 }, DateText::Fraction::none).view() == "2011-03-03T10:00:00Z");
}

TEST_CASE("a date before 1970 counts its nanoseconds forwards")
{
    CHECK(textOf({ -1, 0 }) == "1969-12-31T23:59:59.000000000Z");
    CHECK(textOf({ -1, 999999999 }) == "1969-12-31T23:59:59.999999999Z");
    CHECK(textOf({ -2208988800, 0 }) == "1900-01-01T00:00:00.000000000Z");
    CHECK(textOf({ -62167219200, 0 }) == "0000-01-01T00:00:00.000000000Z");
}

TEST_CASE("a year outside 0 to 9999 has a sign and six digits or more")
{
    CHECK(textOf({ 253402300799, 0 }) == "9999-12-31T23:59:59.000000000Z");
    CHECK(textOf({ 253402300800, 0 }) == "+010000-01-01T00:00:00.000000000Z");
    CHECK(textOf({ -62167219201, 0 }) == "-000001-12-31T23:59:59.000000000Z");
    CHECK(textOf({ std::numeric_limits<std::int64_t>::max(), 0 }) == "+292277026596-12-04T15:30:07.000000000Z");
    CHECK(textOf({ std::numeric_limits<std::int64_t>::min(), 0 }) == "-292277022657-01-27T08:29:52.000000000Z");
}

TEST_CASE("a date that was written is read as the same date")
{
    for (std::int64_t seconds = -100'000'000'000; seconds < 300'000'000'000; seconds += 86'399'987) {
        const Date date { seconds, static_cast<std::uint32_t>(seconds & 0xFFFFFF) };
        CHECK(readDate(textOf(date)) == std::optional(date));
    }
    CHECK(readDate("2011-03-03T10:00:00Z") == std::optional(Date { 1299146400, 0 }));
    CHECK(readDate("2011-03-03T10:00:00.5Z") == std::optional(Date { 1299146400, 500000000 }));
}

TEST_CASE("a date that no calendar has is refused")
{
    for (const char* text : { "", "2011", "2011-03-03", "2011-03-03T10:00:00", "2011-13-01T00:00:00Z",
             "2011-00-01T00:00:00Z", "2011-02-29T00:00:00Z", "1900-02-29T00:00:00Z", "2011-04-31T00:00:00Z",
             "2011-01-00T00:00:00Z", "2011-01-01T24:00:00Z", "2011-01-01T00:60:00Z", "2011-01-01T00:00:60Z",
             "2011-01-01T00:00:00.Z", "2011-01-01T00:00:00.1234567890Z", "2011-01-01 00:00:00Z", "11-01-01T00:00:00Z",
             "2011-1-1T00:00:00Z", "+2011-01-01T00:00:00Z", "+999999999999-01-01T00:00:00Z", "2011-01-01T00:00:00Zx",
             " 2011-01-01T00:00:00Z", "2011-01-01T00:00:00+01:00", "-02011-01-01T00:00:00Z" }) {
        CAPTURE(text);
        CHECK_FALSE(readDate(text));
    }
}
