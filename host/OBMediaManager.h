#pragma once

#include "host/OBBundle.h"
#include "host/OBExecutor.h"
#include "host/OBExport.h"
#include "host/OBLoad.h"
#include "host/OBMediaGroup.h"
#include "host/OBMenu.h"
#include "host/OBPathWatcher.h"
#include "host/OBScanObserver.h"
#include "platform/FileSystem.h"
#include "platform/MainRunLoop.h"
#include "platform/Notifications.h"
#include "platform/Platform.h"

#include <chrono>
#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace platform {
class Pasteboard;
}

class FrameworkCore;
class OBMediaManagerClass;
class OBSourceInspection;
struct ManagerState;

/// What a manager is made with. Handed through by a plug-in's `alloc`; made by the framework alone.
class OBManagerContext {
public:
    OBManagerContext(std::shared_ptr<FrameworkCore> core, std::shared_ptr<const OBBundle> bundle)
        : _core(std::move(core))
        , _bundle(std::move(bundle))
    {
    }

private:
    friend class OBMediaManager;
    friend struct ManagerState;
    std::shared_ptr<FrameworkCore> _core;
    std::shared_ptr<const OBBundle> _bundle;
};

/// Declares that a class is a complete source plug-in. Asks for no operation, and the framework does not look for it.
class OBMediaManagerPlugin_MustImplement {
protected:
    ~OBMediaManagerPlugin_MustImplement() = default;
};

/// Takes back what it stands for when it is destroyed. A call that has already begun may still be running then, unless
/// it is destroyed on the thread on which the executor runs calls.
class OB_EXPORT OBObservation {
public:
    OBObservation() = default;
    explicit OBObservation(std::shared_ptr<void> registration)
        : _registration(std::move(registration))
    {
    }

private:
    std::shared_ptr<void> _registration;
};

/// One source of media: the base class of every source plug-in, and what an application drives it by.
///
/// Contents: what a plug-in overrides (identity, loading, messages); the services it calls on itself; what an
/// application calls. The framework makes a manager through its plug-in's class, calls `init`, and hands it out; when
/// the application has dropped its last reference the manager ends: registrations are taken back, sleeps end, a cancel
/// is pending, and `dealloc` runs when the last call in flight has returned. Nobody waits for that.
class OB_EXPORT OBMediaManager : public OBPathWatcherObserver, public std::enable_shared_from_this<OBMediaManager> {
public:
    explicit OBMediaManager(const OBManagerContext& context);
    ~OBMediaManager() override;
    OBMediaManager(const OBMediaManager&) = delete;
    OBMediaManager& operator=(const OBMediaManager&) = delete;

    // What a plug-in overrides. `init` is called once, by the framework, before anything else; false hands out nothing.
    // An override calls the base first in `init`, last in `dealloc`.

    // `init` is called on the thread that asks for the manager, which waits; `dealloc` on the one that returns last.

    virtual bool init();
    virtual void dealloc();

    // Loading: on the load thread, one load at a time; `canLoadData` on any other thread as well, also meanwhile.

    /// Starts a load and answers at once. The framework calls it on the load thread, where the base operation runs the
    /// load itself.
    virtual void loadData();
    /// Builds a new tree; the framework installs it. Null leaves what is installed.
    virtual OBMediaGroupRef performLoadData();
    /// The framework has installed what `performLoadData` answered, and the load has not ended: what reloads put into
    /// the tree before this one can be put into this one now.
    virtual void rootMediaGroupInstalled(const OBMediaGroupRef& root);
    /// Whether a load can produce anything now.
    virtual bool canLoadData();

    // Lists, identity, application, messages and menus: on any thread, several at once, also while a scan runs.

    /// All groups that hold media, as a flat list.
    virtual OBMediaGroupList mediaGroups();
    virtual OBMediaGroupList movieGroups();

