#pragma once

#include "host/OBMediaGroup.h"

#include <cstddef>
#include <utility>
#include <vector>

/// The groups sorted by `comparison`, which answers -1, 0 or +1 for two groups: top-down merge sort, n elements being
/// cut after n/2. Where the comparison is 0, the element of the first part comes first. The comparison need not be
/// transitive (events without a year equal everything), so the way of sorting is part of the result.
template <class Comparison>
std::vector<OBMediaGroupRef> sortedGroups(std::vector<OBMediaGroupRef> groups, const Comparison& comparison)
{
    if (groups.size() < 2)
        return groups;
    const auto middle = groups.begin() + static_cast<std::ptrdiff_t>(groups.size() / 2);
    const std::vector<OBMediaGroupRef> first = sortedGroups(std::vector(groups.begin(), middle), comparison);
    const std::vector<OBMediaGroupRef> second = sortedGroups(std::vector(middle, groups.end()), comparison);
    std::vector<OBMediaGroupRef> merged;
    merged.reserve(groups.size());
    auto left = first.begin();
    auto right = second.begin();
    while (left != first.end() && right != second.end())
        merged.push_back(comparison(**left, **right) <= 0 ? *left++ : *right++);
    merged.insert(merged.end(), left, first.end());
    merged.insert(merged.end(), right, second.end());
    return merged;
}
