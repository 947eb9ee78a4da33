#pragma once

#include <string>
#include <string_view>

namespace platform {

/// `path` as it stands in a URI: every byte that RFC 3986 does not call unreserved is escaped, slashes excepted.
inline std::string uriEscapedPath(std::string_view path)
{
    constexpr std::string_view digits = "0123456789ABCDEF";
    constexpr std::string_view unreserved = "abcdefghijklmnopqrstuvwxyzABCDEFGHIJKLMNOPQRSTUVWXYZ0123456789-._~/";
    std::string escaped;
    escaped.reserve(path.size());
    for (const char character : path) {
        if (unreserved.find(character) != std::string_view::npos) {
            escaped += character;
            continue;
        }
        const auto byte = static_cast<unsigned char>(character);
        escaped += '%';
        escaped += digits[byte >> 4];
        escaped += digits[byte & 15];
    }
    return escaped;
}

/// The file URI (RFC 8089) of an absolute path.
inline std::string fileUri(std::string_view path)
{
    return "file://" + uriEscapedPath(path);
}

} // namespace platform
