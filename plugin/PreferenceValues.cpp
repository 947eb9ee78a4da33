#include "plugin/PreferenceValues.h"

#include <algorithm>
#include <charconv>
#include <cstdint>
#include <limits>
#include <string_view>
#include <system_error>

using platform::Value;

namespace {

constexpr std::string_view whiteSpace = " \t\n\v\f\r";
constexpr std::string_view decimalDigits = "0123456789";

void skip(std::string_view& text, std::string_view characters)
{
    text.remove_prefix(std::min(text.find_first_not_of(characters), text.size()));
}

/// Removes one sign; true when it was a minus.
bool takeSign(std::string_view& text)
{
    const bool isNegative = text.starts_with('-');
    if (isNegative || text.starts_with('+'))
        text.remove_prefix(1);
    return isNegative;
}

bool booleanOfText(std::string_view text)
{
    skip(text, whiteSpace);
    takeSign(text);
    skip(text, "0");
    return !text.empty() && std::string_view("YyTt123456789").find(text.front()) != std::string_view::npos;
}

/// Whether a decimal number that no double can hold is too large for one, not too small: where its first digit stands
/// relative to the full stop, moved by the exponent.
bool isLarge(std::string_view number)
{
    const std::string_view digits = number.substr(0, number.find_first_of("eE"));
    const std::size_t firstDigit = digits.find_first_of("123456789");
    if (firstDigit == std::string_view::npos)
        return false;
    const std::size_t point = std::min(digits.find('.'), digits.size());
    const auto place = static_cast<std::int64_t>(point) - static_cast<std::int64_t>(firstDigit);
    std::string_view exponentText = number.substr(std::min(digits.size() + 1, number.size()));
    const bool isNegative = takeSign(exponentText);
    std::int64_t exponent = 0;
    const auto [end, error] = std::from_chars(exponentText.data(), exponentText.data() + exponentText.size(), exponent);
    if (error == std::errc::result_out_of_range)
        return !isNegative;
    return place + (isNegative ? -exponent : exponent) > 0;
}

double doubleOfText(std::string_view text)
{
    skip(text, whiteSpace);
    const bool isNegative = takeSign(text);
    const std::string_view start = text.substr(text.starts_with('.') ? 1 : 0, 1);
    if (start.empty() || decimalDigits.find(start.front()) == std::string_view::npos)
        return 0.0;
    double number = 0.0;
    const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), number);
    if (error == std::errc::result_out_of_range)
        number = isLarge({ text.data(), end }) ? std::numeric_limits<double>::infinity() : 0.0;
    return isNegative ? -number : number;
}

} // namespace

std::optional<bool> booleanOfPreference(const Value& value)
{
    if (const bool* boolean = value.boolean())
        return *boolean;
    if (const std::int64_t* integer = value.integer())
        return *integer != 0;
    if (const double* real = value.real())
        return *real != 0.0; // true for what is not a number
    if (const platform::Text* text = value.text())
        return booleanOfText(*text);
    return std::nullopt;
}

std::optional<double> doubleOfPreference(const Value& value)
{
    if (const bool* boolean = value.boolean())
        return *boolean ? 1.0 : 0.0;
    if (const std::int64_t* integer = value.integer())
        return static_cast<double>(*integer);
    if (const double* real = value.real())
        return *real;
    if (const platform::Text* text = value.text())
        return doubleOfText(*text);
    return std::nullopt;
}
