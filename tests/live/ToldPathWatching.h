#pragma once

#include "platform/Clock.h"
#include "platform/PathWatching.h"
#include "platform/ThreadSafety.h"

#include <map>
#include <memory>
#include <string>

namespace tests {

/// The watching of a real machine, which a test may keep from going on, and may add to. Any thread.
class ToldPathWatching : public platform::PathWatching {
public:
    /// `real` outlives this object.
    explicit ToldPathWatching(platform::PathWatching& real)
        : _real(real)
    {
    }

    /// Until `goOn`, or for a minute, the watcher's threads stay in the next call that they make.
    void hold();
    void goOn();
    /// Tells whoever watches exactly `watchedPath`.
    void tell(const std::string& watchedPath, const platform::PathChange& change);

    platform::Date timeOfChangesNow() const override { return _real.timeOfChangesNow(); }
    std::shared_ptr<void> watch(
        std::string_view path, platform::Date since, platform::PathWatchHandlers handlers) override;
    platform::WatchingState state() const override { return _real.state(); }
    platform::FollowingMeans meansOfFollowing(std::string_view path) const override
    {
        return _real.meansOfFollowing(path);
    }
    std::optional<platform::WatchingLimits> limits(std::uint64_t furtherWatches) const override
    {
        return _real.limits(furtherWatches);
    }
    std::unique_ptr<platform::PathWatching> withPathsOf(
        const platform::FileSystem& files, const platform::Volumes& volumes) const override
    {
        return _real.withPathsOf(files, volumes);
    }

private:
    using Told = std::function<void(const platform::PathChange&)>;

    void waitWhileHeld() const;

    platform::PathWatching& _real;
    mutable platform::Mutex _lock; // held while a test tells, never while the real watching does
    std::shared_ptr<platform::WakeSignal> _goesOn GUARDED_BY(_lock) {};
    std::map<int, std::pair<std::string, Told>> _told GUARDED_BY(_lock) {};
    int _last GUARDED_BY(_lock) = 0;
};

} // namespace tests
