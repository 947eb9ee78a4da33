#pragma once

#include "host/OBMediaGroup.h"

#include <cstddef>
#include <utility>
#include <vector>

/// The elements sorted by `comparison`, which answers -1, 0 or +1 for two of them: top-down merge sort, n elements
/// being cut after n/2. Where the comparison is 0, the element of the first part comes first. The comparison need not
/// be transitive (events without a year equal everything), so the way of sorting is part of the result.
template <class Element, class Comparison>
std::vector<Element> mergeSorted(std::vector<Element> elements, const Comparison& comparison)
{
    if (elements.size() < 2)
        return elements;
    const auto middle = elements.begin() + static_cast<std::ptrdiff_t>(elements.size() / 2);
    const std::vector<Element> first = mergeSorted(std::vector<Element>(elements.begin(), middle), comparison);
    const std::vector<Element> second = mergeSorted(std::vector<Element>(middle, elements.end()), comparison);
    std::vector<Element> merged;
    merged.reserve(elements.size());
    auto left = first.begin();
    auto right = second.begin();
    while (left != first.end() && right != second.end())
        merged.push_back(comparison(*left, *right) <= 0 ? *left++ : *right++);
    merged.insert(merged.end(), left, first.end());
    merged.insert(merged.end(), right, second.end());
    return merged;
}

/// The groups sorted likewise by a comparison of two groups.
template <class Comparison>
std::vector<OBMediaGroupRef> sortedGroups(std::vector<OBMediaGroupRef> groups, const Comparison& comparison)
{
    return mergeSorted(std::move(groups),
        [&comparison](const OBMediaGroupRef& left, const OBMediaGroupRef& right) { return comparison(*left, *right); });
}
