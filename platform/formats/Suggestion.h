#pragma once

#include <algorithm>
#include <array>
#include <cstddef>
#include <optional>
#include <span>
#include <string_view>

namespace platform {

/// Words longer than this resemble nothing.
inline constexpr std::size_t longestSuggestedWord = 63;

/// How many letters to insert, remove, replace or swap with their neighbour turn `left` into `right`; case of ASCII
/// letters ignored. Words of more than `longestSuggestedWord` bytes are as far apart as the longer one is long.
inline std::size_t editDistance(std::string_view left, std::string_view right)
{
    if (std::max(left.size(), right.size()) > longestSuggestedWord)
        return std::max(left.size(), right.size());
    const auto lower
        = [](char letter) { return letter >= 'A' && letter <= 'Z' ? static_cast<char>(letter - 'A' + 'a') : letter; };
    using Row = std::array<std::size_t, longestSuggestedWord + 1>;
    Row beforeLast {};
    Row last {};
    Row current {};
    for (std::size_t column = 0; column <= right.size(); ++column)
        last[column] = column;
    for (std::size_t row = 1; row <= left.size(); ++row) {
        current[0] = row;
        for (std::size_t column = 1; column <= right.size(); ++column) {
            const char a = lower(left[row - 1]);
            const char b = lower(right[column - 1]);
            current[column]
                = std::min({ last[column] + 1, current[column - 1] + 1, last[column - 1] + (a == b ? 0 : 1) });
            const bool isSwap = row > 1 && column > 1 && a == lower(right[column - 2]) && lower(left[row - 2]) == b;
            if (isSwap)
                current[column] = std::min(current[column], beforeLast[column - 2] + 1);
        }
        beforeLast = last;
        last = current;
    }
    return last[right.size()];
}

/// The one of `candidates` that somebody who wrote `word` most likely meant: fewer than half of its letters differ.
/// Among equals the first; absent when none is near, or `word` is one of them.
inline std::optional<std::string_view> suggestionFor(
    std::string_view word, std::span<const std::string_view> candidates)
{
    std::optional<std::string_view> best;
    std::size_t bestDistance = 0;
    for (std::string_view candidate : candidates) {
        if (candidate == word)
            return {};
        const std::size_t distance = editDistance(word, candidate);
        const bool isNear = distance * 2 < std::max(word.size(), candidate.size()) && distance <= 4;
        // A key that was written without its first or second word, such as "volumes" for "localVolumes".
        const bool isPart = word.size() >= 4 && candidate.size() > word.size()
            && editDistance(word, candidate.substr(candidate.size() - word.size())) <= 1;
        if ((isNear || isPart) && (!best || distance < bestDistance)) {
            best = candidate;
            bestDistance = distance;
        }
    }
    return best;
}

} // namespace platform
