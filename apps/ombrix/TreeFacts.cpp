#include "apps/ombrix/TreeFacts.h"

#include "apps/common/HumanText.h"
#include "platform/PathText.h"

#include <string_view>

namespace ombrix {
namespace {

    constexpr std::string_view volumesFolder = "/Volumes";
    constexpr std::string_view between = " · ";

    void append(std::string& list, const std::string& text)
    {
        if (!list.empty())
            list += between;
        list += text;
    }

    /// The name of the volume below /Volumes that holds the group; empty for other places.
    std::string_view volumeOf(std::string_view path)
    {
        if (!platform::isSameOrBelow(path, volumesFolder))
            return {};
        const std::string_view rest = platform::pathRelativeTo(path, volumesFolder);
        return rest.substr(0, rest.find('/'));
    }

    /// The volume where it is news: the group above lies elsewhere.
    std::string noteOf(const std::vector<TreeNode>& nodes, const TreeNode& node)
    {
        const platform::Text path = node.group->path();
        const platform::Text pathAbove = nodes[node.parent].group->path();
        const std::string_view volume = volumeOf(path);
        return volume == volumeOf(pathAbove) ? std::string() : std::string(volume);
    }

    std::string rootSummary(const TreeNode& node)
    {
        const Totals& totals = node.totals;
        std::string summary = apps::quantityText(totals.projects, "project");
        if (totals.events > 0)
            append(summary, apps::quantityText(totals.events, "event"));
        if (totals.clips > 0)
            append(summary, apps::quantityText(totals.clips, "clip"));
        else if (totals.movies > 0)
            append(summary, apps::quantityText(totals.movies, "movie"));
        if (totals.bytes > 0)
            append(summary, apps::sizeText(totals.bytes));
        if (node.unreadableFolders > 0)
            append(summary, apps::quantityText(node.unreadableFolders, "folder") + " unreadable");
        return summary;
    }

    std::string folderSummary(const Totals& totals)
    {
        std::string summary = totals.projects == 0 ? "no projects" : apps::quantityText(totals.projects, "project");
        if (totals.folders > 0)
            summary += " in " + apps::quantityText(totals.folders, "folder");
        return summary;
    }

    std::string yearSummary(const Totals& totals)
    {
        std::string summary = apps::quantityText(totals.events, "event");
        append(summary, apps::quantityText(totals.clips, "clip"));
        append(summary, apps::sizeText(totals.bytes));
        return summary;
    }

    /// Of a kind that only its source knows.
    std::string groupSummary(const TreeNode& node)
    {
        std::string summary = apps::quantityText(node.children, "group");
        if (node.totals.movies > 0) {
            append(summary, apps::quantityText(node.totals.movies, "movie"));
            append(summary, apps::sizeText(node.totals.bytes));
        }
        return summary;
    }

    std::string summaryOf(const TreeNode& node, bool isFolded, bool isFirst)
    {
        switch (node.kind) {
        case NodeKind::root:
            return rootSummary(node);
        case NodeKind::folder:
            return folderSummary(node.totals);
        case NodeKind::eventLibrary:
            return apps::quantityText(node.totals.events, "event");
        case NodeKind::year:
            return isFolded || isFirst ? yearSummary(node.totals) : std::string();
        case NodeKind::project:
        case NodeKind::event:
            return {};
        case NodeKind::other:
            break;
        }
        return node.children == 0 ? std::string() : groupSummary(node);
    }

    std::string dateOf(const std::vector<TreeNode>& nodes, const TreeNode& node, platform::Date now)
    {
        if (!node.totals.newest)
            return {};
        if (node.kind != NodeKind::event)
            return apps::dateText(*node.totals.newest, now);
        const TreeNode& above = nodes[node.parent];
        const platform::Text year = above.kind == NodeKind::year ? above.group->name() : platform::Text();
        return apps::dateRangeText(*node.totals.oldest, *node.totals.newest, year);
    }

} // namespace

NodeFacts factsOf(const std::vector<TreeNode>& nodes, const TreeLine& line, platform::Date now)
{
    const TreeNode& node = nodes[line.node];
    NodeFacts facts;
    facts.summary = summaryOf(node, line.isFolded, line.node == 0);
    if (node.kind == NodeKind::folder && line.isFolded && node.totals.newest)
        facts.newest = std::string(between) + "newest " + apps::dateText(*node.totals.newest, now);
    facts.note = noteOf(nodes, node);
    const std::uint64_t media = node.kind == NodeKind::event ? node.totals.clips : node.totals.movies;
    const bool holdsMedia = node.kind == NodeKind::project || node.kind == NodeKind::event
        || (node.kind == NodeKind::other && node.children == 0);
    if (!holdsMedia || media == 0)
        return facts;
    facts.count = apps::countText(media);
    facts.unit = apps::unitText(media, mediaUnit(node.kind));
    facts.size = apps::sizeText(node.totals.bytes);
    facts.date = dateOf(nodes, node, now);
    return facts;
}

std::string moreText(const TreeLine& line)
{
    return "… " + apps::countText(line.hidden) + " more";
}

std::string ageText(const std::vector<TreeNode>& nodes, const TreeLine& line)
{
    Totals hidden;
    std::size_t node = line.firstHidden;
    for (std::size_t count = 0; count < line.hidden; ++count) {
        hidden.add(nodes[node].totals);
        node = nodes[node].end;
    }
    return hidden.oldest ? ", back to " + apps::monthText(*hidden.oldest) : std::string();
}

} // namespace ombrix
