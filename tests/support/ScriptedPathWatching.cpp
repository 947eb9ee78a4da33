#include "tests/support/ScriptedPathWatching.h"

#include "platform/common/StillPaths.h"

#include <utility>

using platform::Locked;

namespace tests {

std::shared_ptr<void> ScriptedPathWatching::watch(
    std::string_view path, platform::Date since, platform::PathWatchHandlers handlers)
{
    auto watch = std::make_shared<const Watch>(Watch { std::string(path), since, std::move(handlers) });
    Locked guard(_watches->lock);
    const std::uint64_t number = ++_watches->last;
    _watches->watches.emplace(number, std::move(watch));
    return std::shared_ptr<void>(nullptr, [watches = _watches, number](void*) {
        Locked takingBack(watches->lock);
        watches->watches.erase(number);
    });
}

std::unique_ptr<platform::PathWatching> ScriptedPathWatching::withPathsOf(
    const platform::FileSystem&, const platform::Volumes&) const
{
    return std::make_unique<platform::StillPaths>();
}

void ScriptedPathWatching::tell(std::string_view watchedPath, const platform::PathChange& change)
{
    for (const auto& watch : watchesOf(watchedPath))
        watch->handlers.changed(change);
}

void ScriptedPathWatching::tellStanding(std::string_view watchedPath)
{
    for (const auto& watch : watchesOf(watchedPath)) {
        if (watch->handlers.stands)
            watch->handlers.stands();
    }
}

void ScriptedPathWatching::tellFailure(std::string_view watchedPath, const platform::WatchingProblem& problem)
{
    for (const auto& watch : watchesOf(watchedPath)) {
        if (watch->handlers.failed)
            watch->handlers.failed(problem);
    }
}

std::vector<std::string> ScriptedPathWatching::watchedPaths() const
{
    Locked guard(_watches->lock);
    std::vector<std::string> paths;
    for (const auto& [number, watch] : _watches->watches)
        paths.push_back(watch->path);
    return paths;
}

platform::Date ScriptedPathWatching::since(std::string_view watchedPath) const
{
    const auto watches = watchesOf(watchedPath);
    return watches.empty() ? platform::Date {} : watches.front()->since;
}

std::vector<std::shared_ptr<const ScriptedPathWatching::Watch>> ScriptedPathWatching::watchesOf(
    std::string_view path) const
{
    Locked guard(_watches->lock);
    std::vector<std::shared_ptr<const Watch>> found;
    for (const auto& [number, watch] : _watches->watches) {
        if (watch->path == path)
            found.push_back(watch);
    }
    return found;
}

} // namespace tests
