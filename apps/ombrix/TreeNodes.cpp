#include "apps/ombrix/TreeNodes.h"

#include "host/OBConstants.h"
#include "host/OBGroupWalk.h"
#include "platform/PathText.h"

#include <algorithm>
#include <map>
#include <string>
#include <string_view>

namespace ombrix {
namespace {

    TreeNode makeNode(const OBMediaGroupRef& group, const OBGroupPlace& place)
    {
        TreeNode node { group };
        node.kind = kindOf(*group);
        node.depth = place.depth;
        node.parent = place.depth == 0 ? 0 : place.parent;
        node.children = group->childGroups().size();
        return node;
    }

    std::vector<TreeNode> flattened(const OBMediaGroupRef& root)
    {
        std::vector<TreeNode> nodes;
        OBWalkGroups(root, [&nodes](const OBMediaGroupRef& group, const OBGroupPlace& place) {
            nodes.push_back(makeNode(group, place));
            return true;
        });
        // From the last node on, so that it is known where what lies below ends.
        for (std::size_t index = nodes.size(); index-- > 0;) {
            TreeNode& node = nodes[index];
            node.end = index + 1;
            while (node.end < nodes.size() && nodes[node.end].depth > node.depth)
                node.end = nodes[node.end].end;
            node.isLast = node.end == nodes.size() || nodes[node.end].depth < node.depth;
        }
        return nodes;
    }

    /// The movies of the group itself. Folders and libraries only repeat those of what lies in them.
    void addOwnMovies(TreeNode& node, const platform::FileSystem& fileSystem)
    {
        const bool isLeaf = node.kind == NodeKind::other && node.children == 0;
        if (node.kind != NodeKind::project && node.kind != NodeKind::event && !isLeaf)
            return;
        const OBMediaObjectList objects = node.group->ownMediaObjects();
        const bool isEvent = node.kind == NodeKind::event;
        (isEvent ? node.totals.clips : node.totals.movies) += objects.size();
        objects.visit([&](OBMediaObject& object) {
            if (const auto facts = shownFacts(object, node.kind, fileSystem))
                node.totals.addMovie(*facts);
            return true;
        });
    }

    Totals countedBy(const TreeNode& node)
    {
        Totals totals = node.totals;
        totals.projects += node.kind == NodeKind::project;
        totals.folders += node.kind == NodeKind::folder;
        totals.events += node.kind == NodeKind::event;
        return totals;
    }

    /// Marks what stands for the unread folder; false when nothing does.
    bool markNodes(const std::multimap<std::string, TreeNode*>& byPath, const std::string& unread)
    {
        bool isMarked = false;
        std::string path = unread;
        while (path.size() > 1) {
            const auto [first, last] = byPath.equal_range(path);
            for (auto found = first; found != last; ++found) {
                TreeNode& node = *found->second;
                // The folder of movies inside a project has no group of its own.
                const bool isLeaf = node.kind == NodeKind::project || node.kind == NodeKind::event;
                const bool standsForIt = isLeaf || path == unread;
                node.isUnreadable = node.isUnreadable || standsForIt;
                isMarked = isMarked || standsForIt;
            }
            path = platform::pathByRemovingLastComponent(path);
        }
        return isMarked;
    }

    /// A library that could not be read has no group, and then only the root can tell of it.
    void markUnreadable(std::vector<TreeNode>& nodes, const std::vector<OBLoadProblem>& problems)
    {
        if (problems.empty())
            return;
        std::multimap<std::string, TreeNode*> byPath;
        for (TreeNode& node : nodes) {
            if (const platform::Text path = node.group->path())
                byPath.emplace(path.string(), &node);
        }
        std::size_t untold = 0;
        for (const OBLoadProblem& problem : problems)
            untold += !markNodes(byPath, problem.path);
        if (nodes[0].kind == NodeKind::root)
            nodes[0].unreadableFolders = untold;
    }

} // namespace

NodeKind kindOf(const OBMediaGroup& group)
{
    const OBTypeIdentifierRef type = group.typeIdentifier();
    if (type == OBMontaroRootGroupTypeIdentifier)
        return NodeKind::root;
    if (type == OBMontaroProjectGroupTypeIdentifier)
        return NodeKind::project;
    if (type == OBMontaroFolderGroupTypeIdentifier || type == OBMontaroProjectLibraryGroupTypeIdentifier)
        return NodeKind::folder;
    if (type == OBMontaroEventLibraryGroupTypeIdentifier)
        return NodeKind::eventLibrary;
    if (type == OBMontaroEventCalendarGroupTypeIdentifier)
        return NodeKind::year;
    if (type == OBMontaroEventGroupTypeIdentifier)
        return NodeKind::event;
    return NodeKind::other;
}

std::string_view kindText(NodeKind kind)
{
    switch (kind) {
    case NodeKind::root:
        return "root";
    case NodeKind::folder:
        return "folder";
    case NodeKind::project:
        return "project";
    case NodeKind::eventLibrary:
        return "events";
    case NodeKind::year:
        return "year";
    case NodeKind::event:
        return "event";
    case NodeKind::other:
        break;
    }
    return "group";
}

std::string_view mediaUnit(NodeKind kind)
{
    return kind == NodeKind::event || kind == NodeKind::year || kind == NodeKind::eventLibrary ? "clip" : "movie";
}

void Totals::add(const Totals& other)
{
    projects += other.projects;
    folders += other.folders;
    events += other.events;
    movies += other.movies;
    clips += other.clips;
    bytes += other.bytes;
    if (other.oldest && (!oldest || *other.oldest < *oldest))
        oldest = other.oldest;
    if (other.newest && (!newest || *newest < *other.newest))
        newest = other.newest;
}

std::optional<ShownFacts> shownFacts(
    const OBMediaObject& object, NodeKind kindOfGroup, const platform::FileSystem& fileSystem)
{
    const bool isClip = kindOfGroup == NodeKind::event;
    if (const auto facts = isClip ? object.fileFacts() : std::nullopt)
        return ShownFacts { facts->creationDate, facts->size };
    const platform::Text path = object.path();
    const std::optional<platform::ItemStatus> status = path ? fileSystem.status(path) : std::nullopt;
    if (!status)
        return std::nullopt;
    return ShownFacts { isClip ? status->creationDate : status->modificationDate, status->size };
}

void Totals::addMovie(const ShownFacts& facts)
{
    Totals movie;
    movie.bytes = facts.size;
    movie.oldest = facts.date;
    movie.newest = facts.date;
    add(movie);
}

std::vector<TreeNode> treeNodes(
    const OBMediaGroupRef& root, const platform::FileSystem& fileSystem, const std::vector<OBLoadProblem>& problems)
{
    std::vector<TreeNode> nodes = flattened(root);
    for (TreeNode& node : nodes)
        addOwnMovies(node, fileSystem);
    // Backwards, every node is complete before it is added to its parent.
    for (std::size_t index = nodes.size() - 1; index > 0; --index)
        nodes[nodes[index].parent].totals.add(countedBy(nodes[index]));
    markUnreadable(nodes, problems);
    return nodes;
}

} // namespace ombrix
