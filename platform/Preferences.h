#pragma once

#include "platform/Value.h"

#include <string>
#include <string_view>

namespace platform {

/// A preferences domain as it stood when it was asked for.
struct PreferencesAnswer {
    /// A dictionary, or null when the domain has never been stored or cannot be read.
    Value values;
    /// Why a stored domain cannot be read, as one line that names the file; empty when it was read or never stored.
    std::string problem;
};

/// Preferences as property lists, a file a domain. Any thread. None throws.
class Preferences {
public:
    virtual ~Preferences() = default;

    /// All values of `domain` (such as "org.ombrix.browser"), read afresh at each call, XML or binary.
    virtual PreferencesAnswer valuesOfDomain(std::string_view domain) const = 0;
};

} // namespace platform
