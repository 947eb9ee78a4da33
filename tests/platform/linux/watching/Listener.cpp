#include "tests/platform/linux/watching/Listener.h"

#include "platform/PathText.h"

#include <algorithm>
#include <array>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <limits>
#include <thread>
#include <utility>

using platform::Locked;
using platform::PathChange;

namespace tests {

namespace {

    std::string nameOf(PathChange::Kind kind)
    {
        constexpr std::array<const char*, 8> names { "appeared", "disappeared", "found", "contentChanged",
            "arrivalEnded", "attributesChanged", "folderChanged", "anythingChanged" };
        return names[static_cast<std::size_t>(kind)];
    }

} // namespace

Listener::Listener(platform::PathWatching& watching, const std::string& path, platform::Date since)
{
    begin(watching, path, since);
    waitUntilStanding();
}

Listener::Listener(platform::PathWatching& watching, const std::string& path)
    : Listener(watching, path, afterEverything())
{
}

Listener::~Listener() = default;

void Listener::begin(platform::PathWatching& watching, const std::string& path, platform::Date since)
{
    _path = path;
    platform::PathWatchHandlers handlers;
    handlers.changed = [this](const PathChange& change) { note(change); };
    handlers.stands = [this] {
        Locked guard(_lock);
        _stands = true;
        _changed.notifyAll();
    };
    handlers.failed = [this](const platform::WatchingProblem& problem) {
        Locked guard(_lock);
        _problems.push_back(problem);
        _changed.notifyAll();
    };
    _watch = watching.watch(path, since, std::move(handlers));
}

void Listener::note(const PathChange& change)
{
    std::function<void(const PathChange&)> call;
    {
        Locked guard(_lock);
        _changes.push_back(textOf(change));
        _changed.notifyAll();
        call = _onChange;
    }
    if (call)
        call(change);
}

std::string Listener::textOf(const PathChange& change) const
{
    const bool isBelow = platform::isSameOrBelow(change.path, _path);
    const std::string below(isBelow ? platform::pathRelativeTo(change.path, _path) : change.path);
    const std::string kind = change.heldMore ? "left" : nameOf(change.kind);
    return kind + ' ' + (below.empty() ? "." : below + (change.isFolder ? "/" : ""));
}

bool Listener::waitFor(const std::function<bool()>& isSo)
{
    const auto end = std::chrono::steady_clock::now() + std::chrono::minutes(1);
    Locked guard(_lock);
    while (!isSo() && std::chrono::steady_clock::now() < end)
        _changed.waitUntil(_lock, end);
    return isSo();
}

bool Listener::waitUntilStanding()
{
    return waitFor([this]() REQUIRES(_lock) { return _stands; });
}

bool Listener::hears(const std::string& change)
{
    return waitFor(
        [&]() REQUIRES(_lock) { return std::find(_changes.begin(), _changes.end(), change) != _changes.end(); });
}

bool Listener::hearsFailure()
{
    return waitFor([this]() REQUIRES(_lock) { return !_problems.empty(); });
}

Changes Listener::take()
{
    Locked guard(_lock);
    return std::exchange(_changes, {});
}

Changes Listener::until(const std::string& change)
{
    if (!hears(change))
        return { "nobody told of: " + change };
    Locked guard(_lock);
    const auto last = std::find(_changes.begin(), _changes.end(), change);
    Changes before(_changes.begin(), last);
    _changes.erase(_changes.begin(), last + 1);
    return before;
}

std::vector<platform::WatchingProblem> Listener::problems() const
{
    Locked guard(_lock);
    return _problems;
}

void Listener::onChange(std::function<void(const PathChange&)> call)
{
    Locked guard(_lock);
    _onChange = std::move(call);
}

void moveItem(const std::string& from, const std::string& to)
{
    if (std::rename(from.c_str(), to.c_str()) == 0)
        return;
    std::perror(from.c_str());
    std::abort();
}

Changes changesSoFar(Listener& listener, const std::string& root)
{
    static int count = 0;
    const std::string name = "marker " + std::to_string(++count);
    makeLink(root + '/' + name, "nowhere");
    return listener.until("appeared " + name);
}

bool comesToHear(Listener& listener, const std::string& folder, const std::string& name)
{
    const auto end = std::chrono::steady_clock::now() + std::chrono::minutes(1);
    for (int number = 0; std::chrono::steady_clock::now() < end; ++number) {
        writeFile(platform::pathJoined(folder, name + std::to_string(number)), "x");
        const Changes told = listener.take();
        const auto isOfFile = [&](const std::string& change) { return change.starts_with("arrivalEnded " + name); };
        if (std::any_of(told.begin(), told.end(), isOfFile))
            return true;
        std::this_thread::yield();
    }
    return false;
}

platform::Date afterEverything()
{
    return { std::numeric_limits<std::int64_t>::max() / 2, 0 };
}

} // namespace tests
