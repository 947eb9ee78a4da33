#pragma once

#include "platform/linux/watching/FolderFollowing.h"
#include "platform/linux/watching/InotifyInstance.h"
#include "platform/linux/watching/UntoldContents.h"
#include "platform/linux/watching/WatchingContext.h"

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace platform {

/// What the kernel's reports mean: keeps the entries and watches of folders as the disk has them, and tells of it. The
/// watcher's thread.
class FolderEvents {
public:
    FolderEvents(WatchingContext& context, FolderFollowing& following)
        : _context(context)
        , _following(following)
    {
    }

    /// False when reports have been lost, and what is left of them means nothing.
    bool take(const FolderEvent& event);
    /// Whether the first half of a move waits for the other one.
    bool holdsMove() const { return _held.has_value(); }
    /// The other half has not come: what moved has left.
    void releaseMove();
    /// Forgets what reports had begun to tell.
    void forget();
    void tellDueContents();

private:
    using Number = WatchedFolders::Number;

    struct HeldMove {
        int watch = -1;
        std::uint32_t cookie = 0;
        bool isFolder = false;
        std::string name {};
    };

    std::vector<Number> foldersOf(int watch) const;
    void takeOfEntry(Number folder, const FolderEvent& event);
    void takeOfFolder(Number folder, const FolderEvent& event);
    void pairMove(const HeldMove& from, const FolderEvent& to);
    void moveEntry(Number source, const HeldMove& from, Number target, const FolderEvent& to);
    void moveFolder(Number source, const HeldMove& from, Number target, std::string_view name);
    void tellWhatStandsAt(Number folder, const std::string& name);
    void leave(Number folder, std::string_view name, bool isFolder, bool wasMoved);
    void appear(Number folder, std::string_view name, bool isFolder, FileArrivals::State state);
    void appearFolder(Number folder, std::string_view name);
    void attributes(Number folder, std::string_view name);
    void ownAttributes(Number folder);
    bool holdsUnread(Number folder) const;
    void modified(Number folder, std::string_view name);
    void closed(Number folder, std::string_view name);
    void tellContents(Number folder, std::string_view name);

    WatchingContext& _context;
    FolderFollowing& _following;
    std::optional<HeldMove> _held {};
};

} // namespace platform
