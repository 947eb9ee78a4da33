#include "host/QueryDate.h"

#include <chrono>
#include <cstdint>

namespace {

constexpr std::int64_t secondsAMinute = 60;
constexpr std::int64_t secondsAnHour = 3600;
constexpr std::int64_t secondsADay = 86400;

bool isDigit(char letter)
{
    return letter >= '0' && letter <= '9';
}

/// Takes one part after the other off the start of a text. The first that is not there spoils all that follow.
class DateReader {
public:
    explicit DateReader(std::string_view text)
        : _rest(text)
    {
    }

    bool isGood() const { return _isGood; }
    bool isAtEnd() const { return _rest.empty(); }

    /// A number of exactly so many digits, at most `greatest`.
    std::int64_t number(std::size_t digits, std::int64_t greatest)
    {
        std::int64_t value = 0;
        _isGood = _isGood && _rest.size() >= digits;
        for (std::size_t index = 0; _isGood && index < digits; ++index) {
            _isGood = isDigit(_rest[index]);
            value = value * 10 + (_rest[index] - '0');
        }
        _isGood = _isGood && value <= greatest;
        if (_isGood)
            _rest.remove_prefix(digits);
        return value;
    }

    bool takes(char letter)
    {
        if (!_isGood || _rest.empty() || _rest.front() != letter)
            return false;
        _rest.remove_prefix(1);
        return true;
    }

    void expect(char letter) { _isGood = takes(letter); }

    /// One to nine digits after a full stop, in nanoseconds.
    std::uint32_t fraction()
    {
        std::uint32_t nanoseconds = 0;
        int digits = 0;
        for (; digits < 9 && !_rest.empty() && isDigit(_rest.front()); ++digits) {
            nanoseconds = nanoseconds * 10 + static_cast<std::uint32_t>(_rest.front() - '0');
            _rest.remove_prefix(1);
        }
        _isGood = _isGood && digits > 0;
        for (; digits < 9; ++digits)
            nanoseconds *= 10;
        return nanoseconds;
    }

    /// Seconds east of UTC.
    std::int64_t zone()
    {
        if (takes('Z'))
            return 0;
        const bool isWest = takes('-');
        if (!isWest)
            expect('+');
        const std::int64_t hours = number(2, 23);
        takes(':');
        const std::int64_t distance = hours * secondsAnHour + number(2, 59) * secondsAMinute;
        return isWest ? -distance : distance;
    }

private:
    std::string_view _rest;
    bool _isGood = true;
};

std::optional<std::int64_t> readDay(DateReader& reader)
{
    const auto year = static_cast<int>(reader.number(4, 9999));
    reader.expect('-');
    const auto month = static_cast<unsigned>(reader.number(2, 12));
    reader.expect('-');
    const auto day = static_cast<unsigned>(reader.number(2, 31));
    const std::chrono::year_month_day date { std::chrono::year(year), std::chrono::month(month),
        std::chrono::day(day) };
    if (!reader.isGood() || !date.ok())
        return std::nullopt;
    return std::chrono::sys_days(date).time_since_epoch().count() * secondsADay;
}

} // namespace

std::optional<platform::Date> queryDate(std::string_view text)
{
    DateReader reader(text);
    const std::optional<std::int64_t> day = readDay(reader);
    if (!day || reader.isAtEnd())
        return day ? std::optional(platform::Date { *day, 0 }) : std::nullopt;
    platform::Date date { *day, 0 };
    reader.expect('T');
    date.seconds += reader.number(2, 23) * secondsAnHour;
    reader.expect(':');
    date.seconds += reader.number(2, 59) * secondsAMinute;
    reader.expect(':');
    date.seconds += reader.number(2, 59);
    if (reader.takes('.'))
        date.nanoseconds = reader.fraction();
    date.seconds -= reader.zone();
    return reader.isGood() && reader.isAtEnd() ? std::optional(date) : std::nullopt;
}
