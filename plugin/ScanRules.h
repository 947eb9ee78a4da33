#pragma once

#include "platform/FileSystem.h"
#include "platform/PathText.h"

#include <algorithm>
#include <array>
#include <string_view>

/// Why an item is kept out, for people.
struct ScanFailure {
    std::string_view text; ///< what is so
    std::string_view remedy; ///< what would put the item in; empty where nothing would
};

/// One reason for which a scan takes an item or keeps it out. The scans apply these and nothing else, so that whoever
/// asks why something is not listed is told by the rule that decided.
struct ScanRule {
    std::string_view name; ///< what the rule is about
    bool (*passes)(const platform::FolderItem& item);
    std::string_view passed; ///< what is so when it passes, for people
    std::string_view failed; ///< what is so when it does not
    std::string_view remedy; ///< what would make it pass
    std::string_view inside {}; ///< why nothing in what passes is listed, unless further rules say so
    /// What is so of this very item instead, where that depends on what kind of item it is; null for most rules.
    ScanFailure (*failureOf)(const platform::FolderItem& item) = nullptr;
};

namespace ScanRules {

/// The extensions of movies that a project was shared as. Case matters.
inline constexpr std::array<std::string_view, 4> movieExtensions { "mov", "m4v", "mp4", "3gp" };

inline constexpr ScanRule nameIsNotHidden { "hidden name",
    [](const platform::FolderItem& item) { return !item.name.empty() && item.name.front() != '.'; },
    "its name does not begin with a full stop", "its name begins with a full stop",
    "rename it so that its name does not begin with a full stop" };

inline constexpr ScanRule isVisible { "hidden file",
    [](const platform::FolderItem& item) { return !item.flags.invisible; }, "no file .hidden names it",
    "the file .hidden of its folder names it", "remove its name from the file .hidden of its folder" };

inline constexpr ScanRule hasProjectMarker { "project",
    [](const platform::FolderItem& item) { return item.marker == platform::MarkerAnswer::present; },
    "it holds CurrentVersion.mtrproject", "it holds no CurrentVersion.mtrproject",
    "open the project in Montaro, which marks it",
    "of a project only the movies directly in its folder \"Shared Items\" are listed" };

inline constexpr ScanRule isNotPackage { "package",
    [](const platform::FolderItem& item) { return !item.flags.package; }, "it is a plain folder",
    "its extension makes it a package, which is shown as one file", "remove its extension" };

inline constexpr ScanRule isEventFolder { "folder",
    [](const platform::FolderItem& item) { return item.flags.container; }, "it is a folder", "it is no folder",
    "put it into the folder \"Original Media\" of an event" };

inline constexpr ScanRule hasEventMarker { "event",
    [](const platform::FolderItem& item) { return item.marker == platform::MarkerAnswer::present; },
    "it holds CurrentVersion.mtrevent", "it holds no CurrentVersion.mtrevent",
    "open the event in Montaro, which marks it",
    "of an event only the clips directly in its folder \"Original Media\" are listed" };

inline constexpr ScanRule isNoFolder { "kind", [](const platform::FolderItem& item) { return !item.flags.container; },
    "it is no folder (a clip needs no particular extension)", "it is a folder, and folders of clips are not entered",
    "move the clips in it one folder up", "a clip is not looked into" };

inline constexpr ScanRule hasMovieExtension { "extension",
    [](const platform::FolderItem& item) {
        return std::find(movieExtensions.begin(), movieExtensions.end(), platform::extensionOfName(item.name))
            != movieExtensions.end();
    },
    "its extension is a project movie's",
    "its extension is not one of mov, m4v, mp4, 3gp (case matters for project movies)",
    "give it the extension mov, m4v, mp4 or 3gp", "a movie is not looked into" };

/// What stands in a library and is neither a project nor a folder.
inline constexpr ScanRule isContainer { "folder", [](const platform::FolderItem& item) { return item.flags.container; },
    "it is a folder", "it is neither a project nor a folder", "", {},
    [](const platform::FolderItem& item) -> ScanFailure {
        if (item.kind == platform::ItemKind::symbolicLink)
            return { "it is a symbolic link that leads to no project, and no other link is followed in a library",
                "put what it leads to in its place" };
        if (hasMovieExtension.passes(item))
            return { "it is a movie that lies in no project", "move it into the folder \"Shared Items\" of a project" };
        return { "it is neither a project nor a folder", "" };
    } };

/// Of an item that could be named but not looked at, so that no rule about its kind says anything.
inline constexpr ScanFailure folderIsClosed { "its folder may be listed but not searched, so nothing is known of it",
    "permit searching its folder (chmod +x)" };

} // namespace ScanRules
