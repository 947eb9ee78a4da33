#pragma once

#include "platform/Console.h"
#include "platform/ThreadSafety.h"

namespace platform {

/// Standard error. A line is handed to the system whole, so that lines of several threads and programs do not mix.
class StandardErrorConsole : public Console {
public:
    /// Writes to `descriptor`, which outlives this object.
    explicit StandardErrorConsole(int descriptor = 2);

    void log(std::string_view text) override EXCLUDES(_lock);

private:
    const int _descriptor;
    Mutex _lock; ///< one line at a time, also where the system takes it in pieces
};

} // namespace platform
