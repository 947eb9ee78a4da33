#include "plugin/ScanReason.h"

#include "platform/ForbiddingFolder.h"
#include "platform/PathText.h"

#include <algorithm>

using platform::FileSystem;
using platform::FolderItem;
using platform::ItemKind;

namespace {

/// Of an item that could be named but not looked at, so that no rule about its kind says anything.
constexpr std::string_view folderIsClosed = "its folder may be listed but not searched, so nothing is known of it";

/// Of a folder among the movies of a project. With a movie's extension it would be listed as one that nobody can play.
constexpr ScanFailure folderAmongMovies { "it is a folder, and movies in it are not looked for",
    "move the movies in it one folder up" };

/// Of a folder between the library and its events. To open it in the editor would not help.
constexpr ScanFailure folderOfEvents { "it is no event, and events in it are not looked for",
    "move the events in it one folder up" };

std::string lowerCase(std::string_view text)
{
    std::string lower(text);
    std::transform(lower.begin(), lower.end(), lower.begin(),
        [](char letter) { return letter >= 'A' && letter <= 'Z' ? static_cast<char>(letter - 'A' + 'a') : letter; });
    return lower;
}

std::string withArticle(const ScanRule& rule)
{
    return (&rule == &rules::hasEventMarker ? "an " : "a ") + std::string(rule.name);
}

/// The rule by which `folder` is a project or an event; null when it is neither.
const ScanRule* ruleOfMarked(const FileSystem& fileSystem, std::string_view folder)
{
    for (const ScanRule* rule : { &rules::hasProjectMarker, &rules::hasEventMarker }) {
        if (fileSystem.exists(platform::pathJoined(folder, rule->marker)))
            return rule;
    }
    return nullptr;
}

const ScanRule& otherThan(const ScanRule& rule)
{
    return &rule == &rules::hasEventMarker ? rules::hasProjectMarker : rules::hasEventMarker;
}

/// Of what is an event or project, by `rule`, in a library for the other, or lies in one. It begins with `subject`.
ScanReason reasonOfOtherLibrary(const ScanRule& rule, const std::string& subject, const std::string& whatToMove)
{
    const std::string library = "\"" + std::string(rule.library) + "\"";
    return { subject + withArticle(rule) + ", and " + std::string(rule.name) + "s are looked for in folders called "
            + library,
        "move " + whatToMove + " into a folder " + library };
}

/// Of what is a project or an event by the rule `inner` and lies in another, which is one by `outer`.
ScanReason reasonOfNested(const ScanRule& inner, const ScanRule& outer, const std::string& subject)
{
    const std::string place = &inner == &outer ? " out of the " + std::string(outer.name) + " that holds it"
                                               : " into a folder \"" + std::string(inner.library) + "\"";
    return { subject + " is " + withArticle(inner) + " that lies in " + withArticle(outer)
            + ", where none is looked for",
        "move " + subject + place };
}

/// Whether `path` stands in an event, or directly in one of the folders in it.
bool liesInEvent(const FileSystem& fileSystem, std::string_view path)
{
    const std::string_view folder = platform::pathByRemovingLastComponent(path);
    for (const std::string_view event : { folder, platform::pathByRemovingLastComponent(folder) }) {
        if (fileSystem.exists(platform::pathJoined(event, rules::hasEventMarker.marker)))
            return true;
    }
    return false;
}

bool holdsEvents(const FileSystem& fileSystem, std::string_view folder)
{
    for (const FolderItem item : fileSystem.itemsInFolder(folder, { .marker = rules::hasEventMarker.marker })) {
        if (rules::hasEventMarker.passes(item))
            return true;
    }
    return false;
}

bool isFolder(const FileSystem& fileSystem, std::string_view path)
{
    const auto status = fileSystem.status(path);
    return status && status->kind == ItemKind::folder;
}

} // namespace

