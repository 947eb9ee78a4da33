#pragma once

#include <cstddef>
#include <string>
#include <string_view>

namespace platform {

/// U+FFFD in UTF-8: stands in output for each byte that is no UTF-8.
inline constexpr std::string_view replacementCharacter = "\xEF\xBF\xBD";

/// One character at the start of some bytes.
struct DecodedCharacter {
    char32_t codePoint = 0xFFFD;
    std::size_t length = 1; ///< bytes to go on by
    bool isValid = false; ///< false: the first byte begins no UTF-8 sequence, and stands for itself alone
};

/// Decodes the character at the start of `bytes`, which must not be empty. Strict as The Unicode Standard, table 3-7:
/// no overlong forms, no surrogates, nothing above U+10FFFF.
DecodedCharacter decodeCharacter(std::string_view bytes) noexcept;

/// How many bytes the UTF-8 sequence at the start of `bytes` has; 0 when none begins there, or `bytes` is empty.
std::size_t lengthOfValidSequence(std::string_view bytes) noexcept;

/// Where the first byte stands that is not ASCII; `bytes.size()` when all is.
std::size_t lengthOfAsciiPrefix(std::string_view bytes) noexcept;

/// Where the first byte stands that is no UTF-8; `bytes.size()` when all is.
std::size_t lengthOfValidPrefix(std::string_view bytes) noexcept;

/// Appends `codePoint`, U+FFFD for what is none, as UTF-8.
void appendCharacter(std::string& text, char32_t codePoint);

} // namespace platform
