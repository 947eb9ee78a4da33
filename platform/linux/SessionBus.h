#pragma once

#include <chrono>
#include <string>

namespace platform {

/// How a call on the session bus ended.
struct BusAnswer {
    std::string problem {}; ///< empty when the service has answered
    bool mayStillHappen = false; ///< the bus has taken the call, and the service has not answered in time
};

// Calls on the desktop's session bus (D-Bus Specification 0.38), made and awaited for `limit` at most, whatever the bus
// or the service does. Blocks, on any thread.

/// Asks the desktop's file manager to show the item of a URI, selected (org.freedesktop.FileManager1).
BusAnswer showItemOnBus(const std::string& uri, std::chrono::milliseconds limit);

/// Asks the application registered under `identifier` to show itself (org.freedesktop.Application).
BusAnswer activateApplicationOnBus(const std::string& identifier, std::chrono::milliseconds limit);

} // namespace platform
