#pragma once

#include "host/OBLoad.h"
#include "host/OBMediaManager.h"

#include <chrono>
#include <memory>

namespace apps {

/// A tree, and how long the machine needed for it.
struct TreeLoad {
    OBLoadResult result;
    std::chrono::nanoseconds duration {};
};

/// Loads the tree once and waits for it. The calling thread runs the main loop meanwhile, and so is the main thread
/// until this returns; the loop has ended then, and with it the time in which thumbnails can be produced. Progress is
/// told on standard error.
TreeLoad loadTree(const std::shared_ptr<OBMediaManager>& manager);

} // namespace apps
