#pragma once

#include "platform/linux/watching/NumberTable.h"

#include <cstddef>
#include <cstdint>
#include <deque>
#include <memory>
#include <string>
#include <string_view>

namespace platform {

/// The folders of the disk that are watched, and those above them: one tree from "/" down, for all watched paths.
///
/// A folder knows the one that holds it and not its path, so that it keeps its watch when it is moved. A watch of the
/// kernel belongs to what is on disk: a folder that can be reached by two paths has one watch and two entries here.
/// Entries are numbers, which are given to others once they are removed. One thread at a time.
class WatchedFolders {
public:
    using Number = std::uint32_t;
    static constexpr Number none = 0;
    static constexpr Number top = 1; ///< "/", always there
    static constexpr int noWatch = -1;

    /// What is known of a folder; each is one bit.
    enum Mark : std::uint16_t {
        followed = 1, ///< lies in a watched path
        onTheWay = 2, ///< a watched path leads through it
        holdsWatchedFile = 4, ///< a watched path is a plain file in it
        isWatchedPath = 8, ///< a watched path leads to it
        unread = 16, ///< could not be listed
        seen = 32, ///< met in the listing that is under way
        holdsArrivals = 64, ///< files in it are kept in mind as arriving
        polled = 128, ///< it and what is below it is looked at in intervals
        namesMatter = 256, ///< what stands in it under some names decides where a watched path leads
        entriesReported = 512, ///< for it the kernel was asked to report what comes to it and leaves it
        contentsReported = 1024, ///< and what is written to files in it
    };

    WatchedFolders();

    Number parent(Number folder) const { return _folders[folder].parent; }
    Number firstChild(Number folder) const { return _folders[folder].firstChild; }
    Number nextSibling(Number folder) const { return _folders[folder].next; }
    std::string_view name(Number folder) const { return { _folders[folder].name.get(), _folders[folder].nameLength }; }
    bool isMarked(Number folder, unsigned marks) const { return (_folders[folder].marks & marks) != 0; }
    void mark(Number folder, unsigned marks) { _folders[folder].marks |= static_cast<std::uint16_t>(marks); }
    void unmark(Number folder, unsigned marks) { _folders[folder].marks &= static_cast<std::uint16_t>(~marks); }

    Number child(Number folder, std::string_view name) const;
    /// The child called `name`, which is made if there is none.
    Number madeChild(Number folder, std::string_view name);
    /// The entry at the real path `path`, or none.
    Number atPath(std::string_view path) const;
    std::string path(Number folder) const;
    bool isSameOrBelow(Number folder, Number above) const;

    /// Takes `folder` with all below it to another place, where nothing of that name may be.
    void move(Number folder, Number newParent, std::string_view newName);
    /// Removes an entry without children. Its watch has been taken from it.
    void remove(Number folder);
    /// The folder at or below `folder` that comes first where each comes after all that are below it.
    Number deepestBelow(Number folder) const;

    int watch(Number folder) const { return _folders[folder].watch; }
    /// Gives `folder` another watch, or none; answers the one it had before if no folder has that one any more, else
    /// `noWatch`.
    int setWatch(Number folder, int watch);
    /// The first folder with `watch`, or none; the next one that has it too.
    Number firstWithWatch(int watch) const;
    Number nextWithWatch(Number folder) const { return _folders[folder].nextOfWatch; }
    /// How many different watches there are.
    std::size_t watchCount() const noexcept { return _byWatch.size(); }

private:
    struct Folder {
        std::unique_ptr<char[]> name;
        Number parent = none;
        Number firstChild = none;
        Number next = none;
        Number previous = none;
        Number nextOfWatch = none;
        int watch = noWatch;
        std::uint8_t nameLength = 0;
        std::uint16_t marks = 0;
    };

    static std::uint64_t hashOfName(Number parent, std::string_view name);
    static std::uint64_t hashOfWatch(int watch);
    auto nameHashes() const
    {
        return [this](Number folder) { return hashOfName(_folders[folder].parent, name(folder)); };
    }
    auto watchHashes() const
    {
        return [this](Number folder) { return hashOfWatch(_folders[folder].watch); };
    }
    void setName(Folder& folder, std::string_view name);
    void link(Number folder, Number newParent);
    void unlink(Number folder);
    bool leaveWatch(Number folder);

    std::deque<Folder> _folders;
    Number _firstFree = none; ///< chained by `next`
    NumberTable _byName;
    NumberTable _byWatch; ///< the first folder of each watch
};

} // namespace platform
