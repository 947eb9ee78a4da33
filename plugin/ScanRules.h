#pragma once

#include "plugin/MontaroConstants.h"

#include "platform/FileSystem.h"
#include "platform/PathText.h"

#include <algorithm>
#include <array>
#include <string>
#include <string_view>

/// The folder in a project in which its shared movies lie, and that in an event in which its clips do.
inline constexpr std::string_view sharedItemsFolder = "Shared Items";
inline constexpr std::string_view clipsFolder = "Original Media";

/// Why an item is kept out, for people.
struct ScanFailure {
    std::string_view text; ///< what is so
    std::string_view remedy; ///< what would put the item in; empty where nothing would
};

/// The same, worked out for one item.
struct ScanReason {
    std::string text;
    std::string remedy;

    ScanReason(std::string_view textOfReason, std::string_view remedyOfReason)
        : text(textOfReason)
        , remedy(remedyOfReason)
    {
    }
    ScanReason(const ScanFailure& failure)
        : ScanReason(failure.text, failure.remedy)
    {
    }
};

/// One reason for which a scan takes an item or keeps it out. The scans apply these and nothing else, so that whoever
/// asks why something is not listed is told by the rule that decided.
struct ScanRule {
    std::string_view name; ///< what the rule is about
    bool (*passes)(const platform::FolderItem& item);
    std::string_view passed; ///< what is so when it passes, for people
    ScanFailure failure; ///< what is so when it does not
    ScanFailure inside {}; ///< of what is in an item that passes, and no further rule speaks of; empty for most
    std::string_view remedyOfFolderInside {}; ///< what to do instead about a folder there
    std::string_view marker {}; ///< the entry that it looks for inside the item; empty for most rules
    std::string_view library {}; ///< with a marker: what the folders are called in which such items are looked for
    /// What to do about a link that leads nowhere, where it takes only items of some kind; empty for most rules.
    std::string_view remedyOfDeadLink {};
    /// What is so of this very item instead, where that depends on what kind of item it is; null for most rules.
    ScanReason (*failureOf)(const platform::FolderItem& item) = nullptr;
};

