#pragma once

#include <optional>
#include <string>
#include <vector>

/// What a source may tell about itself beside its tree, for programs that answer an operator's questions.
/// Optional: a manager without it answers null for its inspection. Any thread; may block while a disk does not answer.
class OBSourceInspection {
public:
    virtual ~OBSourceInspection() = default;
    /// The folders that are searched, in order. Runs no load.
    virtual std::vector<std::string> projectSearchPaths() = 0;
    virtual std::vector<std::string> eventSearchPaths() = 0;
    /// Whether the newest events come first; absent where the source has no such order.
    virtual std::optional<bool> mostRecentEventFirst() const = 0;
    /// The preferences domains that are read.
    virtual std::vector<std::string> preferencesDomains() const { return {}; }
    virtual std::optional<double> pluginVersionNumber() const = 0;
    virtual std::optional<std::string> pluginVersionString() const = 0;
};
