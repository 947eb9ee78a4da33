#include "tests/host/Waiting.h"

#include <algorithm>
#include <utility>

namespace tests {

void Event::happen()
{
    std::lock_guard guard(_lock);
    _happened = true;
    _changed.notify_all();
}

bool Event::hasHappened() const
{
    std::lock_guard guard(_lock);
    return _happened;
}

bool Event::wait() const
{
    std::unique_lock guard(_lock);
    return _changed.wait_for(guard, longestWait, [this] { return _happened; });
}

void Gate::close()
{
    std::lock_guard guard(_lock);
    _isOpen = false;
}

void Gate::open()
{
    std::lock_guard guard(_lock);
    _isOpen = true;
    _changed.notify_all();
}

void Gate::letOneThrough()
{
    std::lock_guard guard(_lock);
    ++_mayPass;
    _changed.notify_all();
}

void Gate::pass()
{
    std::unique_lock guard(_lock);
    ++_arrivals;
    _changed.notify_all();
    _changed.wait_for(guard, longestWait, [this] { return _isOpen || _mayPass > 0; });
    if (!_isOpen)
        --_mayPass;
}

int Gate::arrivals() const
{
    std::lock_guard guard(_lock);
    return _arrivals;
}

bool Gate::waitForArrivals(int count) const
{
    std::unique_lock guard(_lock);
    return _changed.wait_for(guard, longestWait, [this, count] { return _arrivals >= count; });
}

void Journal::write(std::string line)
{
    std::lock_guard guard(_lock);
    _lines.push_back(std::move(line));
    _changed.notify_all();
}

std::vector<std::string> Journal::lines() const
{
    std::lock_guard guard(_lock);
    return _lines;
}

std::size_t Journal::count(const std::string& line) const
{
    std::lock_guard guard(_lock);
    return static_cast<std::size_t>(std::count(_lines.begin(), _lines.end(), line));
}

bool Journal::waitFor(const std::string& line, std::size_t count) const
{
    std::unique_lock guard(_lock);
    return _changed.wait_for(guard, longestWait,
        [&] { return static_cast<std::size_t>(std::count(_lines.begin(), _lines.end(), line)) >= count; });
}

} // namespace tests
