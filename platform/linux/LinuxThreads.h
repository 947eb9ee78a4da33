#pragma once

#include "platform/Threads.h"

namespace platform {

/// POSIX threads with stacks of 64 MiB, of which the kernel provides what is used.
class LinuxThreads : public Threads {
public:
    bool startDetached(const std::string& name, std::function<void()> body) override;
    void setNiceOfCurrentThread(int nice) override;
    std::chrono::nanoseconds processorTimeOfCurrentThread() const override;
};

} // namespace platform
