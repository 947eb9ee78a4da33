#pragma once

#include "platform/Languages.h"
#include "platform/Movies.h"
#include "platform/common/FileMetadataIndex.h"
#include "platform/common/FilePreferences.h"
#include "platform/common/LinkTable.h"
#include "platform/common/LinkedFileSystem.h"
#include "platform/common/LocalNotificationCenter.h"
#include "platform/linux/LinuxCalendar.h"
#include "platform/linux/LinuxFileSystem.h"
#include "tests/support/FaultyFileSystem.h"
#include "tests/support/LinkedBundles.h"
#include "tests/support/RecordingConsole.h"
#include "tests/support/simulated/SimulatedFileSystem.h"
#include "tests/support/simulated/SimulatedMainLoop.h"
#include "tests/support/simulated/SimulatedPathWatching.h"
#include "tests/support/simulated/SimulatedVolumes.h"

#include <optional>
#include <string>
#include <string_view>

namespace tests {

/// Reads movies whose content is "WIDTHxHEIGHT".
class SimulatedMovies : public platform::Movies {
public:
    explicit SimulatedMovies(const platform::FileSystem& files)
        : _files(files)
    {
    }
    std::optional<platform::MovieHeader> headerOfMovie(
        std::string_view path, platform::PathKnowledge known) const override;

private:
    const platform::FileSystem& _files;
};

/// Whole answers of a file system, in which no other thread changes anything meanwhile.
class UndisturbedFileSystem : public platform::FileSystem {
public:
    explicit UndisturbedFileSystem(const platform::FileSystem& files)
        : _files(files)
    {
    }
    std::optional<std::string> homeFolder() const override { return _files.homeFolder(); }
    platform::FolderListing itemsInFolder(
        std::string_view folder, const platform::ListingRequest& request) const override
    {
        const SimulatedThreads::Undisturbed here;
        return _files.itemsInFolder(folder, request);
    }
    std::optional<platform::ItemStatus> status(std::string_view path) const override
    {
        const SimulatedThreads::Undisturbed here;
        return _files.status(path);
    }
    std::optional<platform::ItemStatus> linkStatus(std::string_view path) const override
    {
        const SimulatedThreads::Undisturbed here;
        return _files.linkStatus(path);
    }
    std::optional<std::string> linkTarget(std::string_view path) const override
    {
        const SimulatedThreads::Undisturbed here;
        return _files.linkTarget(path);
    }
    platform::ItemFlags itemFlags(std::string_view path) const override
    {
        const SimulatedThreads::Undisturbed here;
        return _files.itemFlags(path);
    }
    std::string resolvedPath(std::string_view path) const override
    {
        const SimulatedThreads::Undisturbed here;
        return _files.resolvedPath(path);
    }
    platform::OpenResult openPlainFile(std::string_view path, platform::PathKnowledge known) const override
    {
        const SimulatedThreads::Undisturbed here;
        return _files.openPlainFile(path, known);
    }

private:
    const platform::FileSystem& _files;
};

/// A whole machine in memory whose hours pass in milliseconds: disk, volumes, watching, threads, time and main thread,
/// all of them decided by a seed. Real are only the plug-in's own bundle and the calendar.
class SimulatedMachine {
public:
    /// `linkedEntryPoint` is the C entry point of the plug-in.
    SimulatedMachine(std::uint64_t seed, void* linkedEntryPoint);
    /// Every thread ends while all that it may use is still there.
    ~SimulatedMachine();
    SimulatedMachine(const SimulatedMachine&) = delete;
    SimulatedMachine& operator=(const SimulatedMachine&) = delete;

    platform::Platform platform();

    /// Calls of the disk take their time, and other threads run meanwhile.
    bool diskTakesTime = true;

    struct Volume {
        SimulatedDisk::Item* top;
        std::string mountPoint;
        std::string displayName;
        bool isRemovable = false;
        bool isMounted = false;
    };
    /// Makes a volume that is not mounted, and the folder for it.
    Volume makeVolume(const std::string& mountPoint, const std::string& displayName, bool isRemovable = false);
    void mount(Volume& volume);
    void unmount(Volume& volume);

    Chance chance;
    SimulatedThreads threads { chance, { 1'600'000'000, 0 } };
    SimulatedDisk disk { [this] { return threads.now(); } };
    SimulatedFileSystem bareFiles { disk };
    SimulatedVolumes volumes { threads, chance };
    platform::LinkTable links { {}, volumes, bareFiles };
    platform::LinkedFileSystem linkedFiles { bareFiles, links };
    SimulatedPathWatching pathWatching { threads, chance, disk, linkedFiles };
    UndisturbedFileSystem undisturbedFiles { linkedFiles };
    FaultyFileSystem files { undisturbedFiles };
    ListedWorkspace workspace {};
    SimulatedMovies movies { files };
    platform::FilePreferences preferences { files };
    platform::FileMetadataIndex metadataIndex { files, movies };
    platform::LocalNotificationCenter notifications {};
    platform::LocalNotificationCenter workspaceNotifications {};
    platform::LinuxCalendar calendar {};
    SimulatedMainLoop mainRunLoop { threads };
    RecordingConsole console {};

    /// What the plug-in is told of volumes while it is set, in place of those that are mounted.
    ListedVolumes* toldVolumes = nullptr;

private:
    class ToldVolumes : public platform::Volumes {
    public:
        explicit ToldVolumes(const SimulatedMachine& machine)
            : _machine(machine)
        {
        }
        std::vector<std::string> localVolumes() const override
        {
            const SimulatedThreads::Undisturbed here;
            return told().localVolumes();
        }
        std::vector<std::string> removableMedia() const override
        {
            const SimulatedThreads::Undisturbed here;
            return told().removableMedia();
        }
        std::string displayName(std::string_view path) const override
        {
            const SimulatedThreads::Undisturbed here;
            return told().displayName(path);
        }
        std::optional<std::string> fileSystemType(std::string_view path) const override
        {
            const SimulatedThreads::Undisturbed here;
            return told().fileSystemType(path);
        }
        std::shared_ptr<void> watchMounts(const std::function<void()>& changed) const override
        {
            return _machine.volumes.watchMounts(changed);
        }

    private:
        const ListedVolumes& told() const
        {
            const ListedVolumes& mounted = _machine.volumes;
            return _machine.toldVolumes ? *_machine.toldVolumes : mounted;
        }
        const SimulatedMachine& _machine;
    };
    class NoLanguages : public platform::Languages {
    public:
        std::vector<std::string> preferredLanguages() const override { return {}; }
    };

    void listVolumes(const Volume& changed);

    std::vector<Volume> _mounted {};
    ToldVolumes _toldVolumes { *this };
    platform::LinuxFileSystem _kernel {};
    LinkedBundles _bundles;
    NoLanguages _languages {};
};

} // namespace tests
