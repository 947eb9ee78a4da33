// What a tree that is followed cannot know, though a fresh load does:
//
// * The folders that are searched are listed once. A volume that is mounted later adds its events alone, below the name
//   of the volume; it is never searched for projects. Its events come behind those that they are equal to.
// * A library of events that lies among projects is followed as projects are, and what no watched path holds is not
//   followed at all.
// * A library of events without a clip is shown by a load; a reload takes it out.
// * A clip or movie that is rewritten in place, or given other dates or permissions, is not scanned again, and neither
//   are the event, the year and the order that follow from its dates, nor the movie that stands for its project.
// * Another order that the editor's user chooses shows when the events are scanned next.
// * Links below a searched folder are not followed: what changes behind them is not heard of.
//
// Where the editor is missing there is no fresh load, which whoever compares notices before.

#include "apps/ombrix/VerifyExceptions.h"

#include "platform/PathText.h"

#include <algorithm>

namespace ombrix {
namespace {

    using Kind = TreeDifference::Kind;
    using Reason = std::optional<std::string>;
    using platform::isSameOrBelow;
    using platform::lastPathComponent;
    using platform::pathByRemovingLastComponent;
    using platform::pathJoined;

    constexpr const char* otherOrder = "the editor's order of events has changed; a restart shows it";
    constexpr const char* rewritten
        = "a movie was rewritten in place, or given other dates or permissions, which no scan answers";

    bool hasObjects(const TreeDocument& tree, std::size_t group)
    {
        std::vector<std::size_t> left { group };
        while (!left.empty()) {
            const DocumentGroup& each = tree.groups[left.back()];
            left.pop_back();
            if (!each.objects.empty())
                return true;
            left.insert(left.end(), each.children.begin(), each.children.end());
        }
        return false;
    }

    /// The longest of the folders that holds `path`; empty where none does.
    std::string folderHolding(const std::vector<std::string>& folders, std::string_view path)
    {
        std::string found;
        for (const std::string& folder : folders) {
            if (folder.size() > found.size() && isSameOrBelow(path, folder))
                found = folder;
        }
        return found;
    }

    bool hasComponent(std::string_view path, std::string_view name)
    {
        for (; path.size() > 1; path = pathByRemovingLastComponent(path)) {
            if (lastPathComponent(path) == name)
                return true;
        }
        return false;
    }

