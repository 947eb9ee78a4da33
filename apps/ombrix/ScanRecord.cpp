#include "apps/ombrix/ScanRecord.h"

#include "platform/PathText.h"

#include <algorithm>
#include <utility>

namespace ombrix {
namespace {

    /// The item directly in `library` that `path` is or lies in.
    std::string itemInLibrary(std::string_view library, std::string_view path)
    {
        const std::string_view below = platform::pathRelativeTo(path, library);
        return platform::pathJoined(library, below.substr(0, below.find('/')));
    }

} // namespace

ScanRecord::ScanRecord(const std::vector<std::string>& paths)
{
    platform::Locked guard(_lock);
    for (const std::string& path : paths) {
        std::string_view above = path;
        while (_paths.emplace(above).second && above.size() > 1)
            above = platform::pathByRemovingLastComponent(above);
    }
}

void ScanRecord::libraryBegan(const std::string& path)
{
    platform::Locked guard(_lock);
    _libraries.push_back({ path, {} });
    _inLibrary.clear();
    _recent.clear();
}

void ScanRecord::scanDecided(const OBScanDecision& decision)
{
    platform::Locked guard(_lock);
    if (_libraries.empty())
        _libraries.push_back({ wholeDisk, {} });
    if (isOfInterest(decision.path) || decision.path == _libraries.back().path)
        _libraries.back().decisions.push_back(decision);
    else
        keepForLater(decision);
}

void ScanRecord::keepForLater(const OBScanDecision& decision)
{
    if (itemInLibrary(_libraries.back().path, decision.path) == decision.path) {
        _inLibrary[decision.path].push_back(decision);
        return;
    }
    const auto isElsewhere
        = [&](const OBScanDecision& earlier) { return !platform::isSameOrBelow(decision.path, earlier.path); };
    _recent.erase(std::remove_if(_recent.begin(), _recent.end(), isElsewhere), _recent.end());
    _recent.push_back(decision);
}

bool ScanRecord::wantsRecordExplained(const std::string& path) const
{
    platform::Locked guard(_lock);
    return isOfInterest(path);
}

void ScanRecord::linkFollowed(const std::string& path, const std::string& target)
{
    platform::Locked guard(_lock);
    if (!_libraries.empty() && !isOfInterest(path) && isOfInterest(target))
        keepDecisionsOf(path);
}

void ScanRecord::objectMade(const std::string& path, const OBMediaObjectRef& object)
{
    platform::Locked guard(_lock);
    if (isOfInterest(path))
        _made.push_back({ path, object });
}

/// From now on what leads to `entry` is of interest, and what was decided of it already is kept.
void ScanRecord::keepDecisionsOf(const std::string& entry)
{
    std::vector<OBScanDecision>& kept = _libraries.back().decisions;
    const std::string item = itemInLibrary(_libraries.back().path, entry);
    if (_paths.insert(item).second) {
        const std::vector<OBScanDecision> earlier = std::move(_inLibrary[item]);
        kept.insert(kept.end(), earlier.begin(), earlier.end());
    }
    for (const OBScanDecision& decision : _recent) {
        if (platform::isSameOrBelow(entry, decision.path)) {
            kept.push_back(decision);
            _paths.insert(decision.path);
        }
    }
    _recent.clear();
    _paths.insert(entry);
}

} // namespace ombrix
