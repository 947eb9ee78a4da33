#include "host/OBPathWatcher.h"

#include "host/FrameworkCore.h"

#include <algorithm>
#include <utility>

using platform::Locked;

OBPathWatcherObserver::~OBPathWatcherObserver() = default;

void OBPathWatcherObserver::watchedPathChanged_fileChangedEventFlags(std::string_view, std::uint64_t) { }

void OBPathWatcherObserver::watchedQueryChanged_queryScope(
    const platform::Notification&, const std::vector<std::string>&)
{
}

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
    const std::vector<std::string>& paths = known->second.paths;
    return std::find(paths.begin(), paths.end(), path) == paths.end();
}

void OBPathWatcher::watchPath_observer(std::string_view path, OBPathWatcherObserver* observer)
{
    Locked guard(_lock);
    std::vector<std::string>& paths = _registrations[observer].paths;
    if (std::find(paths.begin(), paths.end(), path) == paths.end())
        paths.emplace_back(path);
}

void OBPathWatcher::watchQuery_observer_queryScope_queryRunMode(
    std::string_view query, OBPathWatcherObserver* observer, std::vector<std::string> scope, int runMode)
{
    Query registration { std::string(query), std::move(scope), runMode };
    Locked guard(_lock);
    std::vector<Query>& queries = _registrations[observer].queries;
    const auto known
        = std::find_if(queries.begin(), queries.end(), [&](const Query& other) { return other.text == query; });
    if (known != queries.end())
        *known = std::move(registration);
    else
        queries.push_back(std::move(registration));
}

void OBPathWatcher::removeObserver(const OBPathWatcherObserver* observer)
{
    Locked guard(_lock);
    _registrations.erase(observer);
}

std::vector<std::string> OBPathWatcher::pathsWatchedBy(const OBPathWatcherObserver* observer) const
{
    Locked guard(_lock);
    const auto known = _registrations.find(observer);
    return known != _registrations.end() ? known->second.paths : std::vector<std::string>();
}

std::vector<OBPathWatcher::Query> OBPathWatcher::queriesWatchedBy(const OBPathWatcherObserver* observer) const
{
    Locked guard(_lock);
    const auto known = _registrations.find(observer);
    return known != _registrations.end() ? known->second.queries : std::vector<Query>();
}
