#pragma once

#include "host/OBMediaGroup.h"

/// How groups of the Montaro source stand to one another: -1 when the receiver comes first, +1 when the other does, 0
/// when neither does. Pure functions of the two groups; any thread.
namespace MontaroSupport {

/// Event libraries after everything else; the rest by name without regard to case.
int _MontaroRootGroupComparison(const OBMediaGroup& receiver, const OBMediaGroup& other);

/// Events by their years, then by their oldest clips, then by name. 0 as soon as one of the two lacks what is compared.
int _eventComparisonByYearOldestFirst(const OBMediaGroup& receiver, const OBMediaGroup& other);
/// Events by their years, the latest first, then by their newest clips, the latest first, then by name, A to Z. 0 as
/// soon as one of the two lacks its year or the date of its oldest clip.
int _eventComparisonByYearNewestFirst(const OBMediaGroup& receiver, const OBMediaGroup& other);
/// Events by name without regard to case.
int _eventComparisonAlphabetically(const OBMediaGroup& receiver, const OBMediaGroup& other);

} // namespace MontaroSupport
