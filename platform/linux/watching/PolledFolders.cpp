#include "platform/linux/watching/PolledFolders.h"

#include "platform/PathText.h"
#include "platform/linux/SystemPath.h"
#include "platform/linux/watching/FileDates.h"
#include "platform/linux/watching/FolderEntries.h"
#include "platform/linux/watching/PathRange.h"

#include <algorithm>
#include <cerrno>
#include <ctime>
#include <string_view>

#include <fcntl.h>
#include <sys/stat.h>

namespace platform {

namespace {

    // Disks count time in steps of up to two seconds (FAT): a folder that changed so recently may change again without
    // its time showing it.
    constexpr std::int64_t longestStep = 2;

    bool isRecent(Date changed)
    {
        timespec now {};
        clock_gettime(CLOCK_REALTIME, &now);
        return changed.seconds + longestStep >= now.tv_sec;
    }

} // namespace

void PolledFolders::tell(PathChange::Kind kind, const std::string& path, bool heldMore)
{
    PollingReport report;
    report.change = PathChange { kind, true, heldMore, path };
    _reports.push_back(std::move(report));
}

// False when there is no such folder any more. What cannot be looked at stays what it was.
bool PolledFolders::look(const std::string& path, Seen& seen) const
{
    const SystemPath systemPath(path);
    struct stat facts;
    if (!systemPath.isUsable())
        return false;
    if (lstat(systemPath.bytes(), &facts) != 0)
        return errno != ENOENT && errno != ENOTDIR;
    if (!S_ISDIR(facts.st_mode))
        return false;
    seen.changed = changeDate(facts);
    seen.device = facts.st_dev;
    seen.inode = facts.st_ino;
    seen.mayHaveChangedSince = isRecent(seen.changed);
    return true;
}

PolledFolders::Contents PolledFolders::contentsOf(const std::string& path)
{
    Contents contents;
    const SystemPath systemPath(path);
    constexpr int flags = O_RDONLY | O_DIRECTORY | O_NOFOLLOW | O_CLOEXEC;
    const Descriptor folder(uninterrupted([&] { return open(systemPath.bytes(), flags); }));
    if (!folder.isOpen())
        return contents;
    forEachEntry(folder.number(), [&contents](std::string_view name, bool isFolder) {
        // In whatever order the disk lists them.
        contents.names += std::hash<std::string_view>()(name) * 2 + 1;
        if (isFolder)
            contents.subfolders.emplace_back(name);
    });
    return contents;
}

void PolledFolders::add(const PolledArea& area)
{
    const Date latest = enterAll(area.path, area.isNew);
    PollingReport report;
    report.folderLookedThrough = area.path;
    report.hasChangedSince = !area.isNew && latest >= area.since;
    _reports.push_back(std::move(report));
}

// Answers when any of the folders last changed.
Date PolledFolders::enterAll(const std::string& path, bool isNew)
{
    Date latest {};
    std::vector<std::string> waiting { path };
    while (!waiting.empty() && !_isEnded()) {
        const std::string folder = std::move(waiting.back());
        waiting.pop_back();
        Seen seen;
        if (!look(folder, seen))
            continue;
        Contents contents = contentsOf(folder);
        seen.names = contents.names;
        latest = std::max(latest, seen.changed);
        for (const std::string& name : contents.subfolders)
            waiting.push_back(pathJoined(folder, name));
        _folders[folder] = seen;
        if (isNew)
            tell(PathChange::Kind::folderChanged, folder);
    }
    return latest;
}

void PolledFolders::removeBelow(const std::string& path)
{
    eraseSameOrBelow(_folders, path, [](const auto&) {});
}

void PolledFolders::addPath(std::uint64_t watch, const std::string& path)
{
    follow(watch, _paths[watch] = { path }, true);
}

void PolledFolders::follow(std::uint64_t watch, WatchedPath& path, bool isFirst)
{
    WatchedPlace place = placeOfPath(_files, path.path, nullptr);
    if (!isFirst && place.isSamePlace(path.place))
        return;
    path.place = std::move(place);
    PollingReport report;
    report.watch = watch;
    report.place = path.place;
    _reports.push_back(std::move(report));
}

void PolledFolders::lookAtAll()
{
    for (auto& [watch, path] : _paths) {
        if (!_isEnded())
            follow(watch, path, false);
    }
    std::string last;
    for (auto folder = _folders.begin(); folder != _folders.end() && !_isEnded(); folder = _folders.upper_bound(last)) {
        last = folder->first;
        Seen now = folder->second;
        if (!look(last, now)) {
            removeBelow(last);
            continue;
        }
        compare(last, now);
    }
}

void PolledFolders::compare(const std::string& path, Seen& now)
{
    const Seen before = _folders[path];
    const bool isTold = now.changed != before.changed || now.inode != before.inode || now.device != before.device;
    if (!isTold && !before.mayHaveChangedSince)
        return;
    Contents contents = contentsOf(path);
    now.names = contents.names;
    _folders[path] = now;
    if (!isTold && now.names == before.names)
        return;
    tell(PathChange::Kind::folderChanged, path);
    compareSubfolders(path, std::move(contents.subfolders));
}

void PolledFolders::compareSubfolders(const std::string& path, std::vector<std::string> subfolders)
{
    std::sort(subfolders.begin(), subfolders.end());
    for (const std::string& known : knownSubfolders(path)) {
        if (std::binary_search(subfolders.begin(), subfolders.end(), known))
            continue;
        removeBelow(pathJoined(path, known));
        tell(PathChange::Kind::disappeared, pathJoined(path, known), true);
    }
    for (const std::string& name : subfolders) {
        const std::string subfolder = pathJoined(path, name);
        if (_folders.find(subfolder) != _folders.end())
            continue;
        tell(PathChange::Kind::appeared, subfolder);
        enterAll(subfolder, true);
    }
}

std::vector<std::string> PolledFolders::knownSubfolders(const std::string& path) const
{
    const std::string start = beforeAllBelow(path);
    const auto last = _folders.lower_bound(behindAllBelow(path));
    std::vector<std::string> names;
    for (auto folder = _folders.upper_bound(start); folder != last;) {
        // What lies below a folder need not follow it at once ("a b" stands between "a" and "a/c"), but it is together.
        const std::size_t slash = folder->first.find('/', start.size());
        if (slash == std::string::npos)
            names.push_back(folder->first.substr(start.size()));
        folder = slash == std::string::npos ? std::next(folder)
                                            : _folders.lower_bound(behindAllBelow(folder->first.substr(0, slash)));
    }
    return names;
}

} // namespace platform
