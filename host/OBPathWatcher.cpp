// Who watches what, and since when; who is told is the lanes' matter.

#include "host/OBPathWatcher.h"

#include "host/FrameworkCore.h"
#include "host/OBMetadataQuery.h"
#include "host/QueryFollowing.h"
#include "host/ReportLane.h"
#include "platform/Notifications.h"
#include "platform/PathWatching.h"

#include <algorithm>
#include <atomic>
#include <cstddef>
#include <utility>

using platform::Locked;
using platform::Notification;
using platform::PathChange;

namespace {

/// The path that an observer is told of, for what was seen to happen.
std::string pathToReport(const PathChange& change, std::string_view watched)
{
    const std::size_t name = change.path.rfind('/');
    const bool isWatchedPath = change.path.size() <= watched.size();
    const std::string folder(change.path, 0, std::max<std::size_t>(name, 1));
    switch (change.kind) {
    case PathChange::Kind::appeared:
    case PathChange::Kind::disappeared:
    case PathChange::Kind::arrivalEnded:
        return isWatchedPath ? change.path : folder;
    case PathChange::Kind::contentChanged:
        // What a folder's list of hidden names says is about the folder.
        return !isWatchedPath && change.path.ends_with("/.hidden") ? folder : change.path;
    case PathChange::Kind::found:
        return {};
    default:
        return change.path;
    }
}

std::string textOf(const platform::WatchingProblem& problem)
{
    const std::string text = problem.path + ": looked at every 10 seconds: " + problem.cause;
    return problem.remedy.empty() ? text : text + "; to mend it: " + problem.remedy;
}

} // namespace

/// Counts the paths that are to be followed and are not yet. Any thread.
class PathsToStand {
public:
    explicit PathsToStand(std::function<void()> stands)
        : _stands(std::move(stands))
    {
    }

    /// One of them, until it stands or is given up.
    class One {
    public:
        explicit One(std::shared_ptr<PathsToStand> all)
            : _all(std::move(all))
        {
            ++_all->_count;
        }
        ~One()
        {
            if (!_isStanding)
                --_all->_count;
        }
        One(const One&) = delete;
        One& operator=(const One&) = delete;
        void stands()
        {
            if (!_isStanding.exchange(true) && --_all->_count == 0 && _all->_stands)
                _all->_stands();
        }

    private:
        const std::shared_ptr<PathsToStand> _all;
        std::atomic<bool> _isStanding { false };
    };

    bool isEmpty() const { return _count == 0; }

private:
    const std::function<void()> _stands;
    std::atomic<std::size_t> _count { 0 };
};

OBPathWatcherObserver::~OBPathWatcherObserver() = default;

void OBPathWatcherObserver::watchedPathChanged_fileChangedEventFlags(std::string_view, std::uint64_t) { }

void OBPathWatcherObserver::watchedQueryChanged_queryScope(const Notification&, const std::vector<std::string>&) { }

std::shared_ptr<void> OBPathWatcherObserver::lifeDuringCalls()
{
    return nullptr;
}

bool OBPathWatcherObserver::holdsReports() const
{
    return false;
}

bool OBPathWatcherObserver::performAlone(const std::function<void()>& call)
{
    call();
    return true;
}

std::optional<platform::Date> OBPathWatcherObserver::changesMatterSince() const
{
    return std::nullopt;
}

OBPathWatcher::OBPathWatcher()
    : OBPathWatcher(nullptr)
{
}

OBPathWatcher::OBPathWatcher(FrameworkCore* core)
    : _core(core)
{
}

OBPathWatcher::~OBPathWatcher() = default;

std::shared_ptr<OBPathWatcher> OBPathWatcher::sharedPathWatcher()
{
    const auto core = FrameworkCore::current();
    return core ? std::shared_ptr<OBPathWatcher>(core, &core->pathWatcher()) : nullptr;
}

bool OBPathWatcher::watchPathIsUnique_observer(std::string_view path, const OBPathWatcherObserver* observer) const
{
    Locked guard(_lock);
    const auto known = _registrations.find(observer);
    if (known == _registrations.end())
        return true;
    return known->second.namesOfPaths.count(std::string(path)) == 0;
}

