#pragma once

#include "apps/ombrix/CheckupFacts.h"

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

namespace ombrix {

enum class Severity : std::uint8_t {
    ok, ///< nothing is to be done
    note, ///< to be known, and no fault
    warn, ///< something is not as good as it could be, and a command mends it
    fail, ///< the tree is not right, or there is none
};

/// One thing that a check-up tells.
struct Finding {
    Severity severity = Severity::ok;
    std::string subject {}; ///< one word
    std::string text {}; ///< bytes of paths as they are on disk
    std::string remedy {}; ///< the command that mends it; empty where none does

    friend bool operator==(const Finding&, const Finding&) = default;
};

/// "fail" and so on.
std::string_view textOfSeverity(Severity severity);

/// What the facts mean, subject by subject.
std::vector<Finding> findingsOf(const CheckupFacts& facts);

// The parts of that which look at folders.

void checkLibraries(const CheckupFacts& facts, std::vector<Finding>& findings);
void checkVolumes(const CheckupFacts& facts, std::vector<Finding>& findings);

} // namespace ombrix