    /// What people call the source; absent unless overridden.
    virtual platform::Text displayName();
    /// The source's picture in a list of sources, as a rule that of the root; null for none.
    virtual OBImageRef displayImage();
    /// What tells this source from others in what an application keeps; the plug-in's identifier unless overridden.
    virtual platform::Text uniqueID();
    /// The name and the picture that the source gives its root group; absent and null unless overridden.
    virtual platform::Text rootMediaGroupTitle();
    virtual OBImageRef rootMediaGroupIcon();
    /// What media the source offers: `OBMediaTypesMovies`, the one code there is, or 0, none, unless overridden.
    virtual int mediaTypesSupported();

    /// Of the application that the source's media come from, for people; absent where it has none or none is known.
    virtual platform::Text applicationVersion();
    /// Unless overridden: whether `getAppPath` answers a path.
    virtual bool appInstalled();
    /// Absent when the source's application is not installed.
    virtual platform::Text getAppPath();

    /// What to show for an empty group; absent for no message.
    virtual platform::Text defaultNoDataMessage(const OBMediaGroupRef& group);

    /// The context menu for an object or a group; null for none.
    virtual OBMenuRef contextMenuForMediaObject_inMediaGroup(
        const OBMediaObjectRef& object, const OBMediaGroupRef& group);
    virtual OBMenuRef contextMenuForMediaGroup(const OBMediaGroupRef& group);

    // The pasteboard: on the thread on which the application calls.

    /// Writes what a person copies or drags; true when anything was written. The base operation begins the pasteboard
    /// anew and writes the files, of groups those of their media objects, for any desktop program.
    virtual bool writeMediaObjects_toPasteboard(const OBMediaObjectList& objects, platform::Pasteboard& pasteboard);
    virtual bool writeMediaGroups_toPasteboard(const OBMediaGroupList& groups, platform::Pasteboard& pasteboard);

    /// What the source tells beside its tree, valid as long as the manager; null when it offers nothing. It and what it
    /// answers: on any thread; may block.
    virtual OBSourceInspection* inspection();

    // Services that a plug-in calls on itself. Any thread.

    /// The installed tree, at once; null before the first load.
    OBMediaGroupRef rootMediaGroup() const;
    /// Publishes a tree, new or changed in place. False, with nothing done, for a tree that another has replaced since
    /// it was installed: what was changed in it has to be changed in that one.
    bool setRootMediaGroup(const OBMediaGroupRef& group);
    /// Whether whoever scans is to stop.
    bool isCancelLoadRequestPending() const noexcept;
    /// True until the first `loadData` has returned.
    bool firstTimeCallingLoadData() const;
    /// Whether whoever asks next gets a load in place of the installed tree; a load that begins clears it. Where
    /// automatic reloads are enabled and somebody observes, true starts that load.
    void setNeedsReload(bool needsReload);
    /// Whether a load that is needed starts by itself while somebody observes; not so at first. True starts one that is
    /// needed already.
    void setAutoReloadEnabled(bool enabled);
    /// 0.5 and above is normal priority; below, the load thread becomes nicer, up to the nicest at 0.0.
    void setLoadThreadPriority(double priority);
    double loadThreadPriority() const;
    const OBBundle& pluginBundle() const;
    platform::Text pluginIdentifier() const;
    /// Absent when the plug-in's string table has no text for `key`.
    platform::Text localizedString(std::string_view key) const;

