#pragma once

#include "apps/ombrix/VerifyExceptions.h"

#include <string>
#include <vector>

namespace ombrix {

/// What came of comparing a tree that was followed with one that was loaded afresh.
struct Verification {
    std::vector<std::string> differences {}; ///< that nothing explains, one line each
    std::vector<std::string> notes {}; ///< differences that a followed tree cannot but have, and why
    std::string problem {}; ///< why nothing could be compared; empty when it was
    std::size_t groups = 0; ///< in the followed tree, the root included
    std::size_t movies = 0; ///< in all groups but the root, whose movies are theirs
};

/// Compares two trees that were printed as JSON. `files` is asked about places at which they differ.
Verification compareTrees(
    std::string followed, std::string fresh, const FollowedSource& source, const platform::FileSystem& files);

} // namespace ombrix
