#pragma once

#include "host/OBMediaGroup.h"

/// How groups of the Montaro source stand to one another: -1 when the receiver comes first, +1 when the other does, 0
/// when neither does. Pure functions of the two groups; any thread.
namespace MontaroSupport {

/// Event libraries after everything else; the rest by name without regard to case.
int _MontaroRootGroupComparison(const OBMediaGroup& receiver, const OBMediaGroup& other);

} // namespace MontaroSupport
