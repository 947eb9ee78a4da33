#include "platform/linux/watching/WatchedRoots.h"

#include "platform/PathText.h"

#include <algorithm>
#include <utility>

namespace platform {

namespace {

    template <class Map, class Matches> void eraseWhere(Map& map, WatchedFolders::Number folder, const Matches& matches)
    {
        const auto [first, last] = map.equal_range(folder);
        for (auto entry = first; entry != last;)
            entry = matches(entry->second) ? map.erase(entry) : std::next(entry);
    }

} // namespace

WatchedRoot& WatchedRoots::add(AddedWatch added)
{
    const std::uint64_t number = added.watch->number;
    WatchedRoot& root = _roots.emplace(number, WatchedRoot { std::move(added.watch) }).first->second;
    root.history = std::move(added.history);
    return root;
}

WatchedRoot* WatchedRoots::find(std::uint64_t number)
{
    const auto found = _roots.find(number);
    return found == _roots.end() ? nullptr : &found->second;
}

void WatchedRoots::setFolder(WatchedRoot& root, WatchedFolders::Number folder)
{
    if (root.folder != WatchedFolders::none) {
        eraseWhere(_byFolder, root.folder, [&](const WatchedRoot* other) { return other == &root; });
        if (_byFolder.find(root.folder) == _byFolder.end())
            _folders.unmark(root.folder, WatchedFolders::isWatchedPath);
    }
    root.folder = folder;
    if (folder != WatchedFolders::none) {
        _byFolder.emplace(folder, &root);
        _folders.mark(folder, WatchedFolders::isWatchedPath);
    }
}

std::vector<WatchedFolders::Number> WatchedRoots::setSteps(
    WatchedRoot& root, const std::vector<std::pair<WatchedFolders::Number, Step>>& steps)
{
    std::vector<WatchedFolders::Number> before = std::exchange(root.folderOfSteps, {});
    for (const WatchedFolders::Number folder : before)
        eraseWhere(_steps, folder, [&](const Step& step) { return step.root == &root; });
    for (const auto& [folder, step] : steps) {
        _steps.emplace(folder, step);
        root.folderOfSteps.push_back(folder);
    }
    const auto isInUse = [this](WatchedFolders::Number folder) { return _steps.find(folder) != _steps.end(); };
    before.erase(std::remove_if(before.begin(), before.end(), isInUse), before.end());
    std::sort(before.begin(), before.end());
    before.erase(std::unique(before.begin(), before.end()), before.end());
    return before;
}

void WatchedRoots::noteStep(WatchedFolders::Number folder, std::string_view name, bool isOther)
{
    const auto [first, last] = _steps.equal_range(folder);
    for (auto entry = first; entry != last; ++entry) {
        if (entry->second.name != name)
            continue;
        WatchedRoot& root = *entry->second.root;
        root.mustFollowAgain = _hasNotes = true;
        const bool wasUnread
            = root.folder != WatchedFolders::none && _folders.isMarked(root.folder, WatchedFolders::unread);
        root.mustTell = root.mustTell || (entry->second.isPlace && (isOther || wasUnread));
    }
}

void WatchedRoots::noteFolder(WatchedFolders::Number folder, bool isGone)
{
    const auto [firstStep, lastStep] = _steps.equal_range(folder);
    for (auto entry = firstStep; entry != lastStep; ++entry)
        entry->second.root->mustFollowAgain = _hasNotes = true;
    const auto [first, last] = _byFolder.equal_range(folder);
    for (auto entry = first; entry != last; ++entry) {
        entry->second->mustFollowAgain = _hasNotes = true;
        entry->second->mustTell = entry->second->mustTell || isGone;
    }
}

void WatchedRoots::noteAbove(WatchedFolders::Number folder)
{
    for (; folder != WatchedFolders::none; folder = _folders.parent(folder)) {
        if (_folders.isMarked(folder, WatchedFolders::isWatchedPath))
            noteFolder(folder, true);
    }
}

void WatchedRoots::folderIsGone(WatchedFolders::Number folder)
{
    noteFolder(folder, true);
    const auto [firstStep, lastStep] = _steps.equal_range(folder);
    for (auto entry = firstStep; entry != lastStep; ++entry) {
        std::vector<WatchedFolders::Number>& folders = entry->second.root->folderOfSteps;
        folders.erase(std::remove(folders.begin(), folders.end(), folder), folders.end());
    }
    _steps.erase(folder);
    const auto [first, last] = _byFolder.equal_range(folder);
    for (auto entry = first; entry != last; ++entry)
        entry->second->folder = WatchedFolders::none;
    _byFolder.erase(folder);
}

std::vector<WatchedRoot*> WatchedRoots::takeNoted()
{
    std::vector<WatchedRoot*> noted;
    for (auto& [number, root] : _roots) {
        if (std::exchange(root.mustFollowAgain, false))
            noted.push_back(&root);
    }
    _hasNotes = false;
    return noted;
}

void WatchedRoots::tell(WatchedFolders::Number folder, std::string_view name, PathChange change)
{
    if (!_folders.isMarked(folder, WatchedFolders::followed))
        return;
    _chain.clear();
    for (WatchedFolders::Number above = folder; above != WatchedFolders::none; above = _folders.parent(above)) {
        _chain.push_back(above);
        if (!_folders.isMarked(above, WatchedFolders::isWatchedPath))
            continue;
        const auto [first, last] = _byFolder.equal_range(above);
        for (auto entry = first; entry != last; ++entry) {
            change.path = entry->second->path();
            for (std::size_t index = _chain.size() - 1; index-- > 0;)
                change.path = pathJoined(change.path, _folders.name(_chain[index]));
            if (!name.empty())
                change.path = pathJoined(change.path, name);
            send(*entry->second, change);
        }
    }
}

void WatchedRoots::tellOfFile(WatchedFolders::Number folder, std::string_view name)
{
    const auto [first, last] = _steps.equal_range(folder);
    for (auto entry = first; entry != last; ++entry) {
        const Step& step = entry->second;
        if (step.isPlace && step.name == name && step.root->place.kind == WatchedPlace::Kind::other)
            send(*step.root, { PathChange::Kind::contentChanged, false, false, step.root->path() });
    }
}

std::string WatchedRoots::spelledPath(const WatchedRoot& root, std::string_view below) const
{
    return pathJoined(root.path(), pathRelativeTo(below, root.place.path));
}

void WatchedRoots::tellByRealPath(const PathChange& change)
{
    for (auto& [number, root] : _roots) {
        if (root.place.kind != WatchedPlace::Kind::folder || !isSameOrBelow(change.path, root.place.path))
            continue;
        PathChange told = change;
        told.path = spelledPath(root, change.path);
        send(root, told);
    }
}

void WatchedRoots::tellAnything(WatchedRoot& root)
{
    send(root, { PathChange::Kind::anythingChanged, false, false, root.path() });
}

void WatchedRoots::tellStanding(WatchedRoot& root)
{
    if (!std::exchange(root.history.stands, true) && root.watch->handlers.stands)
        _queue.call(*root.watch, root.watch->handlers.stands);
}

void WatchedRoots::tellProblem(std::string_view realPath, WatchingProblem problem)
{
    for (auto& [number, root] : _roots) {
        if (!isSameOrBelow(realPath, root.place.path))
            continue;
        problem.path = spelledPath(root, realPath);
        tellProblem(root, problem);
    }
}

void WatchedRoots::tellProblem(WatchedRoot& root, const WatchingProblem& problem)
{
    if (root.history.causesTold.insert(problem.cause).second && root.watch->handlers.failed)
        _queue.call(*root.watch, [&] { root.watch->handlers.failed(problem); });
}

void WatchedRoots::send(const WatchedRoot& root, const PathChange& change)
{
    if (root.watch->handlers.changed)
        _queue.call(*root.watch, [&] { root.watch->handlers.changed(change); });
}

} // namespace platform
