#pragma once

#include "platform/common/FileMetadataIndex.h"
#include "platform/common/FileMovies.h"
#include "platform/common/FilePreferences.h"
#include "platform/common/LinkTable.h"
#include "platform/common/LinkedFileSystem.h"
#include "platform/common/LocalNotificationCenter.h"
#include "platform/linux/LinuxCalendar.h"
#include "platform/linux/LinuxClock.h"
#include "platform/linux/LinuxFileSystem.h"
#include "platform/linux/LinuxLanguages.h"
#include "platform/linux/LinuxMainRunLoop.h"
#include "platform/linux/LinuxThreads.h"
#include "platform/linux/LinuxVolumes.h"
#include "platform/linux/watching/LinuxPathWatching.h"
#include "tests/live/LiveMachine.h"
#include "tests/live/RealDisk.h"
#include "tests/live/ToldPathWatching.h"
#include "tests/support/FaultyFileSystem.h"
#include "tests/support/LinkedBundles.h"
#include "tests/support/RecordingConsole.h"
#include "tests/support/TemporaryFolder.h"

#include <cstdint>
#include <map>
#include <mutex>
#include <thread>

namespace tests {

/// Volumes that a test lists, and mounts that the kernel tells of. Any thread.
class RealVolumes : public platform::Volumes {
public:
    /// `mounts` outlives this object.
    explicit RealVolumes(const platform::Volumes& mounts)
        : _mounts(mounts)
    {
    }

    void list(const ListedVolumes& volumes);

    std::vector<std::string> localVolumes() const override;
    std::vector<std::string> removableMedia() const override;
    std::string displayName(std::string_view path) const override;
    std::optional<std::string> fileSystemType(std::string_view path) const override;
    std::uint64_t generation() const override;
    std::shared_ptr<void> watchMounts(const std::function<void()>& changed) const override
    {
        return _mounts.watchMounts(changed);
    }

private:
    const platform::Volumes& _mounts;
    mutable std::mutex _lock;
    ListedVolumes _listed {};
    std::uint64_t _timesListed = 0;
};

/// This machine as one on which a tree is left open: real files, reports, mounts, threads and delays. Its disks lie
/// below a temporary folder. One in a process, which has one thread and mounts of its own, where volumes are to be
/// mounted.
class RealLiveMachine : public LiveMachine {
public:
    /// `linkedEntryPoint` is the C entry point of the plug-in.
    RealLiveMachine(std::uint64_t seed, void* linkedEntryPoint, bool mayMount);
    ~RealLiveMachine() override;

    platform::Platform platform() override;
    LiveDisk& disk() override { return _disk; }
    Chance& chance() override { return _chance; }
    std::string spelled(const std::string& path) const override { return _disk.systemPath(path); }

    void makeVolume(const Volume& volume) override;
    bool mount(Volume& volume) override;
    bool unmount(Volume& volume) override;
    void tellVolumes(const ListedVolumes* told) override;

    void drawWatching() override { }
    bool somethingIsPolled() const override { return _kernelWatching.state().polledFolders != 0; }
    void dropReports() override;
    void tell(const std::string& watchedPath, const platform::PathChange& change) override;
    void setWhenListing(std::function<platform::FileProblem(std::string_view)> whenListing) override;

    void perform(const std::function<void()>& body) override { body(); }
    void pause(std::chrono::nanoseconds duration) override;
    void pauseBetweenOperations() override;
    void after(std::chrono::nanoseconds delay, std::function<void()> call) override;
    void waitUntilQuiet(const std::function<bool()>& isAtRest) override;
    void waitUntil(const std::function<bool()>& condition) override;
    void end() override;

    void alone(const std::function<void()>& call) override;
    std::chrono::nanoseconds passed() const override { return _clock.monotonic() - _start; }

private:
    void sleep(std::chrono::nanoseconds duration) const;
    void makeCalls(std::chrono::nanoseconds until);
    void delayCall();
    void listVolumes();

    const bool _mayMount;
    Chance _chance;
    const TemporaryFolder _top {};
    const TemporaryFolder _stores {}; ///< what is on the volumes, mounted or not
    RealDisk _disk { _top.path() };
    platform::LinuxClock _clock {};
    const std::chrono::nanoseconds _start { _clock.monotonic() };
    mutable platform::WakeSignal _never {};
    std::multimap<std::chrono::nanoseconds, std::function<void()>> _calls {};
    std::recursive_mutex _lock {};
    Chance _delays;

    platform::LinuxFileSystem _realFiles {};
    platform::LinuxVolumes _mounts { _realFiles };
    RealVolumes _mounted { _mounts };
    RealVolumes _told { _mounts };
    platform::LinkTable _links;
    platform::LinkedFileSystem _linkedFiles { _realFiles, _links };
    FaultyFileSystem _files { _linkedFiles };
    platform::LinuxThreads _threads {};
    platform::LinuxPathWatching _kernelWatching;
    ToldPathWatching _pathWatching { _kernelWatching };
    ListedWorkspace _workspace {};
    platform::FileMovies _movies { _files };
    platform::FilePreferences _preferences { _files };
    platform::FileMetadataIndex _metadataIndex { _files, _movies };
    platform::LocalNotificationCenter _notifications {};
    platform::LocalNotificationCenter _workspaceNotifications {};
    platform::LinuxCalendar _calendar {};
    platform::LinuxMainRunLoop _mainRunLoop {};
    platform::LinuxLanguages _languages {};
    RecordingConsole _console {};
    LinkedBundles _bundles;
    std::thread _mainThread {};
};

} // namespace tests
