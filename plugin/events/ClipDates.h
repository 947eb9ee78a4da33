#pragma once

#include "platform/Value.h"

#include <optional>

/// Between which years the clips of one event lie, and the dates that stand for those years.
///
/// Years alone are compared: within the smallest and the largest year the first clip listed gives the date, whatever
/// its day.
class ClipDates {
public:
    /// The next clip, in listing order; one without a date has a year all the same.
    void take(int year, const std::optional<platform::Date>& date)
    {
        if (year < _smallestYear) {
            _smallestYear = year;
            _oldest = date;
        }
        if (year > _largestYear) {
            _largestYear = year;
            _newest = date;
        }
    }

    /// The year that an event of these clips counts to; absent when no clip gave one.
    std::optional<int> creationYear(bool newestFirst) const
    {
        if (newestFirst)
            return _largestYear > noLargestYear ? std::optional(_largestYear) : std::nullopt;
        return _smallestYear < noSmallestYear ? std::optional(_smallestYear) : std::nullopt;
    }
    std::optional<platform::Date> oldest() const { return _oldest ? _oldest : _newest; }
    std::optional<platform::Date> newest() const { return _newest; }

private:
    static constexpr int noSmallestYear = 9999;
    static constexpr int noLargestYear = 0;

    int _smallestYear = noSmallestYear;
    int _largestYear = noLargestYear;
    std::optional<platform::Date> _oldest {};
    std::optional<platform::Date> _newest {};
};
