#pragma once

#include "platform/Value.h"

#include <chrono>
#include <cstdint>
#include <string>
#include <string_view>

namespace apps {

// Numbers, sizes and dates as a person reads them; English, in local time.

/// "1,204"; from a million on "1.0 M".
std::string countText(std::uint64_t count);
/// "1 movie", "2 movies".
std::string quantityText(std::uint64_t count, std::string_view unit);
/// The unit that belongs to the count: "movie" or "movies".
std::string unitText(std::uint64_t count, std::string_view unit);
/// "999 bytes", "1.5 kB", "310 MB", "12.0 GB".
std::string sizeText(std::uint64_t bytes);
/// "31 ms", "3 s", "2 min".
std::string durationText(std::chrono::nanoseconds duration);
/// "5.0 s", however long.
std::string secondsText(std::chrono::nanoseconds duration);
/// "14:02:07".
std::string timeText(platform::Date date);
/// "14 Nov 2026"; "today 14:02" on the day of `now`.
std::string dateText(platform::Date date, platform::Date now);
/// "3 – 9 Mar 2026", as short as the two days allow; one day alone where they are the same. Without the year where
/// it is `knownYear`.
std::string dateRangeText(platform::Date first, platform::Date last, std::string_view knownYear);
/// "Mar 2014".
std::string monthText(platform::Date date);

} // namespace apps
