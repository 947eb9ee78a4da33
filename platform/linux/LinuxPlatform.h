#pragma once

#include "platform/Platform.h"

#include <memory>

namespace platform {

/// This machine: one of each role.
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
