#include "host/LiveQueryTable.h"

#include "host/FrameworkCore.h"
#include "host/OBMetadataQuery.h"
#include "platform/FileSystem.h"
#include "platform/PathText.h"

#include <algorithm>
#include <utility>

using platform::Locked;
using platform::PathChange;

namespace {

constexpr std::size_t mostTasks = 4096;

PathChange walkOf(const std::string& path)
{
    return { PathChange::Kind::anythingChanged, true, false, path };
}

} // namespace

std::shared_ptr<void> LiveQueryTable::follow(FrameworkCore& core, const std::shared_ptr<const OBMetadataQuery>& query,
    const std::vector<std::string>& scope, platform::Date since, OBLiveQueryHandlers handlers)
{
    const auto table = std::make_shared<LiveQueryTable>(core, query, scope, std::move(handlers));
    for (std::size_t index = 0; index < scope.size(); ++index)
        table->watch(index, since);
    if (scope.empty())
        table->tellGathered();
    return std::shared_ptr<void>(nullptr, [table](void*) {
        table->_takenBack = true;
        table->_watches.clear();
    });
}

LiveQueryTable::LiveQueryTable(FrameworkCore& core, std::shared_ptr<const OBMetadataQuery> query,
    const std::vector<std::string>& scope, OBLiveQueryHandlers handlers)
    : _core(core)
    , _query(std::move(query))
    , _handlers(std::move(handlers))
{
    for (const std::string& folder : scope)
        _scopes.push_back({ folder });
}

/// What is there is gathered once everything is followed, so that nothing is missed in between.
void LiveQueryTable::watch(std::size_t scope, platform::Date since)
{
    const std::weak_ptr<LiveQueryTable> table = weak_from_this();
    const auto changed = [table, scope](const PathChange& change) {
        if (const auto alive = table.lock())
            alive->add({ scope, change });
    };
    const auto stands = [table, scope, folder = _scopes[scope].folder] {
        if (const auto alive = table.lock())
            alive->add({ scope, walkOf(folder), true });
    };
    _watches.push_back(
        _core.platform().pathWatching.watch(_scopes[scope].folder, since, { changed, stands, _handlers.failed }));
}

void LiveQueryTable::add(Task task)
{
    {
        Locked guard(_lock);
        _tasks.push_back(std::move(task));
        if (_tasks.size() > mostTasks) {
            std::erase_if(_tasks, [](const Task& waiting) { return !waiting.gathers; });
            for (std::size_t index = 0; index < _scopes.size(); ++index)
                _tasks.push_back({ index, walkOf(_scopes[index].folder) });
        }
        if (std::exchange(_works, true))
            return;
    }
    _core.deliveryThreads().run([table = shared_from_this()] { table->work(); });
}

void LiveQueryTable::work()
{
    Task first {};
    while (takeFirst(first))
        perform(first);
}

bool LiveQueryTable::takeFirst(Task& first)
{
    Locked guard(_lock);
    if (_takenBack)
        _tasks.clear();
    _works = !_tasks.empty();
    if (!_works)
        return false;
    first = std::move(_tasks.front());
    _tasks.pop_front();
    return true;
}

void LiveQueryTable::perform(const Task& task)
{
    Scope& scope = _scopes[task.scope];
    const PathChange& change = task.change;
    // What came before everything is looked at will be seen then.
    if (!scope.isGathered && !task.gathers)
        return;
    switch (change.kind) {
    case PathChange::Kind::appeared:
    case PathChange::Kind::found:
        if (!change.isFolder)
            lookAtFile(scope, change.path);
        break;
    case PathChange::Kind::contentChanged:
    case PathChange::Kind::arrivalEnded:
        lookAtFile(scope, change.path);
        break;
    case PathChange::Kind::disappeared:
        forget(scope, change.path);
        break;
    case PathChange::Kind::folderChanged:
    case PathChange::Kind::attributesChanged:
        lookAtFolder(scope, change.path);
        break;
    default:
        walk(scope, change.path);
    }
    if (task.gathers && !std::exchange(scope.isGathered, true)) {
        if (std::all_of(_scopes.begin(), _scopes.end(), [](const Scope& other) { return other.isGathered; }))
            tellGathered();
    }
}

void LiveQueryTable::lookAtFile(Scope& scope, const std::string& path)
{
    const bool matches = _query->matches(_core.platform(), path);
    const bool matched = scope.matching.contains(path);
    if (matches != matched)
        replace(scope, matched ? Paths { path } : Paths {}, matches ? Paths { path } : Paths {});
}

LiveQueryTable::Paths LiveQueryTable::matchingAtOrBelow(const Scope& scope, const std::string& path)
{
    Paths found;
    if (scope.matching.contains(path))
        found.insert(path);
    const std::string prefix = path + "/";
    auto file = scope.matching.lower_bound(prefix);
    for (; file != scope.matching.end() && file->starts_with(prefix); ++file)
        found.insert(*file);
    return found;
}

/// The files directly in a folder.
void LiveQueryTable::lookAtFolder(Scope& scope, const std::string& path)
{
    Paths before = matchingAtOrBelow(scope, path);
    std::erase_if(before, [&](const std::string& file) { return file.find('/', path.size() + 1) != file.npos; });
    Paths now;
    const platform::FolderListing listing = _core.platform().fileSystem.itemsInFolder(path, {});
    for (const platform::FolderItem item : listing) {
        std::string file = platform::pathJoined(path, item.name);
        if (item.kind == platform::ItemKind::file && _query->matches(_core.platform(), file))
            now.insert(std::move(file));
    }
    replace(scope, before, now);
}

/// Everything at or below a path.
void LiveQueryTable::walk(Scope& scope, const std::string& path)
{
    const Paths before = matchingAtOrBelow(scope, path);
    Paths now;
    const auto take = [&](std::string_view file) { now.emplace(file); };
    if (_query->gather(_core.platform(), path, take, [this] { return _takenBack.load(); }))
        replace(scope, before, now);
}

void LiveQueryTable::forget(Scope& scope, const std::string& path)
{
    replace(scope, matchingAtOrBelow(scope, path), {});
}

void LiveQueryTable::replace(Scope& scope, const Paths& before, const Paths& now)
{
    for (const std::string& path : before) {
        if (now.contains(path) || _takenBack)
            continue;
        scope.matching.erase(path);
        if (_handlers.went)
            _handlers.went(path);
    }
    const auto& tell = scope.isGathered ? _handlers.came : _handlers.found;
    for (const std::string& path : now) {
        if (before.contains(path) || _takenBack)
            continue;
        scope.matching.insert(path);
        if (tell)
            tell(path);
    }
}

void LiveQueryTable::tellGathered()
{
    if (_handlers.gathered && !_takenBack)
        _handlers.gathered();
}
