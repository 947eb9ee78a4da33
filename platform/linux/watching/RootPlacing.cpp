#include "platform/linux/watching/RootPlacing.h"

#include "platform/PathText.h"
#include "platform/linux/watching/WatchingProblems.h"

#include <algorithm>
#include <set>
#include <string>
#include <utility>

namespace platform {

namespace {

    std::string pathOf(const PlaceStep& step)
    {
        return pathJoined(step.folder, step.name);
    }

    std::string lastStepOf(const WatchedPlace& place)
    {
        return place.steps.empty() ? std::string() : pathOf(place.steps.back());
    }

} // namespace

void RootPlacing::begin(AddedWatch added)
{
    WatchedRoot& root = _context.roots.add(std::move(added));
    // Where another thread had found it, it is not any more.
    root.mustTell = root.history.isPlaced;
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
    if (const std::optional<std::string> device = otherThread(place))
        return handOver(root, place, *device);
    root.history.devicesPassed = devicesBefore(place, _context.ownDevice());
    if (!isWatched)
        pollWay(root, place);
    else if (std::exchange(root.isWayPolled, false))
        _context.polling.removePath(root.watch->number);
    // Where a way leads that is not to be touched here, the thread that polls it finds out.
    if (!place.endsEarly)
        arrive(root, std::move(place));
}

WatchedPlace RootPlacing::placeOf(const WatchedRoot& root) const
{
    const std::string own = _context.ownDevice();
    const auto mayLook = [&](std::string_view path) {
        const std::string device = _context.mounts.deviceAt(path);
        const bool isOnTheWay = device.empty() || device == own || root.history.devicesPassed.contains(device);
        return isOnTheWay && !_context.mounts.holds(path);
    };
    return placeOfPath(_context.files, root.path(), mayLook);
}

// The device whose thread is to follow what leads to `place`; none where this one is to.
std::optional<std::string> RootPlacing::otherThread(const WatchedPlace& place) const
{
    const std::string reached = lastStepOf(place);
    if (place.endsEarly && !_context.mounts.holds(reached))
        return _context.mounts.deviceAt(reached);
    const auto isOwn = [&](const PlaceStep& step) { return _context.mounts.deviceAt(pathOf(step)) == _context.device; };
    if (_context.device == DeviceWatchers::first || std::any_of(place.steps.begin(), place.steps.end(), isOwn))
        return std::nullopt;
    return DeviceWatchers::first;
}

// Over which the way leads before it reaches `device`.
std::set<std::string> RootPlacing::devicesBefore(const WatchedPlace& place, const std::string& device) const
{
    std::set<std::string> devices;
    for (const PlaceStep& step : place.steps) {
        std::string next = _context.mounts.deviceAt(pathOf(step));
        if (next == device)
            break;
        devices.insert(std::move(next));
    }
    return devices;
}

void RootPlacing::handOver(WatchedRoot& root, const WatchedPlace& place, const std::string& device)
{
    const std::shared_ptr<const PathWatch> watch = root.watch;
    RootHistory history = std::move(root.history);
    // Its way begins anew with the first.
    history.devicesPassed = device == DeviceWatchers::first ? std::set<std::string>() : devicesBefore(place, device);
    end(watch->number);
    _context.watchers.handOver(watch, device, std::move(history));
}

// Watches the way to where `root` leads, as far as it can be watched, and answers whether it can; `place` becomes where
// that is.
bool RootPlacing::watchWay(WatchedRoot& root, WatchedPlace& place)
{
    constexpr int triesAtMost = 8;
    place = placeOf(root);
    bool isWatched = true;
    // What changed before the watches stood is seen by going the way once more. So is a folder on the way to what is
    // missing that could not be watched yet.
    for (int tries = 0; tries < triesAtMost && !otherThread(place); ++tries) {
        isWatched = watchSteps(root, place) && !place.endsEarly;
        WatchedPlace again = placeOf(root);
        const bool isSame = again.isSamePlace(place) && again.reached == place.reached && again.steps == place.steps;
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
        const std::string path = pathOf(*step);
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
    if (place.endsEarly && !place.steps.empty()) {
        const std::string reached = lastStepOf(place);
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
    const bool isFirst = !std::exchange(root.history.isPlaced, true);
    // Its entry may have gone elsewhere with one above it, by a report that is older than the look at the place.
    const bool isAstray = root.folder != WatchedFolders::none && _context.folders.atPath(place.path) != root.folder;
    const bool isOther = std::exchange(root.mustTell, false) || isFirst || isAstray || !place.isSamePlace(root.place);
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
    if (_context.folders.isMarked(folder, WatchedFolders::polled) && !root.history.stands)
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

void RootPlacing::takeMounts(PolledMounts mounts, const std::vector<std::string>& points)
{
    _context.mounts = std::move(mounts);
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
