#pragma once

#include "host/OBExport.h"
#include "host/OBLiveQuery.h"
#include "host/OBLog.h"
#include "host/OBMediaManager.h"
#include "host/OBMediaManagerClass.h"
#include "platform/Platform.h"

#include <chrono>
#include <functional>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

class OBMetadataQuery;
class PluginLibrary;

/// How an application wants its host.
struct OBHostOptions {
    /// Folders that are searched for bundles, in order, before the installed ones. Of bundles with one identifier the
    /// first that works is used.
    std::vector<std::string> pluginFolders {};
    OBLogSink logSink {};
};

/// A bundle that was found.
struct OBPluginInfo {
    std::string identifier; ///< empty when the manifest cannot be read
    std::string version;
    std::string path; ///< the bundle's folder
    bool loaded = false;
    std::string reason; ///< why it is refused, one line; empty when it is not
    std::string flaw {}; ///< what is amiss in one that is used all the same, one line: texts that cannot be read
};

/// A manager, or why there is none.
struct OBManagerResult {
    std::shared_ptr<OBMediaManager> manager;
    std::string problem; ///< one line that names the plug-in
};

/// An application's host: finds plug-ins and makes their managers. One at a time in a process. Any thread, also several
/// at once; whoever asks about plug-ins waits while another call loads a plug-in's code.
///
/// The main thread is the one that runs the platform's main run loop, `mainRunLoop.run()`, which may be a thread of its
/// own. Until somebody runs it nothing is delivered there, and loads that need that thread for a moment wait for it.
///
/// The manager that it hands out ends when the application has dropped the last reference to it. The host may be
/// destroyed while threads of its managers still run; the platform has to outlive them.
class OB_EXPORT OBMediaHost {
public:
    OBMediaHost(const platform::Platform& platform, OBHostOptions options);
    ~OBMediaHost();
    OBMediaHost(const OBMediaHost&) = delete;
    OBMediaHost& operator=(const OBMediaHost&) = delete;

    /// The bundles found, in the order found. Only their manifests have been read, unless their code was needed since.
    std::vector<OBPluginInfo> plugins();
    /// Loads every bundle and makes a manager of each to see that it can be made. Slow; for `plugins` and its like.
    std::vector<OBPluginInfo> tryAllPlugins();

    /// The class of a plug-in, loaded if need be, which blocks; null with the problem in `plugins` when it is refused.
    /// Lives as long as the process.
    const OBMediaManagerClass* managerClass(std::string_view identifier);
    /// A new manager of the plug-in called `identifier`. Blocks: it loads the plug-in's code if need be, and makes the
    /// manager and calls its `init` on the calling thread.
    OBManagerResult createManager(std::string_view identifier);

    /// Follows what managers have registered, and volumes that are mounted, until the answer is dropped. The options
    /// of whoever follows first count while anybody does. Whoever follows before the first load misses nothing; volumes
    /// that are mounted between a load and this are not told of. Not to be called, nor its answer dropped, by
    /// who is told of a volume.
    [[nodiscard]] OBObservation followChanges(const OBFollowOptions& options = {});
    /// Follows the files at and below the folders of `scope` that match `query`, whether or not changes are followed
    /// otherwise.
    [[nodiscard]] OBObservation followQuery(const std::shared_ptr<const OBMetadataQuery>& query,
        const std::vector<std::string>& scope, OBLiveQueryHandlers handlers);

    /// The framework's watcher, to see what is registered.
    OBPathWatcher& pathWatcher();
    /// How many threads the framework has started for managers that still run.
    std::size_t threadCount() const;
    /// Waits until none runs; false when `limit` has passed before. Not needed to end a process, and not to be called
    /// on one of them.
    bool waitForThreads(std::chrono::nanoseconds limit);

private:
    const std::shared_ptr<FrameworkCore> _core;
    const std::unique_ptr<PluginLibrary> _plugins;
};
