#pragma once

#include "host/OBMediaGroup.h"
#include "platform/Value.h"

#include <chrono>
#include <string>

/// What made a source scan again.
struct OBChangeCause {
    std::string text; ///< half a sentence, as in "changed: /movies"; empty when an application asked for a load
    platform::Date heardAt {}; ///< by the wall clock
};

/// One publication of a tree.
struct OBPublication {
    OBMediaGroupRef rootMediaGroup {};
    /// What the source scanned for it, in the source's own word; empty for a load, which scans everything.
    std::string part {};
    OBChangeCause cause {};
    platform::Date beganAt {}; ///< when the scan began, by the wall clock
    std::chrono::nanoseconds duration {}; ///< of the scan
};
