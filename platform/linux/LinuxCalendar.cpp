#include "platform/linux/LinuxCalendar.h"

#include "platform/Immortal.h"

#include <climits>
#include <clocale>
#include <cstddef>
#include <ctime>
#include <optional>
#include <vector>

namespace platform {

namespace {

    constexpr int yearOfZero = 1900; // what the C library counts years from

    // Absent for dates whose year the C library cannot count.
    std::optional<tm> localTime(const Date& date)
    {
        const std::time_t seconds = date.seconds;
        tm parts {};
        return localtime_r(&seconds, &parts) ? std::optional(parts) : std::nullopt;
    }

    /// The user's names of months and days; those of the C locale where the user's is not installed.
    class TimeLocale {
    public:
        TimeLocale()
            : _locale(newlocale(LC_ALL_MASK, "", nullptr))
        {
            if (!_locale)
                _locale = newlocale(LC_ALL_MASK, "C", nullptr);
        }
        TimeLocale(const TimeLocale&) = delete;
        TimeLocale& operator=(const TimeLocale&) = delete;
        locale_t get() const { return _locale; }

    private:
        locale_t _locale;
    };

    /// Opened once: it is read from a dozen files.
    locale_t timeLocale()
    {
        static Immortal<TimeLocale> locale;
        return locale->get();
    }

} // namespace

int LinuxCalendar::yearOfDate(const Date& date) const
{
    const std::optional<tm> parts = localTime(date);
    if (!parts)
        return date.seconds < 0 ? INT_MIN : INT_MAX;
    return parts->tm_year > INT_MAX - yearOfZero ? INT_MAX : parts->tm_year + yearOfZero;
}

std::string LinuxCalendar::textOfDate(const Date& date, std::string_view format) const
{
    constexpr std::size_t longest = 4096;
    const std::optional<tm> parts = localTime(date);
    const locale_t locale = timeLocale();
    if (!parts || !locale || format.empty())
        return {};
    std::vector<char> text(longest);
    const std::size_t length = strftime_l(text.data(), text.size(), std::string(format).c_str(), &*parts, locale);
    return { text.data(), length };
}

} // namespace platform
