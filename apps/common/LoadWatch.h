#pragma once

#include "host/OBMediaManager.h"
#include "platform/Platform.h"

#include <chrono>
#include <functional>
#include <memory>
#include <string>
#include <string_view>

namespace apps {

/// Work that may take long, and how far it has come.
struct WatchedWork {
    const platform::Platform& platform; ///< outlives the thread that tells
    std::function<OBLoadProgress()> progress; ///< any thread
    std::string_view item = "clip"; ///< what one of the items found is called
};

/// While it lives, tells on standard error how far a load, or other work, has come: on a terminal one line from 300 ms
/// on, ten times a second; wherever standard error goes, which disk has kept the load waiting for 3 seconds.
///
/// Has a thread of its own, since every other thread may wait for that disk.
class LoadWatch {
public:
    explicit LoadWatch(const std::shared_ptr<OBMediaManager>& manager);
    explicit LoadWatch(WatchedWork work);
    /// Erases the line. The thread ends by itself soon.
    ~LoadWatch();
    LoadWatch(const LoadWatch&) = delete;
    LoadWatch& operator=(const LoadWatch&) = delete;

private:
    struct Watching;
    const std::shared_ptr<Watching> _watching;
};

/// What a person calls the place of `path`: the name of the volume it lies on, or, on the system's own, of its folder.
/// Asks no disk that may not answer.
std::string nameOfPlace(const platform::Platform& platform, std::string_view path);

/// The line of progress, in at most `columns` columns.
std::string progressLine(const OBLoadProgress& progress, std::string_view place, std::chrono::nanoseconds elapsed,
    int columns, std::string_view item = "clip");
/// The one that takes its place while a disk keeps the load waiting.
std::string waitingProgress(
    const OBLoadProgress& progress, std::string_view place, std::chrono::nanoseconds waited, int columns);

} // namespace apps
