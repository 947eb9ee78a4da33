#pragma once

#include "host/OBScanObserver.h"
#include "platform/ThreadSafety.h"

#include <cstddef>
#include <string>
#include <string_view>
#include <unordered_map>
#include <unordered_set>
#include <vector>

namespace ombrix {

/// Keeps what a scan decides about some paths, about the folders that they lie in, and about the links that lead to
/// them. Any thread.
class ScanRecord final : public OBScanObserver {
public:
    /// `paths` are absolute.
    explicit ScanRecord(const std::vector<std::string>& paths);

    void libraryBegan(const std::string& path) override;
    void scanDecided(const OBScanDecision& decision) override;
    bool wantsRecordExplained(const std::string& path) const override;
    void linkFollowed(const std::string& path, const std::string& target) override;
    void objectMade(const std::string& path, const OBMediaObjectRef& object) override;

    /// The library of a source that decides before it tells of one, and so may search anywhere.
    static constexpr const char* wholeDisk = "/";

    /// A library, as often as it was searched.
    struct Library {
        std::string path;
        std::vector<OBScanDecision> decisions;
    };
    /// An entry that became a record of another path.
    struct Made {
        std::string entry;
        OBMediaObjectRef object;
    };
    /// In the order of the scan, which has ended.
    const std::vector<Library>& libraries() const NO_THREAD_SAFETY_ANALYSIS { return _libraries; }
    const std::vector<Made>& objectsMade() const NO_THREAD_SAFETY_ANALYSIS { return _made; }

private:
    bool isOfInterest(const std::string& path) const REQUIRES(_lock) { return _paths.count(path) > 0; }

    void keepForLater(const OBScanDecision& decision) REQUIRES(_lock);
    void keepDecisionsOf(const std::string& entry) REQUIRES(_lock);

    mutable platform::Mutex _lock;
    std::unordered_set<std::string> _paths GUARDED_BY(_lock); // those asked for, those that led to them, and all above
    // Decisions about paths that a link may yet make interesting: what lies directly in the library, and what led to
    // the path at hand.
    std::unordered_map<std::string, std::vector<OBScanDecision>> _inLibrary GUARDED_BY(_lock);
    std::vector<OBScanDecision> _recent GUARDED_BY(_lock);
    std::vector<Library> _libraries GUARDED_BY(_lock);
    std::vector<Made> _made GUARDED_BY(_lock);
};

} // namespace ombrix
