#include "platform/linux/watching/FolderLook.h"

#include "platform/linux/watching/FileDates.h"
#include "platform/linux/watching/FolderEntries.h"

#include <cerrno>
#include <climits>
#include <utility>

#include <fcntl.h>
#include <sys/stat.h>

namespace platform {

FolderFollowing::Look FolderLook::lookThrough(Number folder)
{
    _path = _context.folders.path(folder);
    _look.isThere = enter(folder) != Entered::gone;
    while (!_levels.empty()) {
        if (!goDeeper())
            _levels.pop_back();
    }
    return _look;
}

// False when the folder reached has no further subfolder.
bool FolderLook::goDeeper()
{
    Level& level = _levels.back();
    const Number child = level.nextChild;
    if (child == WatchedFolders::none)
        return false;
    level.nextChild = _context.folders.nextSibling(child);
    _path.resize(level.pathLength);
    if (_path.size() > 1)
        _path.push_back('/');
    _path.append(_context.folders.name(child));
    if (enter(child) == Entered::gone)
        _following.drop(child);
    return true;
}

FolderLook::Entered FolderLook::enter(Number folder)
{
    if (_context.mounts.isMountedOnName(_context.folders.name(folder)) || _levels.empty()) {
        if (_context.mounts.isAutomountPoint(_path))
            return Entered::no;
        if (_context.mounts.holds(_path))
            return handOver(folder);
    }
    if (_path.size() >= PATH_MAX)
        return Entered::no;
    constexpr int flags = O_RDONLY | O_DIRECTORY | O_NOFOLLOW | O_CLOEXEC;
    const bool isBelowOpened = !_levels.empty() && _levels.back().descriptor.isOpen();
    const int parent = isBelowOpened ? _levels.back().descriptor.number() : AT_FDCWD;
    const char* const name = isBelowOpened ? _path.c_str() + _path.rfind('/') + 1 : _path.c_str();
    Descriptor descriptor(uninterrupted([&] { return openat(parent, name, flags); }));
    return descriptor.isOpen() ? enterOpened(folder, std::move(descriptor)) : enterFailed(folder, errno);
}

FolderLook::Entered FolderLook::enterOpened(Number folder, Descriptor descriptor)
{
    // Few enough for any limit of open files, and more levels than most trees have.
    constexpr std::size_t levelsKeptOpen = 32;
    _context.folders.mark(folder, WatchedFolders::followed);
    if (const int error = watchFolder(_context, folder, _path.c_str()); error != 0)
        return enterFailed(folder, error);
    if (_context.folders.isMarked(folder, WatchedFolders::polled)) {
        _context.folders.unmark(folder, WatchedFolders::polled);
        _context.polling.removeBelow(_path);
    }
    struct stat facts;
    if (fstat(descriptor.number(), &facts) == 0 && changeDate(facts) >= _since)
        _look.hasChangedSince = true;
    list(folder, descriptor.number());
    _context.folders.unmark(folder, WatchedFolders::unread);
    if (_levels.size() >= levelsKeptOpen)
        descriptor = Descriptor();
    const Number firstChild = _context.folders.firstChild(folder);
    if (firstChild != WatchedFolders::none)
        _levels.push_back({ folder, std::move(descriptor), _path.size(), firstChild });
    return Entered::yes;
}

FolderLook::Entered FolderLook::enterFailed(Number folder, int error)
{
    switch (error) {
    case ENOENT:
    case ENOTDIR:
    case ELOOP:
        return Entered::gone;
    case EACCES:
    case EPERM:
        // Nobody could list it either. Its folder's watch tells when its permissions change.
        while (_context.folders.firstChild(folder) != WatchedFolders::none)
            _following.drop(_context.folders.firstChild(folder));
        _context.folders.mark(folder, WatchedFolders::followed | WatchedFolders::unread);
        return Entered::no;
    default:
        if (error == ENOSPC)
            _following.tellUsedUpLimit(_path);
        return handOver(folder);
    }
}

// Leaves the folder, with all below it, to be looked at in intervals.
FolderLook::Entered FolderLook::handOver(Number folder)
{
    while (_context.folders.firstChild(folder) != WatchedFolders::none)
        _following.drop(_context.folders.firstChild(folder));
    _context.folders.mark(folder, WatchedFolders::followed | WatchedFolders::polled);
    _following.poll(_path, _since);
    return Entered::no;
}

void FolderLook::list(Number folder, int descriptor)
{
    WatchedFolders& folders = _context.folders;
    const bool hadChildren = folders.firstChild(folder) != WatchedFolders::none;
    for (Number child = folders.firstChild(folder); child != WatchedFolders::none; child = folders.nextSibling(child))
        folders.unmark(child, WatchedFolders::seen);
    const bool isWhole = forEachEntry(descriptor, [&](std::string_view name, bool isFolder) {
        _look.hasEntries = true;
        if (isFolder)
            folders.mark(folders.madeChild(folder, name), WatchedFolders::seen);
    });
    if (hadChildren && isWhole)
        dropUnseen(folder);
}

void FolderLook::dropUnseen(Number folder)
{
    WatchedFolders& folders = _context.folders;
    for (Number child = folders.firstChild(folder); child != WatchedFolders::none;) {
        const Number next = folders.nextSibling(child);
        if (!folders.isMarked(child, WatchedFolders::seen))
            _following.drop(child);
        child = next;
    }
}

} // namespace platform
