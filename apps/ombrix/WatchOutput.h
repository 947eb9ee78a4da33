#pragma once

#include "apps/common/LoadWatch.h"
#include "apps/ombrix/WatchedVolumes.h"
#include "host/OBMediaHost.h"
#include "host/OBPathWatcher.h"
#include "host/OBTreeChanges.h"
#include "platform/ThreadSafety.h"

#include <deque>
#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <vector>

namespace ombrix {

class Program;

/// What "watch" prints after the first root.
enum class WatchForm { lines, documents, changes };

/// Whom the output tells of itself. The calls come on its thread.
struct WatchOutputHandlers {
    std::function<void()> began; ///< the first root has been printed
    std::function<void()> failed; ///< nothing can be printed any more
};

/// Prints what becomes of a tree, on a thread of its own: whoever reads slowly keeps no scan waiting. What it cannot
/// print in time is joined. The program's standard output is its own until it has ended.
class WatchOutput : public OBPathWatcherObserver, public std::enable_shared_from_this<WatchOutput> {
public:
    WatchOutput(
        Program& program, std::shared_ptr<OBMediaManager> manager, WatchForm form, WatchOutputHandlers handlers);

    /// False when the system gives no thread.
    bool start();
    /// Prints what it has been told so far, and ends.
    void finish();

    // Any thread.

    void published(const OBPublication& publication);
    void warn(std::string text);
    /// Something may have changed that people are told of: volumes, what is followed.
    void look();
    /// What has been waited for comes late: it is told of as it is.
    void waitNoLonger();
    /// The editor's preferences have changed.
    void watchedPathChanged_fileChangedEventFlags(std::string_view path, std::uint64_t flags) override;
    std::shared_ptr<void> lifeDuringCalls() override { return weak_from_this().lock(); }

private:
    struct Shown {
        OBPublication publication;
        OBMediaGroupRef root; ///< as it was then
    };
    struct Work {
        std::deque<Shown> shown {};
        std::vector<std::string> warnings {};
        bool looks = false;
        bool waitsNoLonger = false;
        bool asksForOrder = false;
    };

    void run();
    bool takeWork(Work& work);
    void perform(const Work& work);
    void begin(const Shown& first);
    void goOn(const Shown& next);
    void watchPreferences();
    void tellChanges(const Shown& next);
    void tellOverflows();
    void tellWhatIsFollowed();
    void tellUnsearchedFolders();
    void tellOrder();
    void tellWarning(const std::string& text);
    std::optional<std::size_t> countOfSearchFolders() const;

    Program& _program;
    const std::shared_ptr<OBMediaManager> _manager;
    const platform::Platform& _platform;
    const WatchForm _form;
    const WatchOutputHandlers _handlers;

    // Its own thread's.
    std::optional<apps::LoadWatch> _loadWatch;
    OBTreeSnapshot _last {};
    bool _hasBegun = false;
    bool _isFollowingTold = false;
    std::uint64_t _overflows = 0;
    std::optional<bool> _newestFirst;
    WatchedVolumes _volumesOfTree; // as they were when the tree last changed
    WatchedVolumes _volumes;

    platform::Mutex _lock;
    platform::Condition _changed;
    Work _work GUARDED_BY(_lock);
    bool _isToEnd GUARDED_BY(_lock) = false;
    bool _runs GUARDED_BY(_lock) = false;
};

} // namespace ombrix
