#pragma once

#include "apps/ombrix/ScanRecord.h"
#include "apps/ombrix/TreePlaces.h"
#include "platform/FileSystem.h"

#include <cstddef>
#include <string>
#include <string_view>
#include <unordered_map>
#include <utility>
#include <vector>

class OBSourceInspection;

namespace ombrix {

/// One rule that was met on the way to a path.
struct ExplainedStep {
    std::string rule;
    std::string path;
    bool passed = true;
    std::string text;
};

/// Why a path is, or is not, in the tree.
struct Explanation {
    std::string path;
    std::vector<TreePlace> places {}; ///< the records that stand for it; none when it is not listed
    std::vector<ExplainedStep> steps {}; ///< in the order in which the scan meets them, the deciding one last
    std::string remedy {}; ///< what would make it appear; empty when nothing is known

    bool isListed() const { return !places.empty(); }
};

/// Explains paths by what a scan told of them and by the tree that it made, which therefore never disagree.
class Explainer {
public:
    /// All that is handed over outlives this object. `folders` are those that are searched; `inspection` is that of
    /// their source, and may be null.
    Explainer(const platform::FileSystem& fileSystem, const std::vector<std::string>& folders, const ScanRecord& record,
        const TreePlaces& places, const OBSourceInspection* inspection = nullptr);

    Explanation explain(const std::string& path) const;

private:
    using Decisions = std::vector<const OBScanDecision*>;
    /// What was decided in one library, by path: places in the library's list.
    using DecisionIndex = std::unordered_map<std::string_view, std::vector<std::size_t>>;
    struct Way;

    std::vector<TreePlace> placesOf(const std::string& path) const;
    bool speaksOf(std::size_t library, const std::string& path) const;
    Way chosenWay(const Explanation& explanation) const;
    Way wayByLink(const std::string& path) const;
    Way wayThrough(std::size_t library, const std::string& path, bool isListed) const;
    Way wayToRecord(const Decisions& met, const std::string& path) const;
    void endAt(Way& way, const Decisions& met, const std::string& path) const;
    void endBelow(Way& way, const Decisions& met, const std::string& path) const;
    std::pair<std::string, std::string> searchedSpelling(const std::string& path) const;
    Way wayOutside(const std::string& path) const;
    Decisions decisionsOnWay(std::size_t library, const std::string& path) const;
    const ScanRecord::Made* madeInto(const std::string& path) const;
    std::string firstMissing(std::string_view folder, std::string_view path) const;

    const platform::FileSystem& _fileSystem;
    const std::vector<std::string>& _folders;
    const ScanRecord& _record;
    const TreePlaces& _places;
    const OBSourceInspection* const _inspection;
    std::vector<DecisionIndex> _decisions {}; // one for each library of the record
    std::unordered_map<std::string_view, std::vector<const ScanRecord::Made*>> _madeByEntry {};
    std::unordered_map<std::string, const ScanRecord::Made*> _madeByTarget {}; // the first of each
};

} // namespace ombrix
