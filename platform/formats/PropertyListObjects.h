#pragma once

#include "platform/Value.h"

#include <optional>
#include <string>
#include <string_view>

namespace platform {

/// What the bytes of the simple objects of a binary property list stand for; all numbers are big-endian.

/// Of at most eight bytes.
std::uint64_t numberFromBytes(std::string_view bytes) noexcept;

/// Of one, two or four bytes without a sign, of eight with one, or of sixteen, which hold what is too large for a sign
/// and becomes a real; absent when it needs more than 64 bits, or is of another size.
std::optional<Value> integerFromBytes(std::string_view bytes);

/// Of four or eight bytes.
std::optional<Value> realFromBytes(std::string_view bytes);

/// Eight bytes, seconds since 2001 as a real; absent when it is not finite, or too far off to be counted.
std::optional<Value> dateFromBytes(std::string_view bytes);

/// UTF-16 as UTF-8; absent when it holds half of a surrogate pair. The bytes are even in number.
std::optional<std::string> textFromUtf16(std::string_view bytes);

} // namespace platform