void OBPathWatcher::watchPath_observer(std::string_view path, OBPathWatcherObserver* observer)
{
    const platform::Date since = changesMatterSince(*observer);
    Locked guard(_lock);
    Registrations& registrations = registrationsOf(observer);
    if (!registrations.namesOfPaths.insert(std::string(path)).second)
        return;
    WatchedPath& added = registrations.paths.emplace_back(WatchedPath { std::string(path), since });
    if (_follows)
        startPath(added, *observer);
}

void OBPathWatcher::watchQuery_observer_queryScope_queryRunMode(
    std::string_view query, OBPathWatcherObserver* observer, std::vector<std::string> scope, int runMode)
{
    WatchedQuery registration { { std::string(query), std::move(scope), runMode }, changesMatterSince(*observer) };
    Registrations replaced;
    std::string problem;
    {
        Locked guard(_lock);
        std::vector<WatchedQuery>& queries = registrationsOf(observer).queries;
        auto known = std::find_if(
            queries.begin(), queries.end(), [&](const WatchedQuery& other) { return other.query.text == query; });
        if (known == queries.end())
            known = queries.insert(known, std::move(registration));
        else if (known->query.scope != registration.query.scope || known->query.runMode != runMode)
            replaced.queries.push_back(std::exchange(*known, std::move(registration)));
        closeLanes(replaced);
        if (_follows && !known->watch)
            problem = startQuery(*known, *observer);
    }
    if (!problem.empty())
        _core->logOnce(problem, nullptr);
    stop(replaced);
}

void OBPathWatcher::removeObserver(const OBPathWatcherObserver* observer)
{
    Registrations removed;
    {
        Locked guard(_lock);
        if (auto known = _registrations.extract(observer))
            removed = std::move(known.mapped());
        closeLanes(removed);
    }
    stop(removed);
}

void OBPathWatcher::resumeReports(const OBPathWatcherObserver* observer)
{
    for (const auto& lane : lanesOf(observer))
        lane->resume();
}

bool OBPathWatcher::isAtRest(const OBPathWatcherObserver* observer) const
{
    const std::vector<std::shared_ptr<ReportLane>> lanes = lanesOf(observer);
    return std::all_of(lanes.begin(), lanes.end(), [](const auto& lane) { return lane->isAtRest(); });
}

/// Those that follow; they are asked without the lock.
std::vector<std::shared_ptr<ReportLane>> OBPathWatcher::lanesOf(const OBPathWatcherObserver* observer) const
{
    Locked guard(_lock);
    const auto known = _registrations.find(observer);
    return known == _registrations.end() ? std::vector<std::shared_ptr<ReportLane>> {} : lanesIn(known->second);
}

std::vector<std::shared_ptr<ReportLane>> OBPathWatcher::lanesIn(const Registrations& registrations)
{
    std::vector<std::shared_ptr<ReportLane>> lanes;
    for (const WatchedPath& path : registrations.paths)
        lanes.push_back(path.lane);
    for (const WatchedQuery& query : registrations.queries)
        lanes.push_back(query.lane);
    std::erase(lanes, nullptr);
    return lanes;
}

std::vector<std::string> OBPathWatcher::pathsWatchedBy(const OBPathWatcherObserver* observer) const
{
    Locked guard(_lock);
    std::vector<std::string> paths;
    if (const auto known = _registrations.find(observer); known != _registrations.end()) {
        for (const WatchedPath& path : known->second.paths)
            paths.push_back(path.path);
    }
    return paths;
}

std::vector<OBPathWatcher::Query> OBPathWatcher::queriesWatchedBy(const OBPathWatcherObserver* observer) const
{
    Locked guard(_lock);
    std::vector<Query> queries;
    if (const auto known = _registrations.find(observer); known != _registrations.end()) {
        for (const WatchedQuery& query : known->second.queries)
            queries.push_back(query.query);
    }
    return queries;
}

