#pragma once

#include "host/OBMediaObject.h"

#include <string>
#include <string_view>

/// One rule that a scan applied to one file or folder.
struct OBScanDecision {
    std::string_view rule {}; ///< what the rule is about, such as "hidden name"; the same words at every use
    std::string path {}; ///< as the scan spells it
    bool passed = true; ///< false keeps the path, and all that lies in it, out of the tree
    std::string text {}; ///< what was found, for people
    std::string remedy {}; ///< what would make the rule pass; empty when nothing would
    std::string itself {}; ///< why a path that passed is no record of its own; empty where it is one
    std::string inside {}; ///< why nothing in it is listed but what further decisions speak of; empty for no reason
    std::string insideRemedy {}; ///< what would list it
};

/// Is told what a scan decides, as it decides. Called on the scanning thread, in the order of the rules.
class OBScanObserver {
public:
    virtual ~OBScanObserver() = default;
    /// The scan turns to a library, a folder that it searches; decisions about what is in it follow, until the next. A
    /// library that is searched twice is told of twice. A source without libraries need not call it: what it decides
    /// may be about any path.
    virtual void libraryBegan(const std::string& path) { (void)path; }
    virtual void scanDecided(const OBScanDecision& decision) = 0;
    /// Whether the last word on an entry that became a record is wanted, which takes a while to put into words.
    virtual bool wantsRecordExplained(const std::string& path) const
    {
        (void)path;
        return true;
    }
    /// By way of a link, the entry at `path` stands for what lies at `target`. Told before what is decided of that.
    virtual void linkFollowed(const std::string& path, const std::string& target)
    {
        (void)path;
        (void)target;
    }
    /// The entry at `path` became a record of another path, by way of a link.
    virtual void objectMade(const std::string& path, const OBMediaObjectRef& object)
    {
        (void)path;
        (void)object;
    }
};
