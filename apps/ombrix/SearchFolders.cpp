#include "apps/ombrix/SearchFolders.h"

#include "apps/ombrix/ProblemText.h"

namespace ombrix {

using platform::FileProblem;

FileProblem searchProblem(const platform::FileSystem& fileSystem, std::string_view folder)
{
    const FileProblem problem = fileSystem.itemsInFolder(folder, {}).problem();
    if (problem == FileProblem::notAFolder && !fileSystem.exists(folder))
        return FileProblem::missing;
    if (problem == FileProblem::none && !fileSystem.exists(std::string(folder) + "/."))
        return FileProblem::notPermitted;
    return problem;
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
        return "not readable: " + std::string(problemText(problem));
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
