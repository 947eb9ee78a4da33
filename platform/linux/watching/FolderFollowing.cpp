#include "platform/linux/watching/FolderFollowing.h"

#include "platform/linux/watching/FolderEntries.h"
#include "platform/linux/watching/FolderLook.h"
#include "platform/linux/watching/WatchingProblems.h"

#include <algorithm>
#include <cerrno>
#include <climits>
#include <vector>

#include <fcntl.h>
#include <sys/inotify.h>

namespace platform {

namespace {

    constexpr std::uint32_t entryEvents = IN_CREATE | IN_DELETE | IN_MOVED_FROM | IN_MOVED_TO;
    constexpr std::uint32_t selfEvents = IN_DELETE_SELF | IN_MOVE_SELF | IN_ATTRIB;
    constexpr std::uint32_t contentEvents = IN_MODIFY | IN_CLOSE_WRITE;

    constexpr unsigned reasonsToWatch
        = WatchedFolders::followed | WatchedFolders::onTheWay | WatchedFolders::holdsWatchedFile;

    std::uint32_t maskOf(bool entries, bool contents)
    {
        return selfEvents | (entries ? entryEvents : 0) | (contents ? contentEvents : 0);
    }

    std::uint32_t maskNeeded(const WatchedFolders& folders, WatchedFolders::Number folder)
    {
        constexpr unsigned needingContents = WatchedFolders::followed | WatchedFolders::holdsWatchedFile;
        return maskOf(folders.isMarked(folder, needingContents | WatchedFolders::namesMatter),
            folders.isMarked(folder, needingContents));
    }

    std::uint32_t maskAskedFor(const WatchedFolders& folders, WatchedFolders::Number folder)
    {
        return maskOf(folders.isMarked(folder, WatchedFolders::entriesReported),
            folders.isMarked(folder, WatchedFolders::contentsReported));
    }

