#pragma once

#include <chrono>
#include <functional>
#include <string>

namespace platform {

/// Starts threads and sets their priority. Any thread.
class Threads {
public:
    virtual ~Threads() = default;

    /// Runs `body` on a new thread that nobody joins, called `name` in debuggers (15 bytes are shown). Its stack is
    /// large enough for a folder tree as deep as a path can be. False when the system gives no thread; `body` has not
    /// run then.
    virtual bool startDetached(const std::string& name, std::function<void()> body) = 0;

    /// Sets the nice value (0 normal to 19 lowest) of the calling thread alone. Where the system refuses, nothing
    /// changes.
    virtual void setNiceOfCurrentThread(int nice) = 0;

    /// How long the calling thread has been on a processor. Compared with the time that has passed, it tells whether
    /// the thread works or waits.
    virtual std::chrono::nanoseconds processorTimeOfCurrentThread() const = 0;
};

} // namespace platform
