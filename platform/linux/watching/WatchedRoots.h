#pragma once

#include "platform/linux/watching/WatchedFolders.h"
#include "platform/linux/watching/WatchedPlace.h"
#include "platform/linux/watching/WatchingQueue.h"

#include <cstdint>
#include <map>
#include <memory>
#include <set>
#include <string>
#include <string_view>
#include <unordered_map>
#include <vector>

namespace platform {

/// A watched path, and where it leads.
struct WatchedRoot {
    std::shared_ptr<const PathWatch> watch;
    WatchedPlace place {};
    /// The entry of the folder that it leads to; none where that is no folder or is polled.
    WatchedFolders::Number folder = WatchedFolders::none;
    std::vector<WatchedFolders::Number> folderOfSteps {}; ///< those in which a step of the way is watched
    RootHistory history {};
    std::string awaitedLook {}; ///< the folder that is polled and has to be looked through before it stands
    bool isWayPolled = false;
    bool mustFollowAgain = false; ///< something on the way has changed
    bool mustTell = false; ///< what the path leads to is another one, even if it should look the same

    const std::string& path() const { return watch->path; }
};

/// The watched paths, and who hears what of them. The watcher's thread.
class WatchedRoots {
public:
    /// A name in a folder that decides where a root leads.
    struct Step {
        WatchedRoot* root = nullptr;
        std::string name;
        bool isPlace = false; ///< it is the last one: the name of what the root leads to
    };

    WatchedRoots(WatchedFolders& folders, WatchingQueue& queue)
        : _folders(folders)
        , _queue(queue)
    {
    }

    WatchedRoot& add(AddedWatch added);
    WatchedRoot* find(std::uint64_t number);
    /// Whoever removes a root has taken it from its folders.
    void remove(std::uint64_t number) { _roots.erase(number); }
    bool isEmpty() const { return _roots.empty(); }
    /// `take` may remove the root that it is given.
    template <class Take> void forEach(const Take& take)
    {
        for (auto next = _roots.begin(); next != _roots.end();)
            take((next++)->second);
    }

    /// Says that `root` leads to `folder`, or to none.
    void setFolder(WatchedRoot& root, WatchedFolders::Number folder);
    /// Gives `root` other steps; answers the folders in which no root has a step any more, and had one.
    std::vector<WatchedFolders::Number> setSteps(
        WatchedRoot& root, const std::vector<std::pair<WatchedFolders::Number, Step>>& steps);

    /// Has every root followed again that has a step called `name` in `folder`. With `isOther` an entry of that name
    /// has come or gone, else its permissions may be others.
    void noteStep(WatchedFolders::Number folder, std::string_view name, bool isOther);
    /// Has every root followed again that leads through or to `folder`; with `isGone`, what leads to it is told.
    void noteFolder(WatchedFolders::Number folder, bool isGone);
    /// Has every root followed again, and told of, that lies at or above `folder`.
    void noteAbove(WatchedFolders::Number folder);
    /// Forgets `folder`, which is losing its entry, and has the roots followed again that lead through or to it.
    void folderIsGone(WatchedFolders::Number folder);
    /// Whether a root is to be followed again.
    bool haveNotes() const { return _hasNotes; }
    std::vector<WatchedRoot*> takeNoted();

    /// Tells of the entry `name` in `folder`, or of the folder itself where `name` is empty.
    void tell(WatchedFolders::Number folder, std::string_view name, PathChange change);
    /// Tells the roots that lead to the plain file `name` in `folder`.
    void tellOfFile(WatchedFolders::Number folder, std::string_view name);
    /// Tells of what lies at the real path that `change` holds.
    void tellByRealPath(const PathChange& change);
    void tellAnything(WatchedRoot& root);
    void tellStanding(WatchedRoot& root);
    /// Tells every root at or above the real path, or through which it is polled, once for each cause.
    void tellProblem(std::string_view realPath, WatchingProblem problem);
    void tellProblem(WatchedRoot& root, const WatchingProblem& problem);

private:
    void send(const WatchedRoot& root, const PathChange& change);
    std::string spelledPath(const WatchedRoot& root, std::string_view below) const;

    WatchedFolders& _folders;
    WatchingQueue& _queue;
    std::map<std::uint64_t, WatchedRoot> _roots {};
    std::unordered_multimap<WatchedFolders::Number, WatchedRoot*> _byFolder {};
    std::unordered_multimap<WatchedFolders::Number, Step> _steps {};
    std::vector<WatchedFolders::Number> _chain {}; ///< kept for its memory
    bool _hasNotes = false;
};

} // namespace platform
