#pragma once

#include "platform/ThreadSafety.h"

#include <memory>
#include <string>
#include <vector>

class FrameworkCore;

/// Posts one notification on the workspace's centre for each volume that was mounted, while changes are followed.
class VolumeNotices {
public:
    /// `core` owns this object.
    explicit VolumeNotices(FrameworkCore& core)
        : _core(core)
    {
    }

    void start();
    void stop();

private:
    void mountsChanged();

    FrameworkCore& _core;
    platform::Mutex _lock; // taken by one look at the volumes at a time
    std::vector<std::string> _mounted GUARDED_BY(_lock);
    std::shared_ptr<void> _watch;
};
