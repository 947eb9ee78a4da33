#pragma once

#include "tests/support/Turns.h"

#include <condition_variable>
#include <cstddef>
#include <functional>
#include <mutex>
#include <string>
#include <vector>

namespace tests {

/// Something that happens once. Any thread.
class Event {
public:
    void happen();
    bool hasHappened() const;
    /// False when it has not happened within the longest wait.
    bool wait() const;

private:
    mutable std::mutex _lock;
    mutable std::condition_variable _changed;
    bool _happened = false; // under _lock
};

/// Holds threads that come to it while it is closed. Any thread.
class Gate {
public:
    void close();
    void open();
    /// Lets one thread through that is held, or else the next that comes.
    void letOneThrough();
    /// Comes to the gate: counted, and held until it may go on.
    void pass();
    /// How many have come so far.
    int arrivals() const;
    /// False when fewer than `count` have come within the longest wait.
    bool waitForArrivals(int count) const;

private:
    mutable std::mutex _lock;
    mutable std::condition_variable _changed;
    bool _isOpen = true; // under _lock, like what follows
    int _mayPass = 0;
    int _arrivals = 0;
};

/// Lines in the order in which any thread wrote them.
class Journal {
public:
    void write(std::string line);
    std::vector<std::string> lines() const;
    std::size_t count(const std::string& line) const;
    /// False when `line` has not been written `count` times within the longest wait.
    bool waitFor(const std::string& line, std::size_t count = 1) const;

private:
    mutable std::mutex _lock;
    mutable std::condition_variable _changed;
    std::vector<std::string> _lines; // under _lock
};

} // namespace tests