    const platform::Platform& platform() const;
    /// All values of a preferences domain; null when it has none. Why one cannot be read is logged, once.
    platform::Value preferencesOfDomain(std::string_view domain);
    /// Lists a folder for a scan: keeps the progress and notes why a folder that is there cannot be read.
    platform::FolderListing listFolder(const platform::Text& path, const platform::ListingRequest& request);
    /// The two halves of that, for whoever lists on several threads and notes in order.
    platform::FolderListing readFolder(const platform::Text& path, const platform::ListingRequest& request);
    void noteFolderRead(const platform::Text& path, platform::FileProblem problem);
    /// For the progress: folders that were listed together with another, media objects made, items that a rule kept
    /// out.
    void noteFoldersDone(std::uint64_t count);
    void noteItemsFound(std::uint64_t count);
    void noteItemsSkipped(std::uint64_t count);
    /// For the progress: what is being read now.
    void notePathAtWork(const platform::Text& path);
    /// Who is told what a scan decides; null when nobody is. The scan that starts sees one that was set before it.
    std::shared_ptr<OBScanObserver> scanObserver() const;

    /// Runs `call` on the main thread and waits; false, with `call` not run, when the main loop has ended.
    bool performOnMainThreadAndWait(const std::function<void()>& call);
    /// Calls `job` once for each index below `count`, on this thread and a few others, and `take` for each in order, on
    /// this thread alone. When it returns, or throws what one of the calls threw, no thread is inside `job` any more.
    void performInOrder(std::size_t count, const std::function<void(std::size_t index)>& job,
        const std::function<void(std::size_t index)>& take);
    /// Runs `body` on a thread of its own, which keeps this manager alive. False when there is none to be had.
    bool startThread(const std::string& name, std::function<void()> body);
    /// Calls `handler` for notifications called `name` until the manager ends.
    void observeNotification(
        platform::NotificationCenter& center, std::string_view name, platform::NotificationCenter::Handler handler);

    /// Blocks the calling thread for `duration`; false, at once, when the manager ends. Not counted as work.
    bool sleep(std::chrono::nanoseconds duration);
    /// Runs `call` on the main thread once `delay` has passed and the main loop is in one of `modes`, unless the
    /// manager has ended.
    void performAfterDelay(std::chrono::nanoseconds delay, platform::RunLoopModes modes, std::function<void()> call);
    /// Runs `reload` on this thread as a piece of work that can be cancelled, after a pending cancel has ended; `part`
    /// is the source's word for what it scans. On the main thread it runs while nothing else is at work, later on that
    /// thread if need be. Not at all once the manager has ended.
    void performReload(std::string_view part, const std::function<void()>& reload);

    // What the path watcher asks.

    std::shared_ptr<void> lifeDuringCalls() override;
    bool holdsReports() const override;
    bool performAlone(const std::function<void()>& call) override;
    std::optional<platform::Date> changesMatterSince() const override;

    // What an application calls. Any thread.

    /// Delivers the tree through `executor`, after a load if one is needed. Answers at once. A source may need the main
    /// thread for its load: then, and where `executor` leads there, nothing is delivered until somebody runs the
    /// platform's main run loop, `mainRunLoop.run()`, which may be a thread of its own.
    void requestRootMediaGroup(const OBExecutor& executor, std::function<void(OBLoadResult)> completion);
    /// Asks the loads and reloads at work to stop; void when none is at work.
    void cancelLoad();
    /// Calls back through `executor` until the observation is dropped. Where automatic reloads are enabled, whoever
    /// observes gets a tree without asking for one.
    [[nodiscard]] OBObservation observe(OBExecutor executor, OBManagerCallbacks callbacks);
    /// Whether nothing is under way by which another tree would be published: no load, reload or report of a change,
    /// and no thread or delayed call of the source. What a disk has not told yet is not under way.
    bool isAtRest() const;
    OBLoadProgress loadProgress() const;
    /// The folders that the last load could not read.
    std::vector<OBLoadProblem> loadProblems() const;
    /// Who is told what scans decide that start from now on; null for nobody, as at first. The manager keeps it, and a
    /// scan the one it began with. Told on the threads that scan, perhaps several at once.
    void setScanObserver(std::shared_ptr<OBScanObserver> observer);

    /// For the framework: `init` has succeeded and the application has the manager; it has dropped it.
    void wasHandedOut();
    void end();

private:
    const std::unique_ptr<ManagerState> _state;
};
