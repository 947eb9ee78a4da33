#pragma once

#include <string>
#include <string_view>

/// One rule that a scan applied to one file or folder.
struct OBScanDecision {
    std::string_view rule; ///< what the rule is about, such as "hidden name"; the same words at every use
    std::string path;
    bool passed = true;
    std::string text; ///< what was found, for people
    std::string remedy; ///< what would make the rule pass; empty when nothing would
};

/// Is told what a scan decides, as it decides. Called on the scanning thread, in the order of the rules.
class OBScanObserver {
public:
    virtual ~OBScanObserver() = default;
    virtual void scanDecided(const OBScanDecision& decision) = 0;
};