void OBPathWatcher::follow(const OBFollowOptions& options)
{
    _callsOnMainThread = options.callsOnMainThread;
    std::vector<std::string> problems;
    {
        Locked guard(_lock);
        if (std::exchange(_follows, true))
            return;
        _options = options;
        _toStand = std::make_shared<PathsToStand>(options.stands);
        for (auto& [observer, registered] : _registrations) {
            for (WatchedPath& path : registered.paths)
                startPath(path, *registered.observer);
            for (WatchedQuery& query : registered.queries)
                problems.push_back(startQuery(query, *registered.observer));
        }
    }
    for (const std::string& problem : problems) {
        if (!problem.empty())
            _core->logOnce(problem, nullptr);
    }
}

bool OBPathWatcher::pathsStand() const
{
    Locked guard(_lock);
    return !_toStand || _toStand->isEmpty();
}

/// The lanes stay registered until their calls have ended, so that whoever takes an observer back meanwhile waits for
/// them too.
void OBPathWatcher::stopFollowing()
{
    AllRegistrations before;
    {
        Locked guard(_lock);
        _follows = false;
        before = _registrations;
        for (auto& [observer, registered] : _registrations) {
            for (WatchedPath& path : registered.paths)
                path.watch = nullptr;
            for (WatchedQuery& query : registered.queries)
                query.watch = nullptr;
            closeLanes(registered);
        }
    }
    for (auto& [observer, stopped] : before)
        stop(stopped);
}

OBPathWatcher::Registrations& OBPathWatcher::registrationsOf(OBPathWatcherObserver* observer)
{
    Registrations& registered = _registrations[observer];
    registered.observer = observer;
    return registered;
}

void OBPathWatcher::startPath(WatchedPath& path, OBPathWatcherObserver& observer)
{
    path.lane = std::make_shared<ReportLane>(*_core, observer, path.path, std::string(),
        [&observer](const std::string& report) { observer.watchedPathChanged_fileChangedEventFlags(report, 0); });
    const auto changed = [lane = path.lane, watched = path.path](const PathChange& change) {
        if (const std::string report = pathToReport(change, watched); !report.empty())
            lane->add(report);
    };
    const auto failed
        = [core = _core->weak_from_this(), tell = _options.failed](const platform::WatchingProblem& problem) {
              if (const auto alive = core.lock())
                  alive->logOnce(textOf(problem), nullptr);
              if (tell)
                  tell(problem);
          };
    const auto stands = [one = std::make_shared<PathsToStand::One>(_toStand)] { one->stands(); };
    path.watch = _core->platform().pathWatching.watch(path.path, path.since, { changed, stands, failed });
}

/// Answers what is wrong with the query; empty when it is followed. The log is the application's, and no place to go to
/// under a lock.
std::string OBPathWatcher::startQuery(WatchedQuery& query, OBPathWatcherObserver& observer)
{
    const OBMetadataQuery::ParseResult parsed = OBMetadataQuery::parse(query.query.text);
    if (!parsed.query)
        return query.query.text + ": " + parsed.problem;
    query.lane = std::make_shared<ReportLane>(*_core, observer, std::string(platform::metadataQueryUpdatedNotification),
        "files came or went: " + query.query.text, [&observer, scope = query.query.scope](const std::string& name) {
            observer.watchedQueryChanged_queryScope({ platform::Text(name) }, scope);
        });
    const auto tell = [lane = query.lane](std::string_view name) { lane->add(std::string(name)); };
    query.watch = followQuery(*_core, parsed.query, query.query.scope, query.since, tell);
    return {};
}

platform::Date OBPathWatcher::changesMatterSince(const OBPathWatcherObserver& observer) const
{
    if (const std::optional<platform::Date> since = observer.changesMatterSince())
        return *since;
    return _core ? _core->platform().pathWatching.timeOfChangesNow() : platform::Date {};
}

/// In the same moment in which the registrations change, so that nothing is told of them from then on.
void OBPathWatcher::closeLanes(const Registrations& registrations)
{
    for (const auto& lane : lanesIn(registrations))
        lane->close();
}

/// The watches first: they feed the lanes.
void OBPathWatcher::stop(Registrations& registrations)
{
    for (WatchedPath& path : registrations.paths)
        path.watch = nullptr;
    for (WatchedQuery& query : registrations.queries)
        query.watch = nullptr;
    for (const auto& lane : lanesIn(registrations))
        lane->waitForCalls();
}
