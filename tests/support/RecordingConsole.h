#pragma once

#include "platform/Console.h"
#include "platform/ThreadSafety.h"

#include <string>
#include <vector>

namespace tests {

/// Keeps the lines that were written to the console. Any thread.
class RecordingConsole : public platform::Console {
public:
    void log(std::string_view text) override
    {
        platform::Locked guard(_lock);
        _lines.emplace_back(text);
    }
    std::vector<std::string> lines() const
    {
        platform::Locked guard(_lock);
        return _lines;
    }

private:
    mutable platform::Mutex _lock;
    std::vector<std::string> _lines GUARDED_BY(_lock);
};

} // namespace tests
