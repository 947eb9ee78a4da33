#pragma once

#include "platform/Bundles.h"
#include "platform/Languages.h"
#include "platform/Movies.h"
#include "platform/Preferences.h"
#include "platform/Snapshot.h"
#include "platform/ThreadSafety.h"
#include "platform/Threads.h"
#include "platform/Volumes.h"
#include "platform/Workspace.h"
#include "platform/common/LocalNotificationCenter.h"
#include "platform/linux/LinuxMainRunLoop.h"
#include "tests/support/FaultyFileSystem.h"

#include <chrono>
#include <functional>
#include <map>
#include <optional>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

namespace tests {

// Roles that answer what a test tells them. Hooks are set while no other thread is inside, and are called before the
// answer is given, on the thread that asks; they may block, count, or ask for a cancel.

/// Lines in the order in which they came. Any thread.
class Trace {
public:
    void add(std::string line)
    {
        platform::Locked guard(_lock);
        _lines.push_back(std::move(line));
    }
    std::vector<std::string> lines() const
    {
        platform::Locked guard(_lock);
        return _lines;
    }
    /// Answers the lines so far and forgets them.
    std::vector<std::string> take()
    {
        platform::Locked guard(_lock);
        return std::exchange(_lines, {});
    }

private:
    mutable platform::Mutex _lock;
    std::vector<std::string> _lines GUARDED_BY(_lock);
};

/// Lists every folder in an order of the test's, by name at first, where a real disk's order is anybody's guess.
class ScriptedFileSystem : public FaultyFileSystem {
public:
    using FaultyFileSystem::FaultyFileSystem;

    platform::Snapshot<std::optional<std::string>> home {};
    std::function<bool(std::string_view, std::string_view)> order = std::less<>();
    /// Files that the listing of a folder shows though they are not there, by the folder.
    std::multimap<std::string, std::string, std::less<>> furtherFiles {};

    std::optional<std::string> homeFolder() const override { return home.load(); }
    platform::FolderListing itemsInFolder(
        std::string_view folder, const platform::ListingRequest& request) const override;
};

class ScriptedVolumes : public platform::Volumes {
public:
    struct Volume {
        std::string path;
        std::string displayName;
    };

    platform::Snapshot<std::vector<Volume>> local {};
    platform::Snapshot<std::vector<Volume>> removable {};
    std::function<void()> whenListed {};
    std::function<std::optional<std::string>(std::string_view path)> typeOfPath {};

    std::vector<std::string> localVolumes() const override;
    std::vector<std::string> removableMedia() const override;
    std::string displayName(std::string_view path) const override;
    std::optional<std::string> fileSystemType(std::string_view path) const override
    {
        return typeOfPath ? typeOfPath(path) : "ext4";
    }
};

/// Knows the editor, or nothing.
class ScriptedWorkspace : public platform::Workspace {
public:
    explicit ScriptedWorkspace(Trace& trace)
        : _trace(trace)
    {
    }

    platform::Snapshot<std::optional<std::string>> editor {};
    platform::Snapshot<std::optional<std::string>> iconFile {};
    std::function<void()> whenAsked {};

    std::optional<std::string> applicationPath(std::string_view identifier) const override;
    std::optional<std::string> applicationIconFile(std::string_view applicationPath) const override;
    void launchApplication(std::string_view identifier) override { _trace.add("launches " + std::string(identifier)); }
    void launchProgram(std::string_view path) override { _trace.add("launches the program " + std::string(path)); }
    void revealFile(std::string_view path) override { _trace.add("reveals " + std::string(path)); }
    void observeHandOvers(std::function<void(const platform::HandOver&)>) override { }

private:
    Trace& _trace;
};

/// Preferences of files, save for the domains that a test gives values.
class ScriptedPreferences : public platform::Preferences {
public:
    ScriptedPreferences(const platform::Preferences& real, Trace& trace)
        : _real(real)
        , _trace(trace)
    {
    }

