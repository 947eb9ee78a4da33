#pragma once

#include "tests/plugin/support/EventMachine.h"
#include "tests/plugin/support/RecordText.h"

#include <functional>
#include <memory>
#include <string>
#include <thread>
#include <vector>

namespace tests {

/// Publications as lines "PART: NAMES OF THE ROOT'S CHILDREN", in their order. Any thread.
class Publications {
public:
    void add(const OBPublication& publication)
    {
        const std::lock_guard guard(_lock);
        _lines.push_back(publication.part + ": " + childNames(*publication.rootMediaGroup));
        _changed.notify_all();
    }
    std::vector<std::string> lines() const
    {
        const std::lock_guard guard(_lock);
        return _lines;
    }
    /// False when `line` has not come `count` times within the longest wait.
    bool waitFor(const std::string& line, std::ptrdiff_t count = 1) const
    {
        std::unique_lock guard(_lock);
        return _changed.wait_for(
            guard, longestWait, [&] { return std::count(_lines.begin(), _lines.end(), line) >= count; });
    }

private:
    mutable std::mutex _lock;
    mutable std::condition_variable _changed;
    std::vector<std::string> _lines;
};

/// A machine with one project "First" and one event "Trip", whose source is loaded and followed by an application.
struct FollowedSource : EventMachine {
    FollowedSource()
    {
        projects().project("First");
        clip("Trip", "a.mov", noonOf(2012));
        source = makeSource();
        load(*source);
        observation = source->observe([](const std::function<void()>& call) { call(); },
            { .published = [this](const OBPublication& publication) { published.add(publication); } });
        following = host->followChanges();
    }
    ~FollowedSource()
    {
        for (std::thread& thread : _threads)
            thread.join();
        observation = {};
        source = nullptr;
        following = {};
        waitForThreads();
    }

    std::string projectsFolder() const { return disk.path("home/Movies/Montaro Projects"); }
    std::string eventsFolder() const { return disk.path("home/Movies/Montaro Events"); }

    /// A change that the path watcher tells the source of, on a thread of the framework.
    void change(const std::string& path)
    {
        pathWatching.tell(projectsFolder(), { platform::PathChange::Kind::attributesChanged, true, false, path });
    }
    /// Makes a call on a thread that may sleep.
    void callOnThread(std::function<void()> call) { _threads.emplace_back(std::move(call)); }
    /// False when something of the source is still under way after the longest wait.
    bool comesToRest() const
    {
        const auto end = std::chrono::steady_clock::now() + longestWait;
        while (!source->isAtRest() && std::chrono::steady_clock::now() < end)
            std::this_thread::yield();
        return source->isAtRest();
    }
    /// The events in the tree, in order.
    std::string eventNames() const
    {
        std::string names;
        for (const OBMediaGroupRef& library : source->rootMediaGroup()->childGroups()) {
            if (library->typeIdentifier() != OBMontaroEventLibraryGroupTypeIdentifier)
                continue;
            for (const OBMediaGroupRef& year : library->childGroups())
                names += (names.empty() ? "" : " ") + childNames(*year);
        }
        return names;
    }

    std::shared_ptr<OBMontaroPlugin> source;
    Publications published {};
    OBObservation observation;
    OBObservation following;

private:
    std::vector<std::thread> _threads;
};

} // namespace tests
