#include "tests/live/ToldPathWatching.h"

#include <chrono>
#include <utility>

namespace tests {

using platform::Locked;

void ToldPathWatching::hold()
{
    Locked guard(_lock);
    _goesOn = std::make_shared<platform::WakeSignal>();
}

void ToldPathWatching::goOn()
{
    Locked guard(_lock);
    if (_goesOn)
        _goesOn->raise();
    _goesOn = nullptr;
}

void ToldPathWatching::waitWhileHeld() const
{
    std::shared_ptr<platform::WakeSignal> goesOn;
    {
        Locked guard(_lock);
        goesOn = _goesOn;
    }
    if (goesOn)
        goesOn->waitFor(std::chrono::minutes(1));
}

void ToldPathWatching::tell(const std::string& watchedPath, const platform::PathChange& change)
{
    Locked guard(_lock);
    for (const auto& [number, watch] : _told) {
        if (watch.first == watchedPath)
            watch.second(change);
    }
}

std::shared_ptr<void> ToldPathWatching::watch(
    std::string_view path, platform::Date since, platform::PathWatchHandlers handlers)
{
    const Told told = handlers.changed;
    handlers.changed = [this, told](const platform::PathChange& change) {
        waitWhileHeld();
        told(change);
    };
    std::shared_ptr<void> real = _real.watch(path, since, std::move(handlers));
    Locked guard(_lock);
    const int number = ++_last;
    _told.emplace(number, std::pair(std::string(path), told));
    return std::shared_ptr<void>(nullptr, [this, number, real = std::move(real)](void*) mutable {
        real.reset();
        Locked ending(_lock);
        _told.erase(number);
    });
}

} // namespace tests
