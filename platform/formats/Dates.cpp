#include "platform/formats/Dates.h"

#include <algorithm>
#include <charconv>

namespace platform {
namespace {

    constexpr std::int64_t secondsADay = 86400;
    constexpr std::int64_t daysAnEra = 146097; // 400 years of the Gregorian calendar

    struct Day {
        std::int64_t year = 0;
        int month = 1;
        int day = 1;
    };

    /// Years are counted from March here, so that the leap day is a year's last.
    Day dayFromNumber(std::int64_t daysSince1970)
    {
        const std::int64_t days = daysSince1970 + 719468; // since 1 March of the year 0
        const std::int64_t era = (days >= 0 ? days : days - (daysAnEra - 1)) / daysAnEra;
        const std::int64_t dayOfEra = days - era * daysAnEra;
        const std::int64_t yearOfEra = (dayOfEra - dayOfEra / 1460 + dayOfEra / 36524 - dayOfEra / 146096) / 365;
        const std::int64_t dayOfYear = dayOfEra - (365 * yearOfEra + yearOfEra / 4 - yearOfEra / 100);
        const std::int64_t monthFromMarch = (5 * dayOfYear + 2) / 153;
        const int month = static_cast<int>(monthFromMarch < 10 ? monthFromMarch + 3 : monthFromMarch - 9);
        const int day = static_cast<int>(dayOfYear - (153 * monthFromMarch + 2) / 5 + 1);
        return { yearOfEra + era * 400 + (month <= 2 ? 1 : 0), month, day };
    }

    std::int64_t numberOfDay(Day day)
    {
        const std::int64_t year = day.month <= 2 ? day.year - 1 : day.year;
        const std::int64_t era = (year >= 0 ? year : year - 399) / 400;
        const std::int64_t yearOfEra = year - era * 400;
        const std::int64_t monthFromMarch = day.month > 2 ? day.month - 3 : day.month + 9;
        const std::int64_t dayOfYear = (153 * monthFromMarch + 2) / 5 + day.day - 1;
        const std::int64_t dayOfEra = yearOfEra * 365 + yearOfEra / 4 - yearOfEra / 100 + dayOfYear;
        return era * daysAnEra + dayOfEra - 719468;
    }

    bool isLeapYear(std::int64_t year)
    {
        return year % 4 == 0 && (year % 100 != 0 || year % 400 == 0);
    }

    int daysOfMonth(std::int64_t year, int month)
    {
        constexpr std::array<int, 12> days { 31, 28, 31, 30, 31, 30, 31, 31, 30, 31, 30, 31 };
        return month == 2 && isLeapYear(year) ? 29 : days[static_cast<std::size_t>(month - 1)];
    }

    char* writeDigits(char* end, std::uint64_t number, int count)
    {
        for (int index = count - 1; index >= 0; --index, number /= 10)
            end[index] = static_cast<char>('0' + number % 10);
        return end + count;
    }

    char* writeYear(char* end, std::int64_t year)
    {
        if (year >= 0 && year <= 9999)
            return writeDigits(end, static_cast<std::uint64_t>(year), 4);
        *end++ = year < 0 ? '-' : '+';
        const auto size = static_cast<std::uint64_t>(year < 0 ? -year : year);
        int digits = 6;
        for (std::uint64_t limit = 1'000'000; limit <= size; limit *= 10)
            ++digits;
        return writeDigits(end, size, digits);
    }

    /// Takes exactly `count` digits from the front of `text`.
    std::optional<int> takeNumber(std::string_view& text, std::size_t count)
    {
        int number = 0;
        if (text.size() < count)
            return {};
        for (char letter : text.substr(0, count)) {
            if (letter < '0' || letter > '9')
                return {};
            number = number * 10 + (letter - '0');
        }
        text.remove_prefix(count);
        return number;
    }

    bool take(std::string_view& text, char letter)
    {
        if (text.empty() || text.front() != letter)
            return false;
        text.remove_prefix(1);
        return true;
    }