ScanReason scanReason(
    const FileSystem& fileSystem, const ScanRule& rule, const FolderItem& item, const std::string& path)
{
    if (!rule.marker.empty())
        return reasonOfMarker(fileSystem, rule, path);
    if (!rule.remedyOfDeadLink.empty()) {
        if (fileSystem.isOutOfReach(path))
            return { folderIsClosed, remedyOfPermission(fileSystem, path) };
        if (item.kind == ItemKind::symbolicLink && !fileSystem.exists(path))
            return { "it is a symbolic link that leads nowhere", rule.remedyOfDeadLink };
    }
    if (&rule == &rules::isContainer && liesInEvent(fileSystem, path))
        return reasonOfOtherLibrary(rules::hasEventMarker, "it lies in ", "the event");
    if (&rule == &rules::hasMovieExtension && isFolder(fileSystem, path)) {
        const ScanRule* marked = ruleOfMarked(fileSystem, path);
        return marked ? reasonOfNested(*marked, rules::hasProjectMarker, "it") : ScanReason(folderAmongMovies);
    }
    ScanReason reason = rule.failureOf ? rule.failureOf(item) : ScanReason(rule.failure);
    if (const std::string name = rules::nameWithLowerCaseExtension(item.name); &rule == &rules::hasMovieExtension
        && !name.empty()
        && fileSystem.linkStatus(platform::pathJoined(platform::pathByRemovingLastComponent(path), name)))
        reason.remedy
            = "give it another name, one that is free and ends in ." + std::string(platform::extensionOfName(name));
    return reason;
}

std::string remedyOfPermission(const FileSystem& fileSystem, std::string_view path)
{
    std::string word;
    for (const char letter : platform::folderThatForbids(fileSystem, path)) {
        if (letter == '\'')
            word += "'\\''";
        else
            word += letter;
    }
    return "permit reading: chmod u+rx '" + word + "'";
}

ScanReason reasonInside(
    const FileSystem& fileSystem, const ScanRule& rule, std::string_view folder, std::string_view path)
{
    // To move a marker would end the project or event that it marks.
    if (path == platform::pathJoined(folder, rule.marker))
        return { "it marks the " + std::string(rule.name), {} };
    std::string_view outermost;
    const ScanRule* nested = nullptr;
    for (std::string_view step = path; step.size() > folder.size();
         step = platform::pathByRemovingLastComponent(step)) {
        if (const ScanRule* marked = ruleOfMarked(fileSystem, step)) {
            outermost = step;
            nested = marked;
        }
    }
    if (nested) {
        const std::string name(platform::lastPathComponent(outermost));
        return reasonOfNested(*nested, rule, outermost == path ? "it" : name);
    }
    return { rule.inside.text, isFolder(fileSystem, path) ? rule.remedyOfFolderInside : rule.inside.remedy };
}

ScanReason reasonOfMarker(const FileSystem& fileSystem, const ScanRule& rule, const std::string& path)
{
    const std::string marker = platform::pathJoined(path, rule.marker);
    if (fileSystem.isOutOfReach(marker)) {
        const std::string remedy = remedyOfPermission(fileSystem, marker);
        const std::string unknown = ", so whether it holds " + std::string(rule.marker) + " is not known";
        if (fileSystem.isOutOfReach(path))
            return { "its folder may be listed but not searched" + unknown, remedy };
        return { "it may not be searched" + unknown, remedy };
    }
    if (fileSystem.linkStatus(marker))
        return { "its " + std::string(rule.marker) + " is a symbolic link that leads nowhere", rule.failure.remedy };
    if (const ScanRule& other = otherThan(rule); fileSystem.exists(platform::pathJoined(path, other.marker)))
        return reasonOfOtherLibrary(other, "it is ", "it");
    if (&rule == &rules::hasEventMarker && holdsEvents(fileSystem, path))
        return folderOfEvents;
    return rule.failure;
}

ScanReason rules::reasonOfExtension(std::string_view name)
{
    const std::string_view extension = platform::extensionOfName(name);
    if (extension.empty())
        return hasMovieExtension.failure;
    const std::string renamed = nameWithLowerCaseExtension(name);
    return { "the extension \"" + std::string(extension)
            + "\" is not one of mov, m4v, mp4, 3gp (case matters for project movies)",
        renamed.empty() ? std::string(hasMovieExtension.failure.remedy) : "rename it to " + renamed };
}

std::string rules::nameWithLowerCaseExtension(std::string_view name)
{
    const std::string lower = lowerCase(platform::extensionOfName(name));
    const bool isOnlyCase = std::find(movieExtensions.begin(), movieExtensions.end(), lower) != movieExtensions.end();
    return isOnlyCase ? std::string(platform::nameWithoutExtension(name)) + "." + lower : std::string();
}