    void noteAsked(WatchedFolders& folders, WatchedFolders::Number folder, std::uint32_t mask)
    {
        folders.unmark(folder, WatchedFolders::entriesReported | WatchedFolders::contentsReported);
        if ((mask & entryEvents) != 0)
            folders.mark(folder, WatchedFolders::entriesReported);
        if ((mask & contentEvents) != 0)
            folders.mark(folder, WatchedFolders::contentsReported);
    }

} // namespace

int watchFolder(WatchingContext& context, WatchedFolders::Number folder, const char* path)
{
    WatchedFolders& folders = context.folders;
    // Another entry may have the same watch, and need more.
    const std::uint32_t mask = maskNeeded(folders, folder);
    const int watch = context.inotify.watchFolder(path, mask | IN_MASK_ADD);
    if (watch == -1)
        return errno;
    const bool isNew = folders.firstWithWatch(watch) == WatchedFolders::none;
    if (isNew && context.watchesInUse() >= context.limits.watchesAtMost) {
        context.inotify.stopWatching(watch);
        return ENOSPC;
    }
    noteAsked(folders, folder, folders.watch(folder) == watch ? mask | maskAskedFor(folders, folder) : mask);
    if (const int unused = folders.setWatch(folder, watch); unused != WatchedFolders::noWatch)
        context.inotify.stopWatching(unused);
    return 0;
}

FolderFollowing::Look FolderFollowing::lookThrough(Number folder, Date since)
{
    return FolderLook(_context, *this, since).lookThrough(folder);
}

void FolderFollowing::tellFound(Number folder)
{
    constexpr unsigned notListed = WatchedFolders::polled | WatchedFolders::unread;
    std::vector<Number> waiting { folder };
    while (!waiting.empty()) {
        const Number next = waiting.back();
        waiting.pop_back();
        if (_context.folders.isMarked(next, notListed))
            continue;
        tellFoundIn(next);
        for (Number child = _context.folders.firstChild(next); child != WatchedFolders::none;
             child = _context.folders.nextSibling(child))
            waiting.push_back(child);
    }
}

void FolderFollowing::tellFoundIn(Number folder)
{
    constexpr int flags = O_RDONLY | O_DIRECTORY | O_NOFOLLOW | O_CLOEXEC;
    const std::string path = _context.folders.path(folder);
    const Descriptor descriptor(uninterrupted([&] { return open(path.c_str(), flags); }));
    if (!descriptor.isOpen())
        return;
    forEachEntry(descriptor.number(), [&](std::string_view name, bool isFolder) {
        _context.roots.tell(folder, name, { PathChange::Kind::found, isFolder });
        const FileKey file { folder, std::string(name) };
        if (isFolder || _context.arrivals.state(file) == FileArrivals::State::arriving)
            return;
        _context.arrivals.begin(file, FileArrivals::State::unknown);
        _context.folders.mark(folder, WatchedFolders::holdsArrivals);
    });
}

FolderFollowing::Number FolderFollowing::entryAt(std::string_view path)
{
    Number folder = WatchedFolders::top;
    while (folder != WatchedFolders::none) {
        path.remove_prefix(std::min(path.find_first_not_of('/'), path.size()));
        if (path.empty())
            break;
        const std::string_view name = path.substr(0, path.find('/'));
        path.remove_prefix(name.size());
        folder = name.size() <= NAME_MAX ? _context.folders.madeChild(folder, name) : WatchedFolders::none;
    }
    return folder;
}

FolderFollowing::WayFolder FolderFollowing::folderOnTheWay(const std::string& path, unsigned marks)
{
    WayFolder found;
    found.entry = path.size() < PATH_MAX ? entryAt(path) : WatchedFolders::none;
    if (found.entry == WatchedFolders::none)
        return found;
    const bool wasOnTheWay = _context.folders.isMarked(found.entry, WatchedFolders::onTheWay);
    _context.folders.mark(found.entry, marks | WatchedFolders::onTheWay);
    const int error = watchFolder(_context, found.entry, path.c_str());
    found.isWatched = error == 0;
    const bool isMissing = error == ENOENT || error == ENOTDIR || error == ELOOP;
    // A folder that may only be passed through reports nothing; when it is moved, the next one on the way says so.
    const bool isPassedThrough = error == EACCES || error == EPERM;
    found.isRefused = error != 0 && !isMissing && !isPassedThrough;
    if (error == ENOSPC)
        tellUsedUpLimit(path);
    if ((isMissing || found.isRefused) && !wasOnTheWay) {
        _context.folders.unmark(found.entry, marks | WatchedFolders::onTheWay);
        settle(found.entry);
        found.entry = WatchedFolders::none;
    }
    return found;
}

bool FolderFollowing::isNeeded(Number folder) const
{
    return _context.folders.isMarked(folder, reasonsToWatch | WatchedFolders::isWatchedPath);
}

// Has the kernel report as much as the entries with this watch need together.
void FolderFollowing::narrowWatch(Number folder)
{
    WatchedFolders& folders = _context.folders;
    const int watch = folders.watch(folder);
    if (watch == WatchedFolders::noWatch)
        return;
    std::uint32_t mask = 0;
    std::uint32_t asked = 0;
    for (Number same = folders.firstWithWatch(watch); same != WatchedFolders::none;
         same = folders.nextWithWatch(same)) {
        mask |= maskNeeded(folders, same);
        asked |= maskAskedFor(folders, same);
    }
    if (mask == asked)
        return;
    const std::string path = folders.path(folder);
    // Another folder may stand there by now, of which as much is to be reported as before.
    const int now = _context.inotify.watchFolder(path.c_str(), selfEvents | IN_MASK_ADD);
    if (now != watch) {
        if (now != -1 && folders.firstWithWatch(now) == WatchedFolders::none)
            _context.inotify.stopWatching(now);
        return;
    }
    _context.inotify.watchFolder(path.c_str(), mask);
    // While it takes another mask in place of the one it had, the kernel reports nothing, so the ways are gone again.
    for (Number same = folders.firstWithWatch(watch); same != WatchedFolders::none;
         same = folders.nextWithWatch(same)) {
        noteAsked(folders, same, mask);
        _context.roots.noteFolder(same, false);
    }
}

void FolderFollowing::takeWatchFrom(Number folder)
{
    if (const int unused = _context.folders.setWatch(folder, WatchedFolders::noWatch);
        unused != WatchedFolders::noWatch)
        _context.inotify.stopWatching(unused);
}

void FolderFollowing::settle(Number folder)
{
    while (folder != WatchedFolders::none) {
        if (isNeeded(folder))
            return narrowWatch(folder);
        takeWatchFrom(folder);
        if (folder == WatchedFolders::top || _context.folders.firstChild(folder) != WatchedFolders::none)
            return;
        const Number parent = _context.folders.parent(folder);
        remove(folder);
        folder = parent;
    }
}

void FolderFollowing::remove(Number folder)
{
    WatchedFolders& folders = _context.folders;
    if (folders.isMarked(folder, WatchedFolders::polled))
        _context.polling.removeBelow(folders.path(folder));
    if (folders.isMarked(folder, WatchedFolders::holdsArrivals))
        forgetFiles(folder);
    if (folders.isMarked(folder, WatchedFolders::onTheWay | WatchedFolders::isWatchedPath))
        _context.roots.folderIsGone(folder);
    takeWatchFrom(folder);
    folders.remove(folder);
}

void FolderFollowing::forgetFiles(Number folder)
{
    _context.arrivals.forgetFolder(folder);
    _context.contents.forgetFolder(folder);
}

void FolderFollowing::drop(Number folder)
{
    for (Number deepest = WatchedFolders::none; deepest != folder;) {
        deepest = _context.folders.deepestBelow(folder);
        remove(deepest);
    }
}

void FolderFollowing::release(Number folder)
{
    WatchedFolders& folders = _context.folders;
    for (Number above = folder; above != WatchedFolders::none; above = folders.parent(above)) {
        if (folders.isMarked(above, WatchedFolders::isWatchedPath))
            return;
    }
    std::vector<Number> released { folder };
    for (std::size_t index = 0; index < released.size(); ++index) {
        const Number next = released[index];
        if (folders.isMarked(next, WatchedFolders::polled))
            _context.polling.removeBelow(folders.path(next));
        if (folders.isMarked(next, WatchedFolders::holdsArrivals))
            forgetFiles(next);
        folders.unmark(next, WatchedFolders::followed | WatchedFolders::polled | WatchedFolders::unread);
        for (Number child = folders.firstChild(next); child != WatchedFolders::none;
             child = folders.nextSibling(child)) {
            if (!folders.isMarked(child, WatchedFolders::isWatchedPath))
                released.push_back(child);
        }
    }
    // Each after what is below it. An entry that goes takes with it those above it that nobody needs.
    for (; !released.empty(); released.pop_back()) {
        const Number next = released.back();
        if (isNeeded(next))
            narrowWatch(next);
        else if (next == WatchedFolders::top || folders.firstChild(next) != WatchedFolders::none)
            takeWatchFrom(next);
        else if (next == folder)
            settle(next);
        else
            remove(next);
    }
}

void FolderFollowing::stopPollingBelow(Number folder)
{
    if (!_context.polling.isIdle())
        _context.polling.removeBelow(_context.folders.path(folder));
}

void FolderFollowing::poll(const std::string& path, Date since)
{
    if (const auto& mounts = _context.mounts; mounts.holds(path))
        _context.roots.tellProblem(path, changedByOthers(mounts.typeAt(path)));
    _context.polling.add(_context.mounts.deviceAt(path), { path, since, since == never });
}

void FolderFollowing::tellUsedUpLimit(const std::string& path)
{
    _context.roots.tellProblem(path, usedUpWatches(_context.limits.watchesAtMost));
}

} // namespace platform
