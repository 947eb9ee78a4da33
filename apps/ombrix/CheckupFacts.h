#pragma once

#include "apps/ombrix/DiskQuestions.h"
#include "platform/PathWatching.h"

#include <optional>
#include <string>
#include <vector>

namespace ombrix {

/// A library that lies where the desktop keeps videos, and not where the source looks.
struct StrayLibrary {
    FolderState stray; ///< where it lies
    FolderState sought; ///< where the source looks for one of that name
    FolderState movies; ///< the folder that holds the latter
    std::string videos; ///< the folder that holds the former
};

/// A preferences file that cannot be used, or of which nothing is known.
struct DamagedPreferences {
    std::string domain {};
    bool isSilent = false;
    std::string problem {}; ///< one line, which begins with the file
    std::string file {};
    bool isNotPermitted = false;
};

/// What a check-up has found out about a machine and a source, and nothing of what it means.
struct CheckupFacts {
    bool volumesAnswered = false;
    bool sourceAnswered = false;
    bool editorAnswered = false;
    std::string home {}; ///< empty where none is known
    std::string sourceName {};
    std::optional<std::string> editorPath {}; ///< absent where no editor is installed
    bool canLoad = false;
    std::vector<FolderState> volumes {};
    std::vector<FolderState> projects {}; ///< the folders that are searched, in order
    std::vector<FolderState> events {};
    std::vector<StrayLibrary> strays {};
    std::vector<DamagedPreferences> preferences {};
    std::size_t preferencesAsked = 0;
    std::optional<platform::WatchingLimits> limits {}; ///< with room for `foldersToWatch`
};

/// The folders that are searched, one state each, of those that are there; of several that lead to one place, or into
/// another, only the outermost that comes first.
std::vector<const FolderState*> distinctSearchFolders(const CheckupFacts& facts);
/// How many folders the kernel would be asked to report on.
std::uint64_t foldersToWatch(const CheckupFacts& facts);

/// Asks for everything but the limits.
CheckupFacts askForFacts(const AskDisks& ask);

} // namespace ombrix
