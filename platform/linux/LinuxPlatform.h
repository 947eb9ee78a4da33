#pragma once

#include "platform/Platform.h"

#include <memory>

namespace platform {

/// This machine: one of each role. Any thread; each role says for itself which threads may call it.
///
/// When it is destroyed, the main run loop and every thread that was started through `threads` have ended
/// (`OBMediaHost::waitForThreads`), and so has whatever uses the roles: hosts, managers, observations, watches. Who
/// cannot wait for that, since a disk may never answer, does not destroy it and ends the process by `std::quick_exit`.
class LinuxPlatform {
public:
    LinuxPlatform();
    ~LinuxPlatform();
    LinuxPlatform(const LinuxPlatform&) = delete;
    LinuxPlatform& operator=(const LinuxPlatform&) = delete;

    /// References to the roles, which live as long as this object.
    Platform platform();

private:
    struct Roles;

    std::unique_ptr<Roles> _roles;
};

} // namespace platform
