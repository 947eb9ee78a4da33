#pragma once

#include <chrono>
#include <string>

namespace platform {

/// A call on the desktop's session bus (D-Bus Specification 0.38), made and awaited for `limit` at most, whatever the
/// bus or the service does. Answers why it failed; empty when the service has answered. Blocks, on any thread.

/// Asks the desktop's file manager to show the item of a URI, selected (org.freedesktop.FileManager1).
std::string showItemOnBus(const std::string& uri, std::chrono::milliseconds limit);

/// Asks the application registered under `identifier` to show itself (org.freedesktop.Application).
std::string activateApplicationOnBus(const std::string& identifier, std::chrono::milliseconds limit);

} // namespace platform
