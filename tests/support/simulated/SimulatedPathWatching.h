#pragma once

#include "platform/FileSystem.h"
#include "platform/PathWatching.h"
#include "tests/support/simulated/SimulatedDisk.h"
#include "tests/support/simulated/SimulatedThreads.h"

#include <memory>
#include <set>
#include <string>
#include <string_view>
#include <vector>

namespace tests {

/// Follows a simulated disk as badly as a real machine may: late, one watched path later than another, twice at times;
/// reports are dropped until it is said of everything that anything may have changed; some paths are polled.
///
/// What is told of one watched path keeps its order. One thread at a time.
class SimulatedPathWatching : public platform::PathWatching {
public:
    /// `files` shows the disk as those do who name the paths. All outlive this object.
    SimulatedPathWatching(
        SimulatedThreads& threads, Chance& chance, const SimulatedDisk& disk, const platform::FileSystem& files);
    ~SimulatedPathWatching() override;

    /// One in so many reports begins a time in which all are dropped; 0 for none.
    std::size_t dropsOneIn = 0;
    /// One in so many watched paths is polled; 0 for none.
    std::size_t pollsOneIn = 0;
    bool somethingIsPolled() const;

    platform::Date timeOfChangesNow() const override { return _threads.now(); }
    std::shared_ptr<void> watch(
        std::string_view path, platform::Date since, platform::PathWatchHandlers handlers) override;
    platform::WatchingState state() const override { return {}; }
    std::unique_ptr<PathWatching> withPathsOf(const platform::FileSystem&, const platform::Volumes&) const override;

    /// The disk has changed.
    void diskChanged(const SimulatedDisk::Change& change);
    /// Something was mounted or unmounted at `path`.
    void mountsChanged(const std::string& path);
    /// Drops what is on its way, and what comes for a while.
    void beginDropping();
    /// Tells the watches of a path of a change at once.
    void tell(std::string_view watchedPath, const platform::PathChange& change);

private:
    struct Root;
    using RootRef = std::shared_ptr<Root>;

    void stand(Root& root);
    bool hasChangedSince(const Root& root) const;
    void takePlace(Root& root) const;
    void lookAtPlaces();
    void tellNewPlace(const RootRef& root, bool wasThere);
    void tellContents(const RootRef& root, const SimulatedDisk::Item& folder, const std::string& path);
    void report(const RootRef& root, platform::PathChange change);
    void deliver(const RootRef& root, platform::PathChange change);
    void poll(const RootRef& root, const platform::PathChange& change);
    void endDropping();
    bool isReachable(const std::string& folder) const;

    SimulatedThreads& _threads;
    Chance& _chance;
    const SimulatedDisk& _disk;
    const platform::FileSystem& _files;
    bool _drops = false;
    platform::Date _mountsChanged {}; // the last time
    const std::shared_ptr<std::vector<RootRef>> _roots = std::make_shared<std::vector<RootRef>>();
};

} // namespace tests
