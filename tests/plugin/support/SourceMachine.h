#pragma once

#include "host/OBMediaHost.h"
#include "platform/common/FileMetadataIndex.h"
#include "platform/common/FileMovies.h"
#include "platform/common/FilePreferences.h"
#include "platform/common/LinkTable.h"
#include "platform/common/LinkedFileSystem.h"
#include "platform/linux/LinuxBundles.h"
#include "platform/linux/LinuxCalendar.h"
#include "platform/linux/LinuxFileSystem.h"
#include "platform/linux/LinuxMainRunLoop.h"
#include "platform/linux/LinuxThreads.h"
#include "plugin/OBMontaroPlugin.h"
#include "tests/plugin/support/ScriptedRoles.h"
#include "tests/plugin/support/Shown.h"
#include "tests/plugin/support/Stop.h"
#include "tests/support/LibraryBuilder.h"
#include "tests/support/RecordingConsole.h"
#include "tests/support/ScriptedPathWatching.h"
#include "tests/support/TemporaryFolder.h"
#include "tests/support/VirtualClock.h"

#include <future>
#include <memory>
#include <string>
#include <string_view>
#include <thread>
#include <vector>

namespace tests {

/// Which code the source runs: that of its bundle, or the same linked into the test program, whose class tests can
/// name.
enum class SourceCode { linked, bundled };

/// A machine with a host for the source: a real disk, a home on it, the editor installed, nothing mounted; a main
/// thread that runs from construction to destruction.
///
/// On the disk lie `home`, `Volumes` (served at "/Volumes"), and what stands at the top of the boot volume, in `boot`.
class SourceMachine {
public:
    explicit SourceMachine(SourceCode code = SourceCode::linked);
    /// Waits for the host's threads, so that nothing of one test reaches into the next.
    ~SourceMachine();

    /// The project library in the home folder, on disk; the one at the top of the boot volume; one on a volume.
    LibraryBuilder projects() const { return LibraryBuilder(disk.path("home/Movies/Montaro Projects")); }
    LibraryBuilder bootProjects() const { return LibraryBuilder(disk.path("boot/Montaro Projects")); }
    LibraryBuilder volumeProjects(const std::string& name) const;
    /// Dates all that is on the disk, so that records can be compared.
    void dateEverything() const;

    /// A new source. Ends the test program where there is none.
    std::shared_ptr<OBMontaroPlugin> makeSource();
    std::shared_ptr<OBMediaManager> makeManager();
    /// Ends it: waits until it has been torn down. `manager` holds the last reference.
    template <class Manager> void end(std::shared_ptr<Manager>& manager)
    {
        manager = nullptr;
        waitForThreads();
    }
    void waitForThreads();

    /// Runs one load, also where a tree is installed already.
    OBLoadResult load(OBMediaManager& manager);
    /// Asks for the same, and waits for nothing.
    std::future<OBLoadResult> beginLoad(OBMediaManager& manager);
    /// Tells observers that a volume was mounted at `path`, and lets time pass until what they do has ended.
    void tellOfVolume(const char* path);
    /// Runs `call` on the main thread and waits.
    void onMainThread(const std::function<void()>& call);

    /// Records as lines, every field of each, with the folders of the disk abbreviated to PROJECTS (the home's library)
    /// and DISK.
    std::string text(const OBMediaGroupRef& group) const;
    std::string text(const OBMediaGroupList& groups) const;
    std::string text(const OBMediaObjectList& objects) const;
    std::string abbreviated(std::string text) const;
    std::vector<std::string> abbreviated(std::vector<std::string> paths) const;

    struct LogLine {
        std::string message;
        int level = 0;
        const OBMediaManager* sender = nullptr;

        friend bool operator==(const LogLine&, const LogLine&) = default;
    };
    std::vector<LogLine> takeLog();

    TemporaryFolder disk {};
    Trace trace {}; ///< look-ups of the application, pictures and preferences

private:
    platform::LinuxFileSystem _kernel {};
    ScriptedVolumes _noVolumes {}; // links to volumes are the machine's own
    platform::LinkTable _links;
    platform::LinkedFileSystem _linkedFiles { _kernel, _links };

public:
    ScriptedVolumes volumes {};
    ScriptedFileSystem files { _linkedFiles };
    ScriptedWorkspace workspace { trace };
    ScriptedPathWatching pathWatching {};

private:
    platform::FilePreferences _filePreferences { files };
    platform::FileMovies _fileMovies { files };
    platform::LinuxBundles _linuxBundles { _linkedFiles };
    platform::LinuxThreads _linuxThreads {};

public:
    ScriptedPreferences preferences { _filePreferences, trace };
    ScriptedMovies movies { _fileMovies };
    platform::FileMetadataIndex metadataIndex { files, _fileMovies };
    platform::LocalNotificationCenter notifications {};
    RecordingCenter workspaceNotifications {};
    VirtualClock clock {};
    platform::LinuxCalendar calendar {};
    RecordingThreads threads { _linuxThreads };
    HeldMainRunLoop mainRunLoop {};
    RecordingConsole console {};
    ScriptedBundles bundles { _linuxBundles, trace };
    NoLanguages languages {};

private:
    platform::Platform platform();

    mutable platform::Mutex _logLock;
    std::vector<LogLine> _log GUARDED_BY(_logLock);

public:
    std::unique_ptr<OBMediaHost> host;

private:
    std::thread _mainThread;
};

/// A load that waits before it has asked for anything, so that a cancel can be made to stand for as long as a test
/// likes. It cannot be the first load of its machine's source unless a test wants that load cancelled.
class HeldLoad {
public:
    HeldLoad(SourceMachine& machine, OBMediaManager& manager);
    /// Lets the load go on and waits for its end.
    ~HeldLoad();
    HeldLoad(const HeldLoad&) = delete;
    HeldLoad& operator=(const HeldLoad&) = delete;

private:
    SourceMachine& _machine;
    Stop _stop;
    std::future<OBLoadResult> _load;
};

} // namespace tests
