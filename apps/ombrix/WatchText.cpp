#include "apps/ombrix/WatchText.h"

#include "apps/common/HumanText.h"
#include "apps/ombrix/TreeNodes.h"

#include <utility>
#include <vector>

namespace ombrix {
namespace {

    using Changes = std::vector<OBTreeChange>;

    constexpr std::string_view betweenChanges = "    ";
    constexpr std::size_t mostNamed = 2;

    void append(std::string& list, std::string_view between, const std::string& text)
    {
        if (!list.empty() && !text.empty())
            list += between;
        list += text;
    }

    bool holdsMedia(NodeKind kind)
    {
        return kind == NodeKind::project || kind == NodeKind::event || kind == NodeKind::other;
    }

    /// The groups among `changes` that people think of as things: projects and events, else folders.
    Changes shownGroups(const Changes& changes)
    {
        Changes holders;
        Changes folders;
        for (const OBTreeChange& change : changes) {
            if (change.object)
                continue;
            if (holdsMedia(kindOf(*change.group)))
                holders.push_back(change);
            else if (kindOf(*change.group) == NodeKind::folder)
                folders.push_back(change);
        }
        return holders.empty() ? folders : holders;
    }

    /// "2 events, 31 clips"
    std::string countedText(const Changes& groups, std::size_t OBTreeChange::*count)
    {
        std::string text;
        for (const NodeKind kind : { NodeKind::project, NodeKind::event, NodeKind::other, NodeKind::folder }) {
            std::size_t ofKind = 0;
            for (const OBTreeChange& change : groups)
                ofKind += kindOf(*change.group) == kind;
            if (ofKind > 0)
                append(text, ", ", apps::quantityText(ofKind, kindText(kind)));
        }
        for (const std::string_view unit : { "movie", "clip" }) {
            std::size_t media = 0;
            for (const OBTreeChange& change : groups)
                media += mediaUnit(kindOf(*change.group)) == unit ? change.*count : 0;
            if (media > 0)
                append(text, ", ", apps::quantityText(media, unit));
        }
        return text;
    }

    /// Of groups that came or went.
    std::string wholeText(
        std::string_view sign, const Changes& changes, std::size_t OBTreeChange::*count, const apps::Style& style)
    {
        const Changes groups = shownGroups(changes);
        if (groups.empty())
            return {};
        std::string text(sign);
        if (groups.size() > 1)
            return text + countedText(groups, count);
        const OBTreeChange& group = groups.front();
        text += style.name(group.name);
        if (group.*count == 0)
            return text;
        return text + " (" + apps::quantityText(group.*count, mediaUnit(kindOf(*group.group))) + ")";
    }

    /// "~ Meyer: 1 → 2 movies"
    std::string changedText(const OBTreeChange& change, const apps::Style& style)
    {
        std::string text = "~ " + style.name(change.name);
        if (change.objectsBefore == change.objectsNow)
            return text;
        const std::string_view unit = mediaUnit(kindOf(*change.group));
        return text + ": " + apps::countText(change.objectsBefore) + " → "
            + apps::quantityText(change.objectsNow, unit);
    }

    std::string changedText(const Changes& changes, const apps::Style& style)
    {
        const Changes groups = shownGroups(changes);
        if (groups.size() > mostNamed)
            return "~ " + countedText(groups, &OBTreeChange::objectsNow);
        std::string text;
        for (const OBTreeChange& group : groups)
            append(text, betweenChanges, changedText(group, style));
        return text;
    }

    std::string volumesText(const OBTreeChanges& changes, const VolumeChanges& volumes, const apps::Style& style)
    {
        std::string text;
        for (const WatchedVolume& volume : volumes.came) {
            if (countObjectsOn(volume, changes.added) > 0)
                append(text, ", ", style.name(volume.name) + " was mounted");
        }
        for (const WatchedVolume& volume : volumes.went) {
            if (const std::size_t lost = countObjectsOn(volume, changes.removed))
                append(text, ", ", style.name(volume.name) + " went with " + apps::quantityText(lost, "clip"));
        }
        return text;
    }

    std::chrono::nanoseconds between(platform::Date from, platform::Date until)
    {
        const std::chrono::nanoseconds parts(
            static_cast<std::int64_t>(until.nanoseconds) - static_cast<std::int64_t>(from.nanoseconds));
        return std::chrono::seconds(until.seconds - from.seconds) + parts;
    }

} // namespace

std::string changesText(const OBTreeChanges& changes, const apps::Style& style)
{
    std::string text = wholeText("+ ", changes.added, &OBTreeChange::objectsNow, style);
    append(text, betweenChanges, changedText(changes.changed, style));
    append(text, betweenChanges, wholeText("- ", changes.removed, &OBTreeChange::objectsBefore, style));
    return text.empty() ? "nothing changed" : text;
}

std::string circumstancesText(const OBPublication& publication, const OBTreeChanges& changes,
    const VolumeChanges& volumes, const apps::Style& style)
{
    if (std::string text = volumesText(changes, volumes, style); !text.empty())
        return text;
    std::string scanned = "scanned in " + apps::durationText(publication.duration);
    const OBChangeCause& cause = publication.cause;
    if (cause.text.empty())
        return scanned;
    return "heard " + apps::timeText(cause.heardAt) + ", waited "
        + apps::secondsText(between(cause.heardAt, publication.beganAt)) + ", " + scanned + " ("
        + style.name(cause.text) + ")";
}

std::string followedText(std::optional<std::size_t> searchFolders, const platform::WatchingState& state)
{
    std::string text = searchFolders ? apps::quantityText(*searchFolders, "search folder") : std::string();
    append(text, ", ", apps::quantityText(state.watchedFolders, "folder") + " (inotify)");
    if (state.polledFolders > 0)
        append(text, ", ", apps::quantityText(state.polledFolders, "folder") + " looked at every 10 s");
    return text;
}

std::string pollingText(const platform::WatchingProblem& problem)
{
    const std::string text = problem.path + ": looked at every 10 s only: " + problem.cause;
    return problem.remedy.empty() ? text : text + "; to mend it: " + problem.remedy;
}

TextLine watchLine(const apps::Style& style, std::optional<int> columns, platform::Date time, std::string_view word,
    std::string_view text, std::string_view circumstances)
{
    constexpr int wordColumn = 10;
    constexpr int textColumn = 20;
    constexpr int circumstancesColumn = 64;
    const auto look = word == "warning" ? TextLine::Look::warning : TextLine::Look::plain;
    TextLine line(style, columns);
    line.add(0, apps::timeText(time), TextLine::Look::dim).add(wordColumn, word, look);
    if (word == "warning")
        return line.addWhole(textColumn, text);
    return line.add(textColumn, text).addMoving(circumstancesColumn, circumstances, TextLine::Look::dim);
}

} // namespace ombrix
