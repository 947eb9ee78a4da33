#pragma once

#include "host/OBMediaManagerClass.h"
#include "platform/Bundles.h"
#include "platform/Languages.h"
#include "platform/MetadataIndex.h"
#include "platform/Movies.h"
#include "platform/Platform.h"
#include "platform/Preferences.h"
#include "platform/Threads.h"
#include "platform/common/FileMovies.h"
#include "platform/linux/LinuxFileSystem.h"
#include "platform/linux/LinuxMainRunLoop.h"
#include "platform/linux/LinuxThreads.h"
#include "tests/support/BareMachine.h"
#include "tests/support/FaultyFileSystem.h"
#include "tests/support/TemporaryFolder.h"

#include <atomic>
#include <functional>
#include <map>
#include <mutex>
#include <string>
#include <thread>
#include <vector>

namespace tests {

/// A bundle whose parts a test makes up; only its folder is on disk.
struct MadeUpBundle {
    platform::BundleManifest manifest {};
    std::string manifestProblem {};
    OBPluginEntryPoint entryPoint = nullptr;
    std::string libraryProblem {};
    std::map<std::string, platform::StringTableAnswer, std::less<>> tables {}; ///< by language
    std::map<std::string, platform::Size, std::less<>> pictures {}; ///< by name
};

/// Bundles by their folders. Set up before other threads come in.
class MadeUpBundles : public platform::Bundles {
public:
    std::map<std::string, MadeUpBundle, std::less<>> bundles {};
    std::string installedFolder = "/nowhere";
    std::vector<std::string> manifestsRead() const;
    std::vector<std::string> librariesLoaded() const;

    platform::ManifestAnswer readManifest(std::string_view folder) const override;
    platform::StringTableAnswer readStringTable(std::string_view folder, std::string_view language) const override;
    std::optional<platform::ImageResource> imageResource(std::string_view folder, std::string_view name) const override;
    platform::LibraryAnswer loadLibrary(const std::string& path, const char* symbol) override;
    std::string installedPluginsFolder() const override { return installedFolder; }

private:
    mutable std::mutex _lock;
    mutable std::vector<std::string> _manifestsRead; // under _lock
    std::vector<std::string> _librariesLoaded; // under _lock
};

/// The real threads, with a record of the nice values that were set. May be told to refuse.
class RecordingThreads : public platform::Threads {
public:
    std::atomic<bool> refuses { false };
    std::atomic<std::chrono::nanoseconds> processorTime {}; ///< of every thread
    std::vector<int> niceValues() const;
    std::vector<std::string> started() const;

    bool startDetached(const std::string& name, std::function<void()> body) override;
    void setNiceOfCurrentThread(int nice) override;
    std::chrono::nanoseconds processorTimeOfCurrentThread() const override { return processorTime.load(); }

private:
    platform::LinuxThreads _threads {};
    mutable std::mutex _lock;
    std::vector<int> _niceValues; // under _lock
    std::vector<std::string> _started; // under _lock
};

/// Preferences that a test lists, by domain.
class ListedPreferences : public platform::Preferences {
public:
    std::map<std::string, platform::PreferencesAnswer, std::less<>> domains {};
    platform::PreferencesAnswer valuesOfDomain(std::string_view domain) const override;
};

/// An index that knows a file's path and how often it was asked.
class CountingIndex : public platform::MetadataIndex {
public:
    int timesAsked() const { return _timesAsked; }
    platform::Value attributesOfFile(std::string_view path) const override;

private:
    mutable std::atomic<int> _timesAsked { 0 };
};

/// Real movies, with a record of which were read and on which threads.
class CountingMovies : public platform::Movies {
public:
    explicit CountingMovies(const platform::FileSystem& files)
        : _movies(files)
    {
    }
    std::vector<std::string> read() const;
    std::vector<std::thread::id> threads() const;
    std::optional<platform::MovieHeader> headerOfMovie(
        std::string_view path, platform::PathKnowledge known = platform::PathKnowledge::none) const override;

private:
    platform::FileMovies _movies;
    mutable std::mutex _lock;
    mutable std::vector<std::string> _read; // under _lock
    mutable std::vector<std::thread::id> _threads; // under _lock
};

class ListedLanguages : public platform::Languages {
public:
    std::vector<std::string> languages {};
    std::vector<std::string> preferredLanguages() const override { return languages; }
};

/// A machine with real files in a folder of its own, real threads and a real main thread; time stands still, and
/// bundles, preferences and languages are what a test says.
class HostMachine {
public:
    HostMachine();
    ~HostMachine();
    HostMachine(const HostMachine&) = delete;
    HostMachine& operator=(const HostMachine&) = delete;

    platform::Platform platform();

    /// Makes the folder of a bundle and a manifest that this host takes; `relativePath` ends in ".obplugin".
    MadeUpBundle& addBundle(std::string_view relativePath, const std::string& identifier);
    /// The thread that runs the main loop.
    std::thread::id mainThread() const;
    /// Ends the main loop and waits until it has ended.
    void endMainLoop();

    TemporaryFolder folder {};
    platform::LinuxFileSystem disk {};
    FaultyFileSystem files { disk };
    BareMachine bare { files };
    MadeUpBundles bundles {};
    RecordingThreads threads {};
    ListedPreferences preferences {};
    CountingIndex metadataIndex {};
    CountingMovies movies { files };
    ListedLanguages languages {};
    platform::LinuxMainRunLoop mainRunLoop {};

private:
    std::thread _mainThread;
    std::thread::id _mainThreadID;
};

} // namespace tests
