#pragma once

#include "host/OBScanObserver.h"
#include "platform/ThreadSafety.h"

#include <cstddef>
#include <map>
#include <string>
#include <vector>

namespace ombrix {

/// Collects what rules keep out of a tree while it is loaded. Any thread.
class SkippedItems final : public OBScanObserver {
public:
    void scanDecided(const OBScanDecision& decision) override;
    bool wantsRecordExplained(const std::string&) const override { return false; }

    /// The decisions that kept something out, one a path, in the order in which they were taken.
    std::vector<OBScanDecision> decisions() const;

private:
    mutable platform::Mutex _lock;
    std::map<std::string, OBScanDecision> _byPath GUARDED_BY(_lock);
    std::vector<std::string> _order GUARDED_BY(_lock);
};

} // namespace ombrix
