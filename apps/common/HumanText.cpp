#include "apps/common/HumanText.h"

#include <algorithm>
#include <array>
#include <ctime>

namespace apps {
namespace {

    constexpr std::array<std::string_view, 12> months { "Jan", "Feb", "Mar", "Apr", "May", "Jun", "Jul", "Aug", "Sep",
        "Oct", "Nov", "Dec" };

    /// A day of the calendar, in local time.
    struct Day {
        int day = 0;
        int month = 0; // January is 0
        long long year = 0;
        int hour = 0;
        int minute = 0;
        int second = 0;

        bool isSameDayAs(const Day& other) const
        {
            return day == other.day && month == other.month && year == other.year;
        }
    };

    Day localDay(platform::Date date)
    {
        const auto seconds = static_cast<std::time_t>(date.seconds);
        std::tm parts {};
        if (!localtime_r(&seconds, &parts))
            return {};
        return { parts.tm_mday, parts.tm_mon, parts.tm_year + 1900LL, parts.tm_hour, parts.tm_min, parts.tm_sec };
    }

    std::string_view monthName(const Day& day)
    {
        return months[static_cast<std::size_t>(day.month) % months.size()];
    }

    std::string twoDigits(int number)
    {
        return { static_cast<char>('0' + number / 10 % 10), static_cast<char>('0' + number % 10) };
    }

    std::string joined(const Day& day, bool withMonth, bool withYear)
    {
        std::string text = std::to_string(day.day);
        if (withMonth)
            text.append(" ").append(monthName(day));
        if (withYear)
            text.append(" ").append(std::to_string(day.year));
        return text;
    }

    std::string grouped(std::uint64_t number)
    {
        std::string text = std::to_string(number);
        for (std::size_t position = text.size(); position > 3; position -= 3)
            text.insert(position - 3, 1, ',');
        return text;
    }

    /// `value` / `unit` with one digit after the full stop, rounded to the nearest.
    std::string withOneDigit(std::uint64_t value, std::uint64_t unit)
    {
        const std::uint64_t tenth = unit / 10;
        const std::uint64_t tenths = value / tenth + (value % tenth >= (tenth + 1) / 2 && tenth > 1 ? 1 : 0);
        return grouped(tenths / 10) + "." + std::to_string(tenths % 10);
    }

} // namespace

std::string countText(std::uint64_t count)
{
    return count < 1'000'000 ? grouped(count) : withOneDigit(count, 1'000'000) + " M";
}

std::string quantityText(std::uint64_t count, std::string_view unit)
{
    return countText(count) + " " + unitText(count, unit);
}

std::string unitText(std::uint64_t count, std::string_view unit)
{
    std::string text(unit);
    if (count != 1)
        text += 's';
    return text;
}

std::string sizeText(std::uint64_t bytes)
{
    if (bytes < 1000)
        return quantityText(bytes, "byte");
    constexpr std::string_view units[] { "kB", "MB", "GB", "TB", "PB", "EB" };
    std::uint64_t unit = 1000;
    std::size_t index = 0;
    // Half a step below a thousand already reads as one of the next unit.
    while (index + 1 < std::size(units) && bytes / unit >= 1000 - (bytes % unit * 2 >= unit ? 1 : 0)) {
        unit *= 1000;
        ++index;
    }
    const bool isWhole = index < 2 && bytes / unit >= 10;
    const std::string number = isWhole ? grouped((bytes + unit / 2) / unit) : withOneDigit(bytes, unit);
    return number + " " + std::string(units[index]);
}

std::string durationText(std::chrono::nanoseconds duration)
{
    using namespace std::chrono;
    if (duration < seconds(1))
        return std::to_string(duration_cast<milliseconds>(duration).count()) + " ms";
    if (duration < minutes(2))
        return std::to_string(duration_cast<seconds>(duration).count()) + " s";
    return std::to_string(duration_cast<minutes>(duration).count()) + " min";
}

std::string secondsText(std::chrono::nanoseconds duration)
{
    const auto count = std::max<std::chrono::nanoseconds::rep>(duration.count(), 0);
    return withOneDigit(static_cast<std::uint64_t>(count), 1'000'000'000) + " s";
}

std::string timeText(platform::Date date)
{
    const Day day = localDay(date);
    return twoDigits(day.hour) + ":" + twoDigits(day.minute) + ":" + twoDigits(day.second);
}

std::string dateText(platform::Date date, platform::Date now)
{
    const Day day = localDay(date);
    if (day.isSameDayAs(localDay(now)))
        return "today " + twoDigits(day.hour) + ":" + twoDigits(day.minute);
    return joined(day, true, true);
}

std::string dateRangeText(platform::Date first, platform::Date last, std::string_view knownYear)
{
    const Day from = localDay(first);
    const Day to = localDay(last);
    const bool showsYear = std::to_string(to.year) != knownYear;
    if (from.isSameDayAs(to))
        return joined(to, true, showsYear);
    if (from.year != to.year)
        return joined(from, true, true) + " – " + joined(to, true, true);
    return joined(from, from.month != to.month, false) + " – " + joined(to, true, showsYear);
}

std::string monthText(platform::Date date)
{
    const Day day = localDay(date);
    return std::string(monthName(day)) + " " + std::to_string(day.year);
}

} // namespace apps
