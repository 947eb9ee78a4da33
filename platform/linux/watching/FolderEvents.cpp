#include "platform/linux/watching/FolderEvents.h"

// The kernel tells what happened a while ago, in a folder that may have moved since. What is done with a report is
// right for the disk as it is now, and the reports that are still to come repair the rest. Surprise: of two entries
// that change places, each is moved onto the other, so what stands where one has left is looked at again.

#include "platform/linux/SystemPath.h"

#include <utility>

#include <sys/inotify.h>
#include <sys/stat.h>

namespace platform {

std::vector<FolderEvents::Number> FolderEvents::foldersOf(int watch) const
{
    std::vector<Number> folders;
    for (Number folder = _context.folders.firstWithWatch(watch); folder != WatchedFolders::none;
         folder = _context.folders.nextWithWatch(folder))
        folders.push_back(folder);
    return folders;
}

bool FolderEvents::take(const FolderEvent& event)
{
    if (event.has(IN_Q_OVERFLOW))
        return false;
    if (_held && event.has(IN_MOVED_TO) && event.cookie == _held->cookie) {
        pairMove(*std::exchange(_held, std::nullopt), event);
        return true;
    }
    releaseMove();
    if (event.has(IN_MOVED_FROM)) {
        _held = HeldMove { event.watch, event.cookie, event.has(IN_ISDIR), std::string(event.name) };
        return true;
    }
    for (const Number folder : foldersOf(event.watch)) {
        // What was done for another entry with this watch may have taken it from this one.
        if (_context.folders.watch(folder) != event.watch)
            continue;
        if (event.name.empty())
            takeOfFolder(folder, event);
        else
            takeOfEntry(folder, event);
    }
    return true;
}

void FolderEvents::takeOfFolder(Number folder, const FolderEvent& event)
{
    if (event.has(IN_UNMOUNT))
        _context.roots.noteAbove(folder);
    if (event.has(IN_IGNORED))
        _context.folders.setWatch(folder, WatchedFolders::noWatch);
    if (event.has(IN_DELETE_SELF | IN_MOVE_SELF | IN_UNMOUNT | IN_IGNORED | IN_ATTRIB))
        _context.roots.noteFolder(folder, event.has(IN_DELETE_SELF | IN_UNMOUNT));
    if (event.has(IN_ATTRIB))
        ownAttributes(folder);
}

void FolderEvents::takeOfEntry(Number folder, const FolderEvent& event)
{
    const bool isFolder = event.has(IN_ISDIR);
    if (event.has(IN_CREATE | IN_DELETE | IN_MOVED_TO | IN_ATTRIB))
        _context.roots.noteStep(folder, event.name, !event.has(IN_ATTRIB));
    if (event.has(IN_CREATE))
        appear(folder, event.name, isFolder, FileArrivals::State::arriving);
    else if (event.has(IN_MOVED_TO))
        appear(folder, event.name, isFolder, FileArrivals::State::unknown);
    else if (event.has(IN_DELETE))
        leave(folder, event.name, isFolder, false);
    else if (event.has(IN_ATTRIB) && isFolder)
        attributes(folder, event.name);
    else if (event.has(IN_MODIFY))
        modified(folder, event.name);
    else if (event.has(IN_CLOSE_WRITE))
        closed(folder, event.name);
}

void FolderEvents::releaseMove()
{
    if (!_held)
        return;
    const HeldMove from = *std::exchange(_held, std::nullopt);
    for (const Number folder : foldersOf(from.watch)) {
        _context.roots.noteStep(folder, from.name, true);
        leave(folder, from.name, from.isFolder, true);
    }
}

void FolderEvents::forget()
{
    _held.reset();
    _context.arrivals.drop();
    _context.contents.clear();
}

void FolderEvents::pairMove(const HeldMove& from, const FolderEvent& to)
{
    // Where folders can be reached by several paths, what moved has done so in each of them.
    const std::vector<Number> sources = foldersOf(from.watch);
    const std::vector<Number> targets = foldersOf(to.watch);
    for (std::size_t index = 0; index < std::max(sources.size(), targets.size()); ++index) {
        const Number source = index < sources.size() ? sources[index] : WatchedFolders::none;
        const Number target = index < targets.size() ? targets[index] : WatchedFolders::none;
        moveEntry(source, from, target, to);
    }
}

void FolderEvents::moveEntry(Number source, const HeldMove& from, Number target, const FolderEvent& to)
{
    const bool isSourceThere = source != WatchedFolders::none && _context.folders.watch(source) == from.watch;
    const bool isTargetThere = target != WatchedFolders::none && _context.folders.watch(target) == to.watch;
    if (isSourceThere)
        _context.roots.noteStep(source, from.name, true);
    if (isTargetThere)
        _context.roots.noteStep(target, to.name, true);
    const bool staysFollowed = isTargetThere && _context.folders.isMarked(target, WatchedFolders::followed);
    if (isSourceThere && !staysFollowed)
        return leave(source, from.name, from.isFolder, true);
    if (!isSourceThere || !_context.folders.isMarked(source, WatchedFolders::followed)) {
        if (staysFollowed)
            appear(target, to.name, from.isFolder, FileArrivals::State::unknown);
        return;
    }
    _context.roots.tell(source, from.name, { PathChange::Kind::disappeared, from.isFolder, from.isFolder });
    if (from.isFolder) {
        moveFolder(source, from, target, to.name);
    } else {
        const FileKey before { source, from.name };
        const FileKey after { target, std::string(to.name) };
        _context.contents.move(before, after);
        _context.arrivals.move(before, after);
        _context.folders.mark(target, WatchedFolders::holdsArrivals);
        _context.roots.tell(target, to.name, { PathChange::Kind::appeared });
    }
    tellWhatStandsAt(source, from.name);
}

// The folder keeps its watch, and those below it theirs.
void FolderEvents::moveFolder(Number source, const HeldMove& from, Number target, std::string_view name)
{
    WatchedFolders& folders = _context.folders;
    const Number moved = folders.child(source, from.name);
    const Number replaced = folders.child(target, name);
    const bool isPossible = moved != WatchedFolders::none && moved != replaced && !folders.isSameOrBelow(target, moved);
    if (isPossible) {
        _following.stopPollingBelow(moved);
        if (replaced != WatchedFolders::none)
            _following.drop(replaced);
        folders.move(moved, target, name);
    }
    appearFolder(target, name);
}

// Where two entries change places, something stands again where one has just left.
void FolderEvents::tellWhatStandsAt(Number folder, const std::string& name)
{
    const SystemPath path(_context.folders.path(folder) + '/' + name);
    struct stat facts;
    if (!path.isUsable() || lstat(path.bytes(), &facts) != 0)
        return;
    appear(folder, name, S_ISDIR(facts.st_mode), FileArrivals::State::unknown);
}

void FolderEvents::leave(Number folder, std::string_view name, bool isFolder, bool wasMoved)
{
    if (!_context.folders.isMarked(folder, WatchedFolders::followed))
        return;
    if (isFolder) {
        if (const Number gone = _context.folders.child(folder, name); gone != WatchedFolders::none)
            _following.drop(gone);
    } else {
        const FileKey file { folder, std::string(name) };
        _context.arrivals.end(file);
        _context.contents.end(file);
    }
    _context.roots.tell(folder, name, { PathChange::Kind::disappeared, isFolder, isFolder && wasMoved });
}

void FolderEvents::appear(Number folder, std::string_view name, bool isFolder, FileArrivals::State state)
{
    if (!_context.folders.isMarked(folder, WatchedFolders::followed | WatchedFolders::holdsWatchedFile))
        return;
    if (isFolder) {
        if (_context.folders.isMarked(folder, WatchedFolders::followed))
            appearFolder(folder, name);
        return;
    }
    _context.arrivals.begin({ folder, std::string(name) }, state);
    _context.folders.mark(folder, WatchedFolders::holdsArrivals);
    _context.roots.tell(folder, name, { PathChange::Kind::appeared });
}

// First all that is in the folder gets its watches, so that whoever lists it when he is told misses nothing.
void FolderEvents::appearFolder(Number folder, std::string_view name)
{
    if (name.size() > NAME_MAX)
        return;
    const Number appeared = _context.folders.madeChild(folder, name);
    const FolderFollowing::Look look = _following.lookThrough(appeared, FolderFollowing::never);
    if (!look.isThere)
        _following.drop(appeared);
    _context.roots.tell(folder, name, { PathChange::Kind::appeared, true });
    if (look.isThere && look.hasEntries)
        _following.tellFound(appeared);
}

void FolderEvents::attributes(Number folder, std::string_view name)
{
    if (!_context.folders.isMarked(folder, WatchedFolders::followed))
        return;
    const Number entry = _context.folders.child(folder, name);
    // Its own watch tells it, too.
    if (entry != WatchedFolders::none && _context.folders.watch(entry) != WatchedFolders::noWatch)
        return;
    _context.roots.tell(folder, name, { PathChange::Kind::attributesChanged, true });
    if (entry == WatchedFolders::none || !_context.folders.isMarked(entry, WatchedFolders::unread))
        return;
    const FolderFollowing::Look look = _following.lookThrough(entry, FolderFollowing::never);
    if (look.isThere && look.hasEntries)
        _following.tellFound(entry);
}

void FolderEvents::ownAttributes(Number folder)
{
    if (!_context.folders.isMarked(folder, WatchedFolders::followed))
        return;
    _context.roots.tell(folder, {}, { PathChange::Kind::attributesChanged, true });
    if (holdsUnread(folder) && _following.lookThrough(folder, FolderFollowing::never).isThere)
        _following.tellFound(folder);
}

bool FolderEvents::holdsUnread(Number folder) const
{
    const WatchedFolders& folders = _context.folders;
    bool isUnread = folders.isMarked(folder, WatchedFolders::unread);
    for (Number child = folders.firstChild(folder); child != WatchedFolders::none && !isUnread;
         child = folders.nextSibling(child))
        isUnread = folders.isMarked(child, WatchedFolders::unread);
    return isUnread;
}

void FolderEvents::modified(Number folder, std::string_view name)
{
    const FileKey file { folder, std::string(name) };
    const bool isArriving = _context.arrivals.state(file) == FileArrivals::State::arriving;
    const auto wait = isArriving ? _context.limits.arrivalQuietTime : _context.limits.quietTime;
    _context.contents.add(file, std::chrono::steady_clock::now() + wait);
    _context.folders.mark(folder, WatchedFolders::holdsArrivals);
}

void FolderEvents::closed(Number folder, std::string_view name)
{
    const FileKey file { folder, std::string(name) };
    _context.contents.end(file);
    const FileArrivals::State state = _context.arrivals.end(file);
    if (state != FileArrivals::State::arriving)
        tellContents(folder, name);
    else
        _context.roots.tellOfFile(folder, name);
    if (state != FileArrivals::State::none)
        _context.roots.tell(folder, name, { PathChange::Kind::arrivalEnded });
}

void FolderEvents::tellContents(Number folder, std::string_view name)
{
    _context.roots.tell(folder, name, { PathChange::Kind::contentChanged });
    _context.roots.tellOfFile(folder, name);
}

void FolderEvents::tellDueContents()
{
    for (const FileKey& file : _context.contents.takeDue(std::chrono::steady_clock::now()))
        tellContents(file.folder, file.name);
}

} // namespace platform
