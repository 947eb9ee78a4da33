#pragma once

#include "platform/PathWatching.h"
#include "platform/ThreadSafety.h"

#include <cstdint>
#include <map>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

namespace tests {

/// A watching that sees what a test tells it. Any thread.
class ScriptedPathWatching : public platform::PathWatching {
public:
    platform::Date currentTime { 1'600'000'000, 0 };

    platform::Date timeOfChangesNow() const override { return currentTime; }
    std::shared_ptr<void> watch(
        std::string_view path, platform::Date since, platform::PathWatchHandlers handlers) override;
    platform::WatchingState state() const override { return {}; }
    std::unique_ptr<PathWatching> withPathsOf(const platform::FileSystem&, const platform::Volumes&) const override;

    /// Tells every watch of `watchedPath` of a change. Calls the handlers on this thread.
    void tell(std::string_view watchedPath, const platform::PathChange& change);
    /// Tells every watch of `watchedPath` that it stands.
    void tellStanding(std::string_view watchedPath);
    void tellFailure(std::string_view watchedPath, const platform::WatchingProblem& problem);

    /// What is watched now, in the order in which it was asked for.
    std::vector<std::string> watchedPaths() const;
    /// Since when; the epoch where it is not watched.
    platform::Date since(std::string_view watchedPath) const;

private:
    struct Watch {
        std::string path;
        platform::Date since;
        platform::PathWatchHandlers handlers;
    };

    struct Watches {
        platform::Mutex lock;
        std::map<std::uint64_t, std::shared_ptr<const Watch>> watches GUARDED_BY(lock);
        std::uint64_t last GUARDED_BY(lock) = 0;
    };

    std::vector<std::shared_ptr<const Watch>> watchesOf(std::string_view path) const;

    std::shared_ptr<Watches> _watches = std::make_shared<Watches>();
};

} // namespace tests
