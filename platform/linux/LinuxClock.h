#pragma once

#include "platform/Clock.h"

namespace platform {

/// The kernel's clocks.
class LinuxClock : public Clock {
public:
    Date now() const override;
    std::chrono::nanoseconds monotonic() const override;
    bool sleep(std::chrono::nanoseconds duration, WakeSignal& wake) const override;
};

} // namespace platform
