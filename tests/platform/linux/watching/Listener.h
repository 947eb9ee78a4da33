#pragma once

#include "platform/PathWatching.h"
#include "platform/ThreadSafety.h"
#include "platform/linux/LinuxClock.h"
#include "platform/linux/LinuxFileSystem.h"
#include "platform/linux/LinuxThreads.h"
#include "platform/linux/LinuxVolumes.h"
#include "platform/linux/watching/LinuxPathWatching.h"
#include "tests/support/TemporaryFolder.h"

#include <doctest/doctest.h>

#include <atomic>
#include <functional>
#include <memory>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

namespace tests {

using Changes = std::vector<std::string>;

/// Hears what is told of one watched path. A change reads "appeared a/b": its kind, and its path from the watched path
/// on; a folder's ends with a slash, the watched path itself is ".". A folder that left with what was in it is "left".
/// Any thread.
class Listener {
public:
    Listener() = default;
    /// Watches, and waits until the watch stands.
    Listener(platform::PathWatching& watching, const std::string& path, platform::Date since);
    Listener(platform::PathWatching& watching, const std::string& path);
    ~Listener();
    Listener(const Listener&) = delete;
    Listener& operator=(const Listener&) = delete;

    /// Watches, and does not wait.
    void begin(platform::PathWatching& watching, const std::string& path, platform::Date since);
    bool waitUntilStanding();
    /// Waits until `change` has been told. False when that does not happen within a minute.
    bool hears(const std::string& change);
    bool hearsFailure();
    /// What has been told up to now, and is not told again by this function.
    Changes take();
    /// What is told until `change` is, without that.
    Changes until(const std::string& change);
    std::vector<platform::WatchingProblem> problems() const;
    /// Runs in the handler, for every change.
    void onChange(std::function<void(const platform::PathChange&)> call);
    /// Ends the watch.
    void end() { _watch.reset(); }

private:
    void note(const platform::PathChange& change);
    std::string textOf(const platform::PathChange& change) const;
    bool waitFor(const std::function<bool()>& isSo) NO_THREAD_SAFETY_ANALYSIS;

    std::string _path {};
    mutable platform::Mutex _lock;
    platform::Condition _changed;
    Changes _changes GUARDED_BY(_lock) {};
    std::vector<platform::WatchingProblem> _problems GUARDED_BY(_lock) {};
    bool _stands GUARDED_BY(_lock) = false;
    std::function<void(const platform::PathChange&)> _onChange GUARDED_BY(_lock) {};
    std::shared_ptr<void> _watch {};
};

/// A disk on which folders are followed, with limits that a test sets before the first watch.
template <class Files> struct FollowedFiles {
    TemporaryFolder disk {};
    Files files {};
    platform::LinuxVolumes volumes { files };
    platform::LinuxClock clock {};
    platform::LinuxThreads threads {};
    platform::LinuxPathWatching watching;

    explicit FollowedFiles(platform::LinuxWatchingLimits limits = {})
        : watching(files, volumes, clock, threads, std::move(limits))
    {
    }
    std::string path(const std::string& relativePath) const { return disk.path(relativePath); }
};

using FollowedDisk = FollowedFiles<platform::LinuxFileSystem>;

/// The files of this machine, which tells how often it was asked where a path leads. Any thread.
class NotedFileSystem : public platform::LinuxFileSystem {
public:
    int resolutions() const { return _resolutions; }
    std::string resolvedPath(std::string_view path) const override
    {
        ++_resolutions;
        return LinuxFileSystem::resolvedPath(path);
    }

private:
    mutable std::atomic<int> _resolutions { 0 };
};

/// What std::rename does, or the test program ends.
void moveItem(const std::string& from, const std::string& to);

/// What is told of the root until a file, made now in the watched folder `root`, has appeared.
Changes changesSoFar(Listener& listener, const std::string& root);

/// Whether files that are made in `folder` from now on, their names beginning with `name`, come to be told of. False
/// when that does not happen within a minute.
bool comesToHear(Listener& listener, const std::string& folder, const std::string& name);

/// A time later than every change.
platform::Date afterEverything();

} // namespace tests

template <> struct doctest::StringMaker<tests::Changes> {
    static String convert(const tests::Changes& changes)
    {
        std::string text;
        for (const std::string& change : changes)
            text += (text.empty() ? "" : ", ") + change;
        return ("{ " + text + " }").c_str();
    }
};