namespace rules {

/// The extensions of movies that a project was shared as. Case matters.
inline constexpr std::array<std::string_view, 4> movieExtensions { "mov", "m4v", "mp4", "3gp" };

inline constexpr ScanRule nameIsNotHidden { .name = "hidden name",
    .passes = [](const platform::FolderItem& item) { return !item.name.empty() && item.name.front() != '.'; },
    .passed = "its name does not begin with a full stop",
    .failure = { "its name begins with a full stop", "rename it so that its name does not begin with a full stop" } };

inline constexpr ScanRule isVisible { .name = "hidden file",
    .passes = [](const platform::FolderItem& item) { return !item.flags.invisible; },
    .passed = "no file .hidden names it",
    .failure = { "the file .hidden of its folder names it", "remove its name from the file .hidden of its folder" } };

inline constexpr ScanRule hasProjectMarker { .name = "project",
    .passes = [](const platform::FolderItem& item) { return item.marker == platform::MarkerAnswer::present; },
    .passed = "it holds CurrentVersion.mtrproject",
    .failure = { "it holds no CurrentVersion.mtrproject", "open the project in Montaro, which marks it" },
    .inside = { "of a project only the movies directly in its folder \"Shared Items\" are listed",
        "move it into the project's folder \"Shared Items\", with the extension mov, m4v, mp4 or 3gp" },
    .remedyOfFolderInside = "move the movies in it into the project's folder \"Shared Items\"",
    .marker = MontaroProjectIdentifierPathComponent,
    .library = MontaroProjectsFolderName };

inline constexpr ScanRule isNotPackage { .name = "package",
    .passes = [](const platform::FolderItem& item) { return !item.flags.package; },
    .passed = "it is a plain folder",
    .failure
    = { "its extension makes it a package, which is shown as one file and not looked into", "remove its extension" } };

inline constexpr ScanRule isEventFolder { .name = "folder",
    .passes = [](const platform::FolderItem& item) { return item.flags.container; },
    .passed = "it is a folder",
    .failure = { "it is no folder", "put it into the folder \"Original Media\" of an event" },
    .remedyOfDeadLink = "put an event in its place",
    .failureOf = [](const platform::FolderItem& item) -> ScanReason {
        if (item.kind == platform::ItemKind::symbolicLink)
            return { "it is a symbolic link, and no link is taken for an event", "put what it leads to in its place" };
        return isEventFolder.failure;
    } };

inline constexpr ScanRule hasEventMarker { .name = "event",
    .passes = [](const platform::FolderItem& item) { return item.marker == platform::MarkerAnswer::present; },
    .passed = "it holds CurrentVersion.mtrevent",
    .failure = { "it holds no CurrentVersion.mtrevent", "open the event in Montaro, which marks it" },
    .inside = { "of an event only the clips directly in its folder \"Original Media\" are listed",
        "move it into the event's folder \"Original Media\"" },
    .remedyOfFolderInside = "move the clips in it into the event's folder \"Original Media\"",
    .marker = MontaroEventIdentifierPathComponent,
    .library = MontaroEventsFolderName };

inline constexpr ScanRule isNoFolder { .name = "kind",
    .passes = [](const platform::FolderItem& item) { return !item.flags.container; },
    .passed = "it is no folder (an event's clip needs no particular extension)",
    .failure = { "it is a folder, and folders of clips are not entered", "move the clips in it one folder up" } };

/// Of what a link among the clips leads to.
inline constexpr ScanRule targetIsVisible { .name = "hidden file",
    .passes = isVisible.passes,
    .passed = "what it leads to is not hidden",
    .failure = { "what it leads to is hidden, by a full stop before its name or by the file .hidden of its folder",
        "let it lead to a file that is not hidden" } };

inline constexpr ScanRule targetIsNoFolder { .name = "kind",
    .passes = isNoFolder.passes,
    .passed = "it leads to no folder (an event's clip needs no particular extension)",
    .failure = { "it leads to a folder, and folders of clips are not entered",
        "put links to the clips in that folder in its place" } };

/// Why the extension of `name` is not a project movie's.
ScanReason reasonOfExtension(std::string_view name);
/// The name that would make a movie of a file of which only the case of the extension is wrong; empty for others.
std::string nameWithLowerCaseExtension(std::string_view name);

inline constexpr ScanRule hasMovieExtension { .name = "extension",
    .passes =
        [](const platform::FolderItem& item) {
            return std::find(movieExtensions.begin(), movieExtensions.end(), platform::extensionOfName(item.name))
                != movieExtensions.end();
        },
    .passed = "its extension is a project movie's",
    .failure = { "it has no extension, and a project's movies have mov, m4v, mp4 or 3gp",
        "give it the extension mov, m4v, mp4 or 3gp" },
    .inside
    = { "a movie is not looked into, even if it is a folder", "move it into the folder \"Shared Items\" itself" },
    .failureOf = [](const platform::FolderItem& item) { return reasonOfExtension(item.name); } };

/// What stands in a library and is neither a project nor a folder.
inline constexpr ScanRule isContainer { .name = "folder",
    .passes = [](const platform::FolderItem& item) { return item.flags.container; },
    .passed = "it is a folder",
    .failure = { "it is neither a project nor a folder", {} },
    .remedyOfDeadLink = "let it lead to a project",
    .failureOf = [](const platform::FolderItem& item) -> ScanReason {
        if (item.kind == platform::ItemKind::symbolicLink)
            return { "it is a symbolic link that leads to no project, and no other link is followed in a library",
                "put what it leads to in its place" };
        if (hasMovieExtension.passes(item))
            return { "it is a movie that lies in no project", "move it into the folder \"Shared Items\" of a project" };
        return isContainer.failure;
    } };

} // namespace rules
