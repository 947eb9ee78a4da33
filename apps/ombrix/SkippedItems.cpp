#include "apps/ombrix/SkippedItems.h"

namespace ombrix {

void SkippedItems::scanDecided(const OBScanDecision& decision)
{
    platform::Locked guard(_lock);
    // The last word counts: what is no project may still be shown as a folder.
    if (decision.passed) {
        if (!_byPath.empty())
            _byPath.erase(decision.path);
        return;
    }
    if (_byPath.insert_or_assign(decision.path, decision).second)
        _order.push_back(decision.path);
}

std::vector<OBScanDecision> SkippedItems::decisions() const
{
    platform::Locked guard(_lock);
    std::map<std::string, OBScanDecision> left = _byPath;
    std::vector<OBScanDecision> decisions;
    for (const std::string& path : _order) {
        if (auto found = left.extract(path))
            decisions.push_back(std::move(found.mapped()));
    }
    return decisions;
}

} // namespace ombrix
