#pragma once

#include "platform/PathText.h"

#include <algorithm>
#include <array>
#include <string_view>

namespace platform {

/// The content type of every file with a movie's extension.
inline constexpr std::string_view movieContentType = "org.ombrix.movie";

/// Whether `name` has the extension of a movie: mov, m4v, mp4 or 3gp, in capital or small letters.
constexpr bool isMovieName(std::string_view name) noexcept
{
    constexpr std::array<std::string_view, 4> extensions { "mov", "m4v", "mp4", "3gp" };
    constexpr auto small
        = [](char letter) { return letter >= 'A' && letter <= 'Z' ? static_cast<char>(letter - 'A' + 'a') : letter; };
    const std::string_view extension = extensionOfName(name);
    return std::any_of(extensions.begin(), extensions.end(), [extension, small](std::string_view candidate) {
        return std::equal(extension.begin(), extension.end(), candidate.begin(), candidate.end(),
            [small](char left, char right) { return small(left) == right; });
    });
}

/// The content type of a plain file called `name`, as the metadata index tells it; empty when it has none.
constexpr std::string_view contentTypeOfName(std::string_view name) noexcept
{
    return isMovieName(name) ? movieContentType : std::string_view();
}

} // namespace platform
