#include "plugin/ScanFindings.h"

#include "plugin/ScanReason.h"

#include "platform/FileProblemText.h"
#include "platform/PathText.h"

#include <string>

using platform::FileProblem;
using platform::FileSystem;

namespace {

std::string ordinal(std::size_t number)
{
    const std::size_t last = number % 10;
    const bool isTeen = number % 100 / 10 == 1;
    const char* ending = isTeen || last == 0 || last > 3 ? "th" : last == 1 ? "st" : last == 2 ? "nd" : "rd";
    return std::to_string(number) + ending;
}

std::string entriesText(std::size_t count)
{
    return std::to_string(count) + (count == 1 ? " entry" : " entries");
}

OBScanDecision finding(std::string_view rule, std::string_view path, std::string text)
{
    OBScanDecision decision;
    decision.rule = rule;
    decision.path = std::string(path);
    decision.text = std::move(text);
    return decision;
}

std::string remedyOfProblem(const FileSystem& fileSystem, FileProblem problem, std::string_view path)
{
    switch (problem) {
    case FileProblem::notPermitted:
        return remedyOfPermission(fileSystem, path);
    case FileProblem::pathTooLong:
        return "move it to a place with a shorter path";
    default:
        return {};
    }
}

} // namespace

OBScanDecision findings::searchedLibrary(
    std::string_view path, std::string_view what, std::size_t index, std::size_t count, bool isInHome)
{
    const std::string_view volume = platform::pathByRemovingLastComponent(path) == "/" ? "boot volume" : "volume";
    OBScanDecision decision = finding("search folder", path,
        std::string(isInHome ? "home folder" : volume) + ", " + ordinal(index + 1) + " of " + std::to_string(count)
            + " for " + std::string(what));
    decision.itself = "a search folder shows what it holds, not itself";
    return decision;
}

OBScanDecision findings::listedFolder(const FileSystem& fileSystem, std::string_view path,
    const platform::FolderListing& listing, std::string_view remedyOfMissing)
{
    if (listing.problem() == FileProblem::none || !listing.empty())
        return finding("listing", path, "it holds " + entriesText(listing.size()));
    const std::string problem(platform::textOfFileProblem(listing.problem()));
    OBScanDecision decision = finding("listing", path, "what it holds is not listed: " + problem);
    decision.inside = "it cannot be listed: " + problem;
    decision.insideRemedy = listing.problem() == FileProblem::missing
        ? std::string(remedyOfMissing)
        : remedyOfProblem(fileSystem, listing.problem(), path);
    return decision;
}

OBScanDecision findings::noProject(std::string_view path, std::string_view reason)
{
    return finding("project", path, std::string(reason) + "; it is taken for no project");
}

OBScanDecision findings::moviesFolder(std::string_view path, std::size_t entries)
{
    OBScanDecision decision = finding("movies folder", path, "it holds " + entriesText(entries));
    decision.itself = "a folder of movies is shown as its project";
    return decision;
}

OBScanDecision findings::clipsFolder(std::string_view path, std::size_t entries)
{
    OBScanDecision decision = finding("clips folder", path, "it holds " + entriesText(entries));
    decision.itself = "a folder of clips is shown as its event";
    return decision;
}

OBScanDecision findings::eventWithoutClipsFolder(
    const FileSystem& fileSystem, std::string_view path, std::string_view clips, FileProblem problem)
{
    const bool isMissing = problem == FileProblem::missing || problem == FileProblem::notAFolder;
    OBScanDecision decision = finding("clips folder", path,
        isMissing ? "it has no folder \"Original Media\""
            : problem == FileProblem::none
            ? "its folder \"Original Media\" is empty"
            : "its folder \"Original Media\" cannot be listed: " + std::string(platform::textOfFileProblem(problem)));
    decision.passed = false;
    decision.remedy = problem == FileProblem::none || isMissing ? "put its clips into a folder \"Original Media\""
                                                                : remedyOfProblem(fileSystem, problem, clips);
    return decision;
}

OBScanDecision findings::eventWithoutClips(std::string_view path)
{
    OBScanDecision decision = finding("clips", path, "nothing in its folder \"Original Media\" is a clip");
    decision.passed = false;
    decision.remedy = "put a clip into its folder \"Original Media\"";
    return decision;
}

OBScanDecision findings::linkedClip(std::string_view path, std::string_view target, bool exists)
{
    return finding("link", path, "it leads to " + std::string(target) + (exists ? "" : ", where nothing is"));
}

OBScanDecision findings::yearOfClip(std::string_view path, int year, std::string_view date, bool isRecorded)
{
    const std::string_view origin = isRecorded ? ", when it was recorded" : ", the earlier of birth and modification";
    return finding("year", path,
        std::to_string(year) + ": "
            + (date.empty() ? std::string("it has no date")
                            : (isRecorded ? "" : "file date ") + std::string(date) + std::string(origin)));
}
