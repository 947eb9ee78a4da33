#include "tests/support/simulated/SimulatedPathWatching.h"

#include "platform/PathText.h"
#include "platform/common/StillPaths.h"

#include <algorithm>
#include <chrono>
#include <utility>

namespace tests {

using platform::ItemKind;
using platform::PathChange;
using Kind = platform::PathChange::Kind;

namespace {

    constexpr std::chrono::seconds longestDelay { 3 };
    constexpr std::chrono::seconds pollInterval { 10 };

    bool isOnTheWay(std::string_view folder, std::string_view path)
    {
        return platform::isSameOrBelow(path, folder) || platform::isSameOrBelow(folder, path);
    }

} // namespace

struct SimulatedPathWatching::Root {
    std::string path;
    platform::Date since;
    platform::PathWatchHandlers handlers;
    bool isPolled = false;
    bool stands = false;
    bool isTakenBack = false;
    std::string place {}; ///< its real path
    std::uint64_t item = 0; ///< the item there; 0 for none
    bool isFolder = false;
    std::chrono::nanoseconds lastDue {}; ///< of what was told
    std::set<std::string> polled {}; ///< folders of which the next look will tell
};

SimulatedPathWatching::SimulatedPathWatching(
    SimulatedThreads& threads, Chance& chance, const SimulatedDisk& disk, const platform::FileSystem& files)
    : _threads(threads)
    , _chance(chance)
    , _disk(disk)
    , _files(files)
{
}

SimulatedPathWatching::~SimulatedPathWatching() = default;

bool SimulatedPathWatching::somethingIsPolled() const
{
    return std::any_of(_roots->begin(), _roots->end(), [](const RootRef& root) { return root->isPolled; });
}

std::shared_ptr<void> SimulatedPathWatching::watch(
    std::string_view path, platform::Date since, platform::PathWatchHandlers handlers)
{
    const SimulatedThreads::Undisturbed here;
    const auto root = std::make_shared<Root>(Root { std::string(path), since, std::move(handlers) });
    root->isPolled = pollsOneIn != 0 && _chance.oneIn(pollsOneIn);
    _roots->push_back(root);
    _threads.after(_chance.time(longestDelay), [this, root] {
        if (!root->isTakenBack)
            stand(*root);
    });
    return std::shared_ptr<void>(nullptr, [roots = _roots, root](void*) {
        const SimulatedThreads::Undisturbed ending;
        root->isTakenBack = true;
        std::erase(*roots, root);
    });
}

std::unique_ptr<platform::PathWatching> SimulatedPathWatching::withPathsOf(
    const platform::FileSystem&, const platform::Volumes&) const
{
    return std::make_unique<platform::StillPaths>();
}

void SimulatedPathWatching::stand(Root& root)
{
    root.stands = true;
    takePlace(root);
    if (hasChangedSince(root) || _mountsChanged >= root.since)
        root.handlers.changed({ Kind::anythingChanged, true, false, root.path });
    if (root.handlers.stands)
        root.handlers.stands();
}

/// Whether a folder at or below it, or the nearest folder above, may have changed before it was followed.
bool SimulatedPathWatching::hasChangedSince(const Root& root) const
{
    std::vector<const SimulatedDisk::Item*> folders;
    std::string way = root.place;
    while (!_disk.itemAt(way))
        way = platform::pathByRemovingLastComponent(way);
    folders.push_back(_disk.itemAt(way));
    if (folders.back()->parent)
        folders.push_back(folders.back()->parent);
    if (root.item == 0)
        return std::any_of(
            folders.begin(), folders.end(), [&](const auto* folder) { return folder->changed >= root.since; });
    for (std::size_t index = 0; index < folders.size(); ++index) {
        if (folders[index]->changed >= root.since)
            return true;
        for (const auto& item : folders[index]->items) {
            if (index != 1 && item->kind == ItemKind::folder)
                folders.push_back(item->mounted ? item->mounted : item.get());
        }
    }
    return false;
}

void SimulatedPathWatching::takePlace(Root& root) const
{
    root.place = _files.resolvedPath(root.path);
    const SimulatedDisk::Item* const item = _disk.placeOf(root.place).item;
    // A volume's top has no number of its own.
    root.item = !item ? 0 : item->number != 0 ? item->number : 1 + reinterpret_cast<std::uintptr_t>(item);
    root.isFolder = item && item->kind == ItemKind::folder;
}

bool SimulatedPathWatching::isReachable(const std::string& folder) const
{
    const SimulatedDisk::Item* const item = _disk.placeOf(folder).item;
    return item && item->isOpen;
}

void SimulatedPathWatching::diskChanged(const SimulatedDisk::Change& change)
{
    const std::string path = change.name.empty() ? change.folder : platform::pathJoined(change.folder, change.name);
    const bool isSeen
        = isReachable(change.name.empty() ? std::string(platform::pathByRemovingLastComponent(path)) : change.folder);
    for (const RootRef& root : std::vector(*_roots)) {
        if (root->stands && isSeen && root->item != 0 && platform::isSameOrBelow(path, root->place)
            && (path.size() > root->place.size() || change.name.empty() || !root->isFolder))
            report(
                root, { change.kind, change.isFolder, change.heldMore, root->path + path.substr(root->place.size()) });
    }
    if (change.kind != Kind::contentChanged && change.kind != Kind::arrivalEnded && change.kind != Kind::found)
        lookAtPlaces();
}

/// Tells of every watched path that leads to something else than before.
void SimulatedPathWatching::lookAtPlaces()
{
    for (const RootRef& root : std::vector(*_roots)) {
        if (!root->stands)
            continue;
        const std::uint64_t itemBefore = root->item;
        const std::string placeBefore = root->place;
        takePlace(*root);
        if (root->item != itemBefore || (root->item != 0 && root->place != placeBefore))
            tellNewPlace(root, itemBefore != 0);
    }
}

void SimulatedPathWatching::tellNewPlace(const RootRef& root, bool wasThere)
{
    const SimulatedDisk::Item* const item = _disk.placeOf(root->place).item;
    if (!item) {
        report(root, { Kind::disappeared, true, true, root->path });
    } else if (wasThere) {
        report(root, { Kind::anythingChanged, root->isFolder, false, root->path });
    } else {
        report(root, { Kind::appeared, root->isFolder, false, root->path });
        tellContents(root, *item, root->path);
    }
}

void SimulatedPathWatching::tellContents(
    const RootRef& root, const SimulatedDisk::Item& folder, const std::string& path)
{
    for (const auto& item : folder.items) {
        const std::string found = platform::pathJoined(path, item->name);
        report(root, { Kind::found, item->kind == ItemKind::folder, false, found });
        tellContents(root, *item, found);
    }
}

void SimulatedPathWatching::mountsChanged(const std::string& path)
{
    _mountsChanged = _threads.now();
    lookAtPlaces();
    for (const RootRef& root : std::vector(*_roots)) {
        if (root->stands && isOnTheWay(path, root->place))
            report(root, { Kind::anythingChanged, true, false, root->path });
    }
}

void SimulatedPathWatching::report(const RootRef& root, PathChange change)
{
    if (_drops)
        return;
    if (dropsOneIn != 0 && _chance.oneIn(dropsOneIn))
        return beginDropping();
    if (root->isPolled)
        return poll(root, change);
    if (_chance.oneIn(20))
        deliver(root, change);
    deliver(root, std::move(change));
}

void SimulatedPathWatching::deliver(const RootRef& root, PathChange change)
{
    const std::chrono::nanoseconds now = _threads.monotonic();
    root->lastDue = std::max(root->lastDue, now + _chance.time(longestDelay)) + std::chrono::nanoseconds(1);
    _threads.after(root->lastDue - now, [root, told = std::move(change)] {
        if (!root->isTakenBack)
            root->handlers.changed(told);
    });
}

/// A look tells which folders have changed, and of a file that is watched itself, that it has.
void SimulatedPathWatching::poll(const RootRef& root, const PathChange& change)
{
    const bool isRoot = change.path.size() <= root->path.size();
    const bool isContent = change.kind == Kind::contentChanged || change.kind == Kind::arrivalEnded;
    if (isContent && !isRoot)
        return;
    const bool isFolder = isRoot || change.kind == Kind::attributesChanged || change.kind == Kind::anythingChanged;
    if (root->polled.empty()) {
        const std::chrono::nanoseconds since = _threads.monotonic() % pollInterval;
        _threads.after(pollInterval - since, [root] {
            for (const std::string& folder : std::exchange(root->polled, {})) {
                const Kind kind = folder.size() > root->path.size() ? Kind::folderChanged : Kind::anythingChanged;
                if (!root->isTakenBack)
                    root->handlers.changed({ kind, true, false, folder });
            }
        });
    }
    root->polled.emplace(isFolder ? std::string_view(change.path) : platform::pathByRemovingLastComponent(change.path));
}

void SimulatedPathWatching::beginDropping()
{
    if (std::exchange(_drops, true))
        return;
    _threads.after(_chance.time(longestDelay), [this] { endDropping(); });
}

void SimulatedPathWatching::endDropping()
{
    _drops = false;
    for (const RootRef& root : std::vector(*_roots)) {
        if (root->stands)
            deliver(root, { Kind::anythingChanged, true, false, root->path });
    }
}

void SimulatedPathWatching::tell(std::string_view watchedPath, const PathChange& change)
{
    for (const RootRef& root : std::vector(*_roots)) {
        if (root->path == watchedPath && root->stands)
            root->handlers.changed(change);
    }
}

} // namespace tests
