#include "platform/linux/watching/RootPlacing.h"

#include "platform/PathText.h"
#include "platform/linux/watching/WatchingProblems.h"

#include <algorithm>
#include <set>
#include <string>
#include <utility>

namespace platform {

void RootPlacing::begin(const std::shared_ptr<const PathWatch>& watch)
{
    WatchedRoot& root = _context.roots.add(watch);
    if (!_context.inotify.isOpen()) {
        WatchingProblem problem = noInotifyInstance();
        problem.path = root.path();
        _context.roots.tellProblem(root, problem);
    }
    follow(root);
}

void RootPlacing::end(std::uint64_t watch)
{
    WatchedRoot* const root = _context.roots.find(watch);
    if (!root)
        return;
    _context.polling.removePath(watch);
    lead(*root, WatchedFolders::none);
    settleSteps(_context.roots.setSteps(*root, {}));
    _context.roots.remove(watch);
}

void RootPlacing::followNoted()
{
    // What is found on one way may concern another one; whoever changes ways without end must not hold up the rest.
    constexpr int roundsAtMost = 16;
    for (int round = 0; round < roundsAtMost && _context.roots.haveNotes(); ++round) {
        for (WatchedRoot* const root : _context.roots.takeNoted())
            follow(*root);
    }
}

void RootPlacing::followAllAnew()
{
    _context.roots.forEach([this](WatchedRoot& root) {
        root.mustTell = true;
        follow(root);
    });
}

void RootPlacing::follow(WatchedRoot& root)
{
    WatchedPlace place;
    const bool isWatched = watchWay(root, place);
    if (!isWatched)
        pollWay(root, place);
    else if (std::exchange(root.isWayPolled, false))
        _context.polling.removePath(root.watch->number);
    // Where a way leads that is not to be touched here, its own thread finds out.
    if (!place.isPolled)
        arrive(root, std::move(place));
}

// Watches the way to where `root` leads, as far as it can be watched, and answers whether it can; `place` becomes where
// that is.
bool RootPlacing::watchWay(WatchedRoot& root, WatchedPlace& place)
{
    constexpr int triesAtMost = 8;
    place = placeOfPath(_context.files, root.path(), _context.mounts);
    bool isWatched = true;
    // What changed before the watches stood is seen by going the way once more.
    for (int tries = 0; tries < triesAtMost; ++tries) {
        isWatched = watchSteps(root, place) && !place.isPolled;
        WatchedPlace again = placeOfPath(_context.files, root.path(), _context.mounts);
        const bool isSame = again.isSamePlace(place) && again.steps == place.steps;
        place = std::move(again);
        if (isSame)
            break;
    }
    return isWatched;
}

bool RootPlacing::watchSteps(WatchedRoot& root, const WatchedPlace& place)
{
    std::vector<std::pair<WatchedFolders::Number, WatchedRoots::Step>> steps;
    std::set<std::string> watched;
    bool isRefused = false;
    // From the last to the first: a folder that tells of its own moves saves the one that holds it from having to tell
    // of all that comes and goes beside it. What the way leads to is told of by both, for an open folder that is
    // deleted says so only once it is closed.
    for (auto step = place.steps.rbegin(); step != place.steps.rend(); ++step) {
        if (_context.mounts.holds(step->folder))
            continue;
        const std::string path = pathJoined(step->folder, step->name);
        const bool isPlace = path == place.path;
        unsigned marks = 0;
        if (isPlace || watched.count(path) == 0)
            marks |= WatchedFolders::namesMatter;
        if (isPlace && place.kind == WatchedPlace::Kind::other)
            marks |= WatchedFolders::holdsWatchedFile;
        const FolderFollowing::WayFolder folder = _following.folderOnTheWay(step->folder, marks);
        isRefused = isRefused || folder.isRefused;
        if (folder.isWatched)
            watched.insert(step->folder);
        if (folder.entry != WatchedFolders::none)
            steps.push_back({ folder.entry, { &root, step->name, isPlace } });
    }
    settleSteps(_context.roots.setSteps(root, steps));
    return !isRefused;
}

void RootPlacing::settleSteps(const std::vector<WatchedFolders::Number>& folders)
{
    for (const WatchedFolders::Number folder : folders) {
        _context.folders.unmark(
            folder, WatchedFolders::onTheWay | WatchedFolders::holdsWatchedFile | WatchedFolders::namesMatter);
        _following.settle(folder);
    }
}

void RootPlacing::pollWay(WatchedRoot& root, const WatchedPlace& place)
{
    std::string device = _context.mounts.deviceAt(root.path());
    if (place.isPolled && !place.steps.empty()) {
        const std::string reached = pathJoined(place.steps.back().folder, place.steps.back().name);
        device = _context.mounts.deviceAt(reached);
        WatchingProblem problem = changedByOthers(_context.mounts.typeAt(reached));
        problem.path = root.path();
        _context.roots.tellProblem(root, problem);
    }
    root.isWayPolled = true;
    _context.polling.addPath(device, root.watch->number, root.path());
}

void RootPlacing::arrive(WatchedRoot& root, WatchedPlace place)
{
    const bool isFirst = !std::exchange(root.isPlaced, true);
    const bool isOther = std::exchange(root.mustTell, false) || isFirst || !place.isSamePlace(root.place);
    root.place = std::move(place);
    if (!isOther)
        return;
    const Date since = isFirst ? root.watch->since : FolderFollowing::never;
    const FolderFollowing::Look look = lookThroughPlace(root, since);
    _context.countWatches();
    if (!isFirst || look.hasChangedSince || root.place.changed >= since || _context.mountsSeen.haveChangedSince(since))
        _context.roots.tellAnything(root);
    if (root.awaitedLook.empty())
        _context.roots.tellStanding(root);
}

FolderFollowing::Look RootPlacing::lookThroughPlace(WatchedRoot& root, Date since)
{
    root.awaitedLook.clear();
    const bool isFolder = root.place.kind == WatchedPlace::Kind::folder;
    const WatchedFolders::Number folder = isFolder ? _following.entryAt(root.place.path) : WatchedFolders::none;
    lead(root, folder);
    if (folder == WatchedFolders::none)
        return {};
    const FolderFollowing::Look look = _following.lookThrough(folder, since);
    if (_context.folders.isMarked(folder, WatchedFolders::polled) && !root.stands)
        root.awaitedLook = root.place.path;
    return look;
}

// Has `root` lead to another entry, and lets go of the one before.
void RootPlacing::lead(WatchedRoot& root, WatchedFolders::Number folder)
{
    const WatchedFolders::Number before = root.folder;
    if (before == folder)
        return;
    _context.roots.setFolder(root, folder);
    if (before != WatchedFolders::none)
        _following.release(before);
}

void RootPlacing::take(const PollingReport& report)
{
    if (report.change)
        _context.roots.tellByRealPath(*report.change);
    WatchedRoot* const root = report.watch != 0 ? _context.roots.find(report.watch) : nullptr;
    if (root && root->isWayPolled)
        arrive(*root, report.place);
    if (report.folderLookedThrough.empty())
        return;
    _context.roots.forEach([&](WatchedRoot& each) {
        if (report.hasChangedSince && isSameOrBelow(report.folderLookedThrough, each.place.path))
            _context.roots.tellAnything(each);
        if (each.awaitedLook == report.folderLookedThrough) {
            each.awaitedLook.clear();
            _context.roots.tellStanding(each);
        }
    });
}

void RootPlacing::takeMounts(PolledMounts mounts)
{
    const std::vector<std::string> points = changedMountPoints(_context.mounts.table(), mounts.table());
    _context.mounts = std::move(mounts);
    if (points.empty())
        return;
    for (const std::string& point : points) {
        const WatchedFolders::Number folder = _context.folders.atPath(point);
        if (folder != WatchedFolders::none && _context.folders.isMarked(folder, WatchedFolders::followed))
            _following.lookThrough(folder, FolderFollowing::never);
    }
    // Names of volumes lead elsewhere now, so every path is followed again.
    _context.roots.forEach([&](WatchedRoot& root) {
        root.mustTell = root.mustTell || std::any_of(points.begin(), points.end(), [&](const std::string& point) {
            return isSameOrBelow(point, root.place.path) || isSameOrBelow(root.place.path, point);
        });
        follow(root);
    });
}

} // namespace platform
