#pragma once

#include <optional>
#include <string>
#include <vector>

/// Why a source does not search a place.
struct OBUnsearchedPlace {
    std::string text {};
    std::string remedy {}; ///< what would have it searched; empty when nothing would
};

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
    /// Of a path that lies in none of the folders that are searched: the rule that would have it searched elsewhere, as
    /// one for folders of a certain name. Of one that lies in such a folder, where nothing was decided about it: why
    /// nothing is looked for there. Absent where the source has no rule that speaks of it.
    virtual std::optional<OBUnsearchedPlace> whyUnsearched(const std::string& path) const
    {
        (void)path;
        return std::nullopt;
    }
};
