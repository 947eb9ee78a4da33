#pragma once

#include "platform/Bundles.h"
#include "platform/Languages.h"
#include "platform/MainRunLoop.h"
#include "platform/Platform.h"
#include "platform/Threads.h"
#include "platform/Volumes.h"
#include "platform/Workspace.h"
#include "platform/common/FileMetadataIndex.h"
#include "platform/common/FileMovies.h"
#include "platform/common/FilePreferences.h"
#include "platform/common/LocalNotificationCenter.h"
#include "platform/linux/LinuxCalendar.h"
#include "tests/support/RecordingConsole.h"
#include "tests/support/ScriptedPathWatching.h"
#include "tests/support/VirtualClock.h"

#include <optional>
#include <string>
#include <utility>
#include <vector>

namespace tests {

/// Volumes that a test lists. Not for several threads.
class ListedVolumes : public platform::Volumes {
public:
    struct Volume {
        std::string path;
        std::string displayName;
        std::string type = "ext4";
    };

    std::vector<Volume> local {};
    std::vector<Volume> removable {};
    std::uint64_t currentGeneration = 0;
    mutable int timesListed = 0;

    std::vector<std::string> localVolumes() const override;
    std::vector<std::string> removableMedia() const override;
    std::string displayName(std::string_view path) const override;
    std::optional<std::string> fileSystemType(std::string_view path) const override;
    std::uint64_t generation() const override { return currentGeneration; }
    std::shared_ptr<void> watchMounts(const std::function<void()>& changed) const override;
    /// Calls who watches mounts, on this thread.
    void tellMountsChanged() const;

private:
    mutable std::weak_ptr<const std::function<void()>> _mountsChanged;
};

/// Knows the applications that a test lists.
class ListedWorkspace : public platform::Workspace {
public:
    std::vector<std::pair<std::string, std::string>> applications {}; ///< identifier and path

    std::optional<std::string> applicationPath(std::string_view identifier) const override;
    std::optional<std::string> applicationIconFile(std::string_view) const override { return std::nullopt; }
    void launchApplication(std::string_view) override { }
    void launchProgram(std::string_view) override { }
    void revealFile(std::string_view) override { }
    void observeHandOvers(std::function<void(const platform::HandOver&)>) override { }
};

/// A machine on which nothing is mounted and nothing installed, and whose time stands still, with the files of a file
/// system. Its main loop runs every call at once on the thread that posts it, delayed ones never.
class BareMachine {
public:
    /// `files` outlives this object.
    explicit BareMachine(platform::FileSystem& files);

    platform::Platform platform();

    ListedVolumes volumes {};
    ListedWorkspace workspace {};
    VirtualClock clock {};
    ScriptedPathWatching pathWatching {};
    RecordingConsole console {};
    platform::LocalNotificationCenter notifications {};
    platform::LocalNotificationCenter workspaceNotifications {};

private:
    class ThreadsOfProcess : public platform::Threads {
    public:
        bool startDetached(const std::string& name, std::function<void()> body) override;
        void setNiceOfCurrentThread(int) override { }
        std::chrono::nanoseconds processorTimeOfCurrentThread() const override { return {}; }
    };
    class LoopInPlace : public platform::MainRunLoop {
    public:
        void run() override { }
        void runModal() override { }
        void endModal() override { }
        void quit() override { }
        bool isMainThread() const override { return true; }
        void post(std::function<void()> call) override { call(); }
        bool performAndWait(const std::function<void()>& call) override;
        void performAfterDelay(std::chrono::nanoseconds, platform::RunLoopModes, std::function<void()>) override { }
    };
    class NoBundles : public platform::Bundles {
    public:
        platform::ManifestAnswer readManifest(std::string_view) const override
        {
            return { {}, "there are no bundles" };
        }
        platform::StringTableAnswer readStringTable(std::string_view, std::string_view) const override { return {}; }
        platform::LibraryAnswer loadLibrary(const std::string&, const char*) override { return {}; }
        std::optional<platform::ImageResource> imageResource(std::string_view, std::string_view) const override
        {
            return std::nullopt;
        }
        std::string installedPluginsFolder() const override { return "/nowhere"; }
    };
    class NoLanguages : public platform::Languages {
    public:
        std::vector<std::string> preferredLanguages() const override { return {}; }
    };

    platform::FileSystem& _files;
    platform::FilePreferences _preferences;
    platform::FileMovies _movies;
    platform::FileMetadataIndex _metadataIndex;
    platform::LinuxCalendar _calendar {};
    ThreadsOfProcess _threads {};
    LoopInPlace _mainRunLoop {};
    NoBundles _bundles {};
    NoLanguages _languages {};
};

} // namespace tests
