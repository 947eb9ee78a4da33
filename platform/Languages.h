#pragma once

#include <string>
#include <vector>

namespace platform {

/// The languages in which the user wants to read texts. Any thread.
class Languages {
public:
    virtual ~Languages() = default;
    /// Language codes, most wanted first, each followed by what it falls back to ("de_AT", "de"); without encoding or
    /// modifier. Empty for the C locale, which means English.
    virtual std::vector<std::string> preferredLanguages() const = 0;
};

} // namespace platform
