#pragma once

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <numeric>
#include <optional>
#include <string_view>
#include <vector>

namespace platform {

/// Which of `count` keys, each answered by `keyAt(index)` as a string view, is the first that an earlier one equals.
///
/// By sorting, not hashing: a file can choose keys that collide in a hash, and none that make this slow.
template <typename KeyAt> std::optional<std::size_t> firstRepeatedKey(std::size_t count, KeyAt keyAt)
{
    const auto isBefore = [&](std::uint32_t left, std::uint32_t right) {
        const std::string_view a = keyAt(left);
        const std::string_view b = keyAt(right);
        if (a.size() != b.size())
            return a.size() < b.size();
        // Keys that share their bytes are common where one text is referred to many times.
        const int order = a.data() == b.data() ? 0 : a.compare(b);
        return order != 0 ? order < 0 : left < right;
    };
    std::vector<std::uint32_t> order(count);
    std::iota(order.begin(), order.end(), 0u);
    std::sort(order.begin(), order.end(), isBefore);
    std::optional<std::size_t> first;
    for (std::size_t index = 1; index < count; ++index) {
        if (keyAt(order[index - 1]) == keyAt(order[index]))
            first = std::min<std::size_t>(first.value_or(order[index]), order[index]);
    }
    return first;
}

} // namespace platform
