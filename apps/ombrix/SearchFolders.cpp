#include "apps/ombrix/SearchFolders.h"

#include "platform/FileProblemText.h"
#include "platform/PathText.h"

namespace ombrix {

using platform::FileProblem;

FileProblem searchProblem(const platform::FileSystem& fileSystem, std::string_view folder)
{
    const platform::FolderListing listing = fileSystem.itemsInFolder(folder, {});
    if (listing.problem() == FileProblem::notAFolder && !fileSystem.exists(folder))
        return FileProblem::missing;
    if (listing.problem() == FileProblem::none && !listing.empty()) {
        const std::string item = platform::pathJoined(folder, listing[0].name);
        if (!fileSystem.linkStatus(item) && fileSystem.openPlainFile(item).problem == FileProblem::notPermitted)
            return FileProblem::notPermitted;
    }
    return listing.problem();
}

std::string searchStateText(FileProblem problem)
{
    switch (problem) {
    case FileProblem::none:
        return "exists";
    case FileProblem::missing:
        return "absent";
    case FileProblem::notAFolder:
        return "not a folder";
    default:
        return "not readable: " + std::string(platform::textOfFileProblem(problem));
    }
}

SearchFolderCounts countSearchFolders(const platform::FileSystem& fileSystem, const std::vector<std::string>& folders)
{
    SearchFolderCounts counts;
    for (const std::string& folder : folders) {
        const FileProblem problem = searchProblem(fileSystem, folder);
        const bool isAbsent = problem == FileProblem::missing || problem == FileProblem::notAFolder;
        counts.absent += isAbsent;
        counts.existing += !isAbsent;
        counts.unreadable += !isAbsent && problem != FileProblem::none;
    }
    return counts;
}

} // namespace ombrix