    std::function<void()> whenRead {};

    void set(const std::string& domain, std::string_view key, platform::Value value);

    platform::PreferencesAnswer valuesOfDomain(std::string_view domain) const override;

private:
    const platform::Preferences& _real;
    Trace& _trace;
    mutable platform::Mutex _lock;
    std::map<std::string, platform::Value, std::less<>> _values GUARDED_BY(_lock);
};

/// Real movies, save for those that a test gives a header.
class ScriptedMovies : public platform::Movies {
public:
    explicit ScriptedMovies(const platform::Movies& real)
        : _real(real)
    {
    }

    /// By file name.
    std::map<std::string, platform::MovieHeader, std::less<>> headers {};
    std::function<void(std::string_view path)> whenRead {};
    mutable Trace pathsRead {};

    std::optional<platform::MovieHeader> headerOfMovie(
        std::string_view path, platform::PathKnowledge known) const override;

private:
    const platform::Movies& _real;
};

/// Bundles as they lie on disk; what their code is, the test decides.
class ScriptedBundles : public platform::Bundles {
public:
    ScriptedBundles(platform::Bundles& real, Trace& trace)
        : _real(real)
        , _trace(trace)
    {
    }

    void* linkedEntryPoint = nullptr; ///< in place of the bundle's library, where it is set
    platform::Snapshot<bool> hasPictures { true };

    platform::ManifestAnswer readManifest(std::string_view folder) const override { return _real.readManifest(folder); }
    platform::StringTableAnswer readStringTable(std::string_view folder, std::string_view language) const override
    {
        return _real.readStringTable(folder, language);
    }
    std::optional<platform::ImageResource> imageResource(std::string_view folder, std::string_view name) const override;
    platform::LibraryAnswer loadLibrary(const std::string& path, const char* symbol) override;
    std::string installedPluginsFolder() const override { return "/nowhere"; }

private:
    platform::Bundles& _real;
    Trace& _trace;
};

/// Real threads, and the nice values that they gave themselves.
class RecordingThreads : public platform::Threads {
public:
    explicit RecordingThreads(platform::Threads& real)
        : _real(real)
    {
    }

    Trace niceValues {};

    bool startDetached(const std::string& name, std::function<void()> body) override
    {
        return _real.startDetached(name, std::move(body));
    }
    void setNiceOfCurrentThread(int nice) override { niceValues.add(std::to_string(nice)); }
    std::chrono::nanoseconds processorTimeOfCurrentThread() const override
    {
        return _real.processorTimeOfCurrentThread();
    }

private:
    platform::Threads& _real;
};

/// A main thread whose delayed calls wait until a test lets them fall due.
class HeldMainRunLoop : public platform::LinuxMainRunLoop {
public:
    void performAfterDelay(
        std::chrono::nanoseconds delay, platform::RunLoopModes modes, std::function<void()> call) override
    {
        platform::Locked guard(_delayedLock);
        _delayed.push_back({ delay, modes, std::move(call) });
    }
    /// The calls that wait: "5000 ms in modes 3".
    std::vector<std::string> delayedCalls() const;
    /// Runs them on the main thread and waits.
    void letDelayedCallsFallDue();

private:
    struct Delayed {
        std::chrono::nanoseconds delay;
        platform::RunLoopModes modes;
        std::function<void()> call;
    };

    mutable platform::Mutex _delayedLock;
    std::vector<Delayed> _delayed GUARDED_BY(_delayedLock);
};

/// Records who asks to be notified of what.
class RecordingCenter : public platform::LocalNotificationCenter {
public:
    Trace added {};

    Token addObserver(std::string_view name, const void* object, Handler handler) override
    {
        added.add(std::string(name) + (object ? " of one sender" : " of any sender"));
        return LocalNotificationCenter::addObserver(name, object, std::move(handler));
    }
};

class NoLanguages : public platform::Languages {
public:
    std::vector<std::string> preferredLanguages() const override { return {}; }
};

} // namespace tests
