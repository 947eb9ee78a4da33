#include "platform/formats/PropertyListObjects.h"

#include "platform/formats/Unicode.h"

#include <algorithm>
#include <bit>
#include <cmath>

namespace platform {
namespace {

    constexpr std::int64_t secondsFrom1970To2001 = 978'307'200;

    bool isHighSurrogate(char32_t unit)
    {
        return unit >= 0xD800 && unit <= 0xDBFF;
    }

    bool isLowSurrogate(char32_t unit)
    {
        return unit >= 0xDC00 && unit <= 0xDFFF;
    }

    std::optional<Value> wideInteger(std::uint64_t high, std::uint64_t low)
    {
        const auto withSign = static_cast<std::int64_t>(low);
        if (high == (withSign < 0 ? ~std::uint64_t { 0 } : 0))
            return Value(withSign);
        return high == 0 ? std::optional(Value(static_cast<double>(low))) : std::nullopt;
    }

} // namespace

std::uint64_t numberFromBytes(std::string_view bytes) noexcept
{
    std::uint64_t number = 0;
    for (char byte : bytes)
        number = (number << 8) | static_cast<std::uint8_t>(byte);
    return number;
}

std::optional<Value> integerFromBytes(std::string_view bytes)
{
    if (bytes.size() == 16)
        return wideInteger(numberFromBytes(bytes.substr(0, 8)), numberFromBytes(bytes.substr(8)));
    if (bytes.size() > 8)
        return {};
    return Value(static_cast<std::int64_t>(numberFromBytes(bytes)));
}

std::optional<Value> realFromBytes(std::string_view bytes)
{
    const std::uint64_t bits = numberFromBytes(bytes.substr(0, 8));
    if (bytes.size() == 8)
        return Value(std::bit_cast<double>(bits));
    if (bytes.size() == 4)
        return Value(double { std::bit_cast<float>(static_cast<std::uint32_t>(bits)) });
    return {};
}

std::optional<Value> dateFromBytes(std::string_view bytes)
{
    constexpr double limit = 9.0e18; // what 64 bits hold, less the seconds up to 2001
    const auto seconds = std::bit_cast<double>(numberFromBytes(bytes.substr(0, 8)));
    if (bytes.size() != 8 || !(std::abs(seconds) < limit))
        return {};
    const double whole = std::floor(seconds);
    const auto nanoseconds = static_cast<std::uint32_t>((seconds - whole) * 1e9);
    return Value(
        Date { static_cast<std::int64_t>(whole) + secondsFrom1970To2001, std::min(nanoseconds, 999'999'999u) });
}

std::optional<std::string> textFromUtf16(std::string_view bytes)
{
    std::string text;
    text.reserve(bytes.size() / 2);
    while (!bytes.empty()) {
        char32_t unit = static_cast<char32_t>(numberFromBytes(bytes.substr(0, 2)));
        bytes.remove_prefix(2);
        if (isHighSurrogate(unit)) {
            const char32_t low = static_cast<char32_t>(numberFromBytes(bytes.substr(0, 2)));
            if (!isLowSurrogate(low))
                return {};
            bytes.remove_prefix(2);
            unit = 0x10000 + ((unit - 0xD800) << 10) + (low - 0xDC00);
        } else if (isLowSurrogate(unit)) {
            return {};
        }
        appendCharacter(text, unit);
    }
    return text;
}

} // namespace platform
