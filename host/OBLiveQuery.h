#pragma once

#include "platform/PathWatching.h"

#include <functional>
#include <string_view>

/// Who hears of the result of a live query. The calls come one at a time, on threads of the framework; one that is not
/// set is not made.
struct OBLiveQueryHandlers {
    std::function<void(std::string_view path)> found {}; ///< a file that was there from the start
    std::function<void()> gathered {}; ///< what was there from the start has been told
    std::function<void(std::string_view path)> came {}; ///< a file came into the result, by itself or by its content
    std::function<void(std::string_view path)> went {}; ///< a file left the result
    std::function<void(const platform::WatchingProblem&)> failed {}; ///< some folders are only looked at now and then
};
