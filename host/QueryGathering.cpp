#include "host/QueryGathering.h"

// Folders wait in a list of their own and not in calls, so that depth costs memory alone. A folder that becomes a link
// while the walk is on its way there is left out like one that was a link before.

#include "platform/PathText.h"

#include <utility>

using platform::FileProblem;
using platform::ItemKind;

QueryGathering::QueryGathering(const QueryExpression& expression, const platform::Platform& platform,
    std::string_view scope, const Callers& callers)
    : _expression(expression)
    , _platform(platform)
    , _callers(callers)
    , _readsFiles(expression.origin() != MetadataOrigin::path)
    , _path(platform::pathWithoutTrailingSlashes(scope))
    , _scopeLength(_path.size())
{
}

bool QueryGathering::run()
{
    if (isCancelled())
        return false;
    const std::optional<platform::ItemStatus> status = _platform.fileSystem.status(_path);
    if (!status) {
        noteProblem(_platform.fileSystem.isOutOfReach(_path) ? FileProblem::notPermitted : FileProblem::missing);
        return true;
    }
    takeScope(*status);
    return walk();
}

void QueryGathering::takeScope(const platform::ItemStatus& status)
{
    if (status.kind == ItemKind::folder)
        return enterFolder();
    if (status.kind != ItemKind::file)
        return;
    FileAttributes file(_path, _platform, status);
    if (_expression.matches(file))
        _callers.take(_path);
}

bool QueryGathering::walk()
{
    while (!_levels.empty()) {
        Level& level = _levels.back();
        if (level.next == level.listing.size()) {
            _levels.pop_back();
            continue;
        }
        const platform::FolderItem item = level.listing[level.next++];
        if (item.kind != ItemKind::file && item.kind != ItemKind::folder)
            continue;
        _path.resize(level.pathLength);
        if (_path.back() != '/')
            _path.push_back('/');
        _path.append(item.name);
        const bool isFolder = item.kind == ItemKind::folder;
        if ((isFolder || _readsFiles) && isCancelled())
            return false;
        if (isFolder)
            enterFolder();
        else
            takeFile();
    }
    return true;
}

void QueryGathering::takeFile()
{
    FileAttributes file(_path, _platform);
    if (_expression.matches(file))
        _callers.take(_path);
}

void QueryGathering::enterFolder()
{
    if (_callers.observer.enters)
        _callers.observer.enters(_path);
    platform::FolderListing listing = _platform.fileSystem.itemsInFolder(_path, _request);
    if (listing.problem() != FileProblem::none)
        noteProblem(listing.problem());
    if (isScope()) {
        if (listing.pathIsReal())
            _request.links = platform::LinkPolicy::stop;
        _realScope = listing.otherRealPath();
    } else if (leadsElsewhere(listing)) {
        return;
    }
    if (!listing.empty())
        _levels.push_back({ std::move(listing), 0, _path.size() });
}

/// Whether a folder below the scope, as it was listed, lies where only a link could lead.
bool QueryGathering::leadsElsewhere(const platform::FolderListing& listing) const
{
    const std::string& real = listing.otherRealPath();
    if (real.empty() || _realScope.empty())
        return false;
    return real != platform::pathJoined(_realScope, platform::pathRelativeTo(_path, _path.substr(0, _scopeLength)));
}

/// What has gone, or has become something else, while the walk was on its way there needs no telling.
void QueryGathering::noteProblem(FileProblem problem) const
{
    const bool hasGone
        = problem == FileProblem::missing || problem == FileProblem::notAFolder || problem == FileProblem::linkOnTheWay;
    if (_callers.observer.skips && (isScope() || !hasGone))
        _callers.observer.skips(_path, problem);
}
