#pragma once

#include <optional>
#include <string>
#include <string_view>

namespace platform {

/// `bytes` in Base64 with padding (RFC 4648), without line breaks.
std::string encodeBase64(std::string_view bytes);

/// The bytes that `text` stands for, white space anywhere allowed; absent when a letter or the padding is wrong.
std::optional<std::string> decodeBase64(std::string_view text);

} // namespace platform