    std::string pathOf(const TreeDocument& tree, std::size_t group)
    {
        return textOfValue(tree.groups[group].fact("path"));
    }

} // namespace

VerifyExceptions::VerifyExceptions(
    const FollowedSource& source, const platform::FileSystem& files, const ComparedTrees& trees)
    : _source(source)
    , _files(files)
    , _trees(trees)
{
}

Reason VerifyExceptions::reasonFor(const TreeDifference& difference)
{
    if (difference.kind == Kind::reordered)
        return reasonForOrder(difference);
    if (difference.isOfObjects)
        return reasonForObject(difference);
    if (difference.kind == Kind::changed)
        return reasonForChange(difference);
    const bool isFresh = difference.kind == Kind::missing;
    return isFresh ? reasonForGroup({ _trees.fresh, *difference.freshGroup }, true)
                   : reasonForGroup({ _trees.followed, *difference.followedGroup }, false);
}

/// A group with all that is in it: one reason has to hold for each place that tells where it is.
Reason VerifyExceptions::reasonForGroup(const Place& place, bool isFresh)
{
    if (isFresh && place.tree.isTopLevelEventLibrary(place.group) && !hasObjects(place.tree, place.group))
        return "a library of events without a clip is shown by a load, and taken out by a reload";
    return reasonForContent(place);
}

Reason VerifyExceptions::reasonForContent(const Place& place)
{
    Reason reason;
    std::vector<std::size_t> left { place.group };
    while (!left.empty()) {
        const std::size_t group = left.back();
        left.pop_back();
        const DocumentGroup& each = place.tree.groups[group];
        const std::string path = pathOf(place.tree, group);
        if (path.empty()) { // a year, or a library of events: where it is, its events tell
            left.insert(left.end(), each.children.begin(), each.children.end());
            continue;
        }
        Reason found = reasonForPath(path);
        if (!found)
            found = reasonForMove({ place.tree, group });
        if (!found)
            return std::nullopt;
        reason = std::move(found);
    }
    return reason;
}

/// An event stands elsewhere in the other tree when its year is another one.
Reason VerifyExceptions::reasonForMove(const Place& place)
{
    const std::string_view identifier = place.tree.groups[place.group].fact("ID");
    const std::vector<std::size_t>& followed = groupsCalled(_trees.followed, identifier);
    if (followed.empty() || groupsCalled(_trees.fresh, identifier).empty())
        return std::nullopt;
    return _source.hasOrderChanged ? Reason(otherOrder) : reasonForRewriting(followed.front());
}

Reason VerifyExceptions::reasonForRewriting(std::size_t followedGroup)
{
    std::vector<std::size_t> left { followedGroup };
    while (!left.empty()) {
        const DocumentGroup& group = _trees.followed.groups[left.back()];
        left.pop_back();
        for (const std::string_view object : group.objects) {
            if (wasRewritten(object))
                return rewritten;
        }
        left.insert(left.end(), group.children.begin(), group.children.end());
    }
    return std::nullopt;
}

Reason VerifyExceptions::reasonForChange(const TreeDifference& difference)
{
    if (difference.key != "attributes")
        return reasonForPath(pathOf(_trees.fresh, *difference.freshGroup));
    return _source.hasOrderChanged ? Reason(otherOrder) : reasonForRewriting(*difference.followedGroup);
}

Reason VerifyExceptions::reasonForOrder(const TreeDifference& difference)
{
    Reason reason = _source.hasOrderChanged ? Reason(otherOrder) : reasonForRewriting(*difference.followedGroup);
    if (!reason && difference.isOfObjects)
        reason = _reasonOfGroupOrder;
    else if (!reason && isOrderOfEquals(difference))
        reason = "they are equal to the order of events, and folders are searched in the order in which they came";
    if (!difference.isOfObjects)
        _reasonOfGroupOrder = reason;
    return reason;
}

/// Whether both trees show groups of the same names and dates one after the other.
bool VerifyExceptions::isOrderOfEquals(const TreeDifference& difference) const
{
    const std::vector<std::size_t>& followed = _trees.followed.groups[*difference.followedGroup].children;
    const std::vector<std::size_t>& fresh = _trees.fresh.groups[*difference.freshGroup].children;
    const auto isEqual = [&](std::size_t one, std::size_t other) {
        const DocumentGroup& left = _trees.followed.groups[one];
        const DocumentGroup& right = _trees.fresh.groups[other];
        return left.fact("attributes") == right.fact("attributes") && left.fact("attributes") != "{}"
            && left.fact("name") == right.fact("name");
    };
    return std::equal(followed.begin(), followed.end(), fresh.begin(), fresh.end(), isEqual);
}

Reason VerifyExceptions::reasonForObject(const TreeDifference& difference)
{
    const bool isFollowed = !difference.followedObject.empty();
    const std::string_view object = isFollowed ? difference.followedObject : difference.freshObject;
    const std::string path = textOfValue(memberOf(object, "path"));
    if (Reason reason = reasonForPath(path))
        return reason;
    if (difference.kind == Kind::changed) {
        const bool isOfMovie = difference.key == "attributes" || difference.key == "icon";
        return isOfMovie && wasRewritten(difference.followedObject) ? Reason(rewritten) : std::nullopt;
    }
    // Which movie stands for a project depends on all of them.
    const std::string_view project = memberOf(memberOf(object, "attributes"), "Project Path");
    for (const std::size_t group : groupsCalled(_trees.followed, project)) {
        if (Reason reason = reasonForRewriting(group))
            return reason;
    }
    return std::nullopt;
}

Reason VerifyExceptions::reasonForPath(const std::string& path)
{
    std::vector<std::string> folders = _source.projectFolders;
    folders.insert(folders.end(), _source.eventFolders.begin(), _source.eventFolders.end());
    const std::string folder = folderHolding(folders, path);
    // Of a source that does not tell where it looks, nothing is known that it may miss.
    if (path.empty() || folders.empty())
        return std::nullopt;
    if (folder.empty())
        return "the folders that are searched are listed once; a restart lists " + path;
    if (!isFollowed(path, folder))
        return "changes below " + folder + " are not followed";
    if (isBehindLink(path, folder))
        return "it lies behind a link, and what changes there is not followed";
    return std::nullopt;
}

bool VerifyExceptions::isFollowed(const std::string& path, const std::string& folder) const
{
    if (folderHolding(_source.watchedPaths, path).empty())
        return false;
    const bool isOfEvents
        = std::find(_source.eventFolders.begin(), _source.eventFolders.end(), folder) != _source.eventFolders.end();
    const bool liesAmongProjects
        = !_source.projectFolders.empty() && hasComponent(path, lastPathComponent(_source.projectFolders.front()));
    return !isOfEvents || !liesAmongProjects;
}

/// A list of hidden names, and whatever else makes a folder what it is, may be a link as well.
bool VerifyExceptions::isBehindLink(const std::string& path, const std::string& folder) const
{
    for (std::string_view each = path; each.size() > folder.size(); each = pathByRemovingLastComponent(each)) {
        const std::string hiddenNames = pathJoined(pathByRemovingLastComponent(each), ".hidden");
        if (_files.linkTarget(each) || _files.linkTarget(hiddenNames))
            return true;
    }
    const platform::FolderListing inside = _files.itemsInFolder(path, {});
    for (std::size_t index = 0; index < inside.size(); ++index) {
        if (inside[index].kind == platform::ItemKind::symbolicLink)
            return true;
    }
    return false;
}

/// Where nothing was seen of a movie but its header, what the header tells now has to be something else.
bool VerifyExceptions::wasRewritten(std::string_view object)
{
    const std::string path = textOfValue(memberOf(object, "path"));
    const std::optional<platform::ItemStatus> status = _files.status(path);
    if (!status)
        return false;
    if (const auto seen = _source.seenFacts ? _source.seenFacts(path) : std::nullopt)
        return *seen != platform::FileFacts { status->creationDate, status->size };
    const auto differs = [&](std::string_view fresh) {
        return memberOf(fresh, "path") == memberOf(object, "path") && fresh != object;
    };
    const std::vector<std::string_view>& fresh = freshObjectsBeside(path);
    return std::any_of(fresh.begin(), fresh.end(), differs);
}

/// What the fresh tree shows of the project that holds the movie at `path`; those of the root where it has none.
const std::vector<std::string_view>& VerifyExceptions::freshObjectsBeside(const std::string& path)
{
    std::string_view folder = path;
    while ((folder = pathByRemovingLastComponent(folder)).size() > 1) {
        const std::string identifier = "\"" + std::string(folder) + "\"";
        if (const auto& groups = groupsCalled(_trees.fresh, identifier); !groups.empty())
            return _trees.fresh.groups[groups.front()].objects;
    }
    return _trees.fresh.groups.front().objects;
}

const std::vector<std::size_t>& VerifyExceptions::groupsCalled(const TreeDocument& tree, std::string_view identifier)
{
    auto& known = _byIdentifier[&tree];
    if (known.empty()) {
        for (std::size_t group = 0; group < tree.groups.size(); ++group)
            known[tree.groups[group].fact("ID")].push_back(group);
    }
    static const std::vector<std::size_t> none;
    const auto found = known.find(identifier);
    return found == known.end() ? none : found->second;
}

} // namespace ombrix