    std::optional<std::int64_t> takeYear(std::string_view& text)
    {
        const bool isNegative = take(text, '-');
        const bool isExpanded = isNegative || take(text, '+');
        const std::size_t digits = std::min(text.find_first_not_of("0123456789"), text.size());
        if (isExpanded ? digits < 6 || digits > 12 : digits != 4)
            return {};
        std::int64_t year = 0;
        std::from_chars(text.data(), text.data() + digits, year);
        text.remove_prefix(digits);
        return isNegative ? -year : year;
    }

    std::optional<std::uint32_t> takeFraction(std::string_view& text)
    {
        if (!take(text, '.'))
            return 0;
        const std::size_t digits = std::min(text.find_first_not_of("0123456789"), text.size());
        if (digits < 1 || digits > 9)
            return {};
        std::uint32_t nanoseconds = 0;
        for (std::size_t index = 0; index < 9; ++index)
            nanoseconds = nanoseconds * 10 + (index < digits ? static_cast<std::uint32_t>(text[index] - '0') : 0);
        text.remove_prefix(digits);
        return nanoseconds;
    }

    std::optional<Day> takeDay(std::string_view& text)
    {
        const std::optional<std::int64_t> year = takeYear(text);
        if (!year || !take(text, '-'))
            return {};
        const std::optional<int> month = takeNumber(text, 2);
        if (!month || *month < 1 || *month > 12 || !take(text, '-'))
            return {};
        const std::optional<int> day = takeNumber(text, 2);
        if (!day || *day < 1 || *day > daysOfMonth(*year, *month))
            return {};
        return Day { *year, *month, *day };
    }

    std::optional<int> takeSecondOfDay(std::string_view& text)
    {
        const std::optional<int> hour = takeNumber(text, 2);
        if (!hour || *hour > 23 || !take(text, ':'))
            return {};
        const std::optional<int> minute = takeNumber(text, 2);
        if (!minute || *minute > 59 || !take(text, ':'))
            return {};
        const std::optional<int> second = takeNumber(text, 2);
        if (!second || *second > 59)
            return {};
        return (*hour * 60 + *minute) * 60 + *second;
    }

} // namespace

DateText::DateText(Date date, Fraction fraction) noexcept
{
    std::int64_t days = date.seconds / secondsADay;
    std::int64_t second = date.seconds % secondsADay;
    if (second < 0) {
        second += secondsADay;
        --days;
    }
    const Day day = dayFromNumber(days);
    char* end = writeYear(_letters.data(), day.year);
    *end++ = '-';
    end = writeDigits(end, static_cast<std::uint64_t>(day.month), 2);
    *end++ = '-';
    end = writeDigits(end, static_cast<std::uint64_t>(day.day), 2);
    *end++ = 'T';
    end = writeDigits(end, static_cast<std::uint64_t>(second / 3600), 2);
    *end++ = ':';
    end = writeDigits(end, static_cast<std::uint64_t>(second / 60 % 60), 2);
    *end++ = ':';
    end = writeDigits(end, static_cast<std::uint64_t>(second % 60), 2);
    if (fraction == Fraction::nineDigits) {
        *end++ = '.';
        end = writeDigits(end, date.nanoseconds, 9);
    }
    *end++ = 'Z';
    _length = static_cast<std::size_t>(end - _letters.data());
}

std::optional<Date> readDate(std::string_view text) noexcept
{
    const std::optional<Day> day = takeDay(text);
    if (!day || !take(text, 'T'))
        return {};
    const std::optional<int> second = takeSecondOfDay(text);
    if (!second)
        return {};
    const std::optional<std::uint32_t> nanoseconds = takeFraction(text);
    if (!nanoseconds || text != "Z")
        return {};
    // The widest year that `Date` holds has twelve digits; one beyond it is refused rather than wrapped around.
    constexpr std::int64_t widestYear = 292'000'000'000;
    if (day->year > widestYear || day->year < -widestYear)
        return {};
    return Date { numberOfDay(*day) * secondsADay + *second, *nanoseconds };
}

} // namespace platform
