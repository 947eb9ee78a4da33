// What is known of the folders that are searched, and of the volumes, and what it means.

#include "apps/common/HumanText.h"
#include "apps/ombrix/Checkup.h"
#include "apps/ombrix/ShellWord.h"
#include "platform/FileProblemText.h"
#include "platform/PathText.h"

#include <algorithm>

namespace ombrix {
namespace {

    using platform::FileProblem;
    using platform::isSameOrBelow;
    using platform::pathJoined;

    constexpr const char* libraries = "libraries";
    constexpr const char* volumes = "volumes";

    std::vector<const FolderState*> searchedFolders(const CheckupFacts& facts)
    {
        std::vector<const FolderState*> folders;
        for (const auto* searched : { &facts.projects, &facts.events }) {
            for (const FolderState& folder : *searched)
                folders.push_back(&folder);
        }
        return folders;
    }

    std::string silenceOf(const std::string& path)
    {
        return path + " does not answer within 2 seconds";
    }

    /// The volume that holds `path`, as far as the path tells; null for the system's own disk.
    const FolderState* volumeOf(const CheckupFacts& facts, std::string_view path)
    {
        const FolderState* found = nullptr;
        for (const FolderState& volume : facts.volumes) {
            const bool holdsIt = isSameOrBelow(path, volume.path)
                || (!volume.name.empty() && isSameOrBelow(path, "/Volumes/" + volume.name));
            if (volume.path != "/" && holdsIt && (!found || volume.path.size() > found->path.size()))
                found = &volume;
        }
        return found;
    }

    /// The paths below it answer again once it is gone.
    std::string commandToTakeOff(const FolderState* volume)
    {
        return volume && volume->path != "/" ? "sudo umount --lazy " + shellWord(volume->path) : std::string();
    }

    std::string withProblem(const FolderState& folder)
    {
        return folder.path + ": " + std::string(platform::textOfFileProblem(folder.problem));
    }

    void checkFolder(const CheckupFacts& facts, const FolderState& folder, std::vector<Finding>& findings)
    {
        if (folder.isSilent) {
            // A silent volume is named by itself.
            if (const FolderState* volume = volumeOf(facts, folder.path); !volume || !volume->isSilent)
                findings.push_back({ Severity::fail, libraries, silenceOf(folder.path), commandToTakeOff(volume) });
        } else if (folder.problem == FileProblem::notPermitted) {
            const std::string where = folder.blockedAt == folder.path ? std::string() : " (" + folder.blockedAt + ")";
            findings.push_back({ Severity::fail, libraries, withProblem(folder) + where,
                "chmod u+rx " + shellWord(folder.blockedAt) });
        } else if (folder.problem == FileProblem::notAFolder) {
            findings.push_back(
                { Severity::note, libraries, folder.path + " is no folder, so nothing is searched there" });
        } else if (folder.isThere() && folder.problem != FileProblem::none) {
            findings.push_back({ Severity::fail, libraries, withProblem(folder) });
        }
    }

    void checkClosed(const CheckupFacts& facts, std::vector<Finding>& findings)
    {
        for (const FolderState* folder : distinctSearchFolders(facts)) {
            for (const std::string& closed : folder->closed)
                findings.push_back({ Severity::warn, libraries,
                    closed + ": " + std::string(textOfFileProblem(FileProblem::notPermitted))
                        + ", so nothing below it is shown",
                    "chmod u+rx " + shellWord(closed) });
            if (folder->hasMoreClosed)
                findings.push_back(
                    { Severity::warn, libraries, folder->path + " holds more folders that may not be read" });
        }
    }

    /// Volumes are searched by what they are called, and two of one name are one path.
    void checkNames(const CheckupFacts& facts, std::vector<Finding>& findings)
    {
        for (std::size_t index = 0; index < facts.volumes.size(); ++index) {
            for (std::size_t before = 0; before < index; ++before) {
                const FolderState& one = facts.volumes[before];
                const FolderState& other = facts.volumes[index];
                if (!one.name.empty() && one.name == other.name)
                    findings.push_back({ Severity::warn, volumes,
                        one.path + " and " + other.path + " are both called \"" + one.name
                            + "\", so only one of them is searched, and twice: rename the other" });
            }
        }
    }

    void checkSpellings(const std::vector<FolderState>& searched, std::vector<Finding>& findings)
    {
        for (std::size_t index = 0; index < searched.size(); ++index) {
            if (searched[index].isThere() && searched[index].timesSearched > 1)
                findings.push_back({ Severity::note, libraries,
                    searched[index].path + " is searched " + apps::countText(searched[index].timesSearched)
                        + " times, and what it holds is shown as often" });
            for (std::size_t before = 0; before < index; ++before) {
                const FolderState& one = searched[before];
                const FolderState& other = searched[index];
                if (!one.isThere() || !other.isThere())
                    continue;
                if (one.realPath == other.realPath)
                    findings.push_back({ Severity::note, libraries,
                        one.path + " and " + other.path + " are one folder, whose content is shown twice" });
                else if (isSameOrBelow(one.realPath, other.realPath) || isSameOrBelow(other.realPath, one.realPath))
                    findings.push_back({ Severity::note, libraries,
                        one.path + " and " + other.path + " lie one in the other, so some content is shown twice" });
            }
        }
    }

    std::string commandToBringHome(const StrayLibrary& library)
    {
        if (!library.movies.isThere())
            return "ln -s " + shellWord(library.videos) + " " + shellWord(library.movies.path);
        if (!library.sought.isThere())
            return "mv -n " + shellWord(library.stray.path) + " " + shellWord(library.sought.path);
        return "mv -n " + shellWord(library.stray.path) + "/* " + shellWord(library.sought.path) + "/";
    }

    void checkStrays(const CheckupFacts& facts, std::vector<Finding>& findings)
    {
        for (const StrayLibrary& library : facts.strays) {
            const std::string command = commandToBringHome(library);
            findings.push_back({ Severity::warn, libraries,
                library.stray.path + " is not searched; " + library.sought.path + " is", command });
        }
    }

    void tellCounts(const CheckupFacts& facts, std::vector<Finding>& findings)
    {
        std::size_t there = 0;
        const std::vector<const FolderState*> folders = searchedFolders(facts);
        for (const FolderState* folder : folders)
            there += folder->isThere();
        const auto silent = static_cast<std::size_t>(
            std::count_if(folders.begin(), folders.end(), [](const FolderState* folder) { return folder->isSilent; }));
        const std::size_t absentCount = folders.size() - there - silent;
        const std::string absent
            = absentCount == 0 ? "" : "; " + apps::countText(absentCount) + " do not, which is normal";
        if (there == 0 && silent == 0)
            findings.push_back({ Severity::note, libraries,
                "none of the " + apps::countText(folders.size()) + " search folders exists, so nothing is shown" });
        else
            findings.push_back({ Severity::ok, libraries,
                apps::quantityText(there, "search folder") + (there == 1 ? " exists" : " exist") + absent });
    }

} // namespace

void checkLibraries(const CheckupFacts& facts, std::vector<Finding>& findings)
{
    if (!facts.sourceAnswered) {
        const std::string home = facts.home.empty() ? "the home folder" : facts.home;
        findings.push_back({ Severity::fail, libraries, "which folders are searched cannot be told: " + silenceOf(home),
            commandToTakeOff(volumeOf(facts, facts.home)) });
        return;
    }
    tellCounts(facts, findings);
    for (const FolderState* folder : searchedFolders(facts))
        checkFolder(facts, *folder, findings);
    checkClosed(facts, findings);
    checkSpellings(facts.projects, findings);
    checkSpellings(facts.events, findings);
    checkStrays(facts, findings);
}

void checkVolumes(const CheckupFacts& facts, std::vector<Finding>& findings)
{
    if (!facts.volumesAnswered) {
        findings.push_back({ Severity::fail, volumes, "what is mounted cannot be told: the system does not answer" });
        return;
    }
    const std::size_t before = findings.size();
    for (const FolderState& volume : facts.volumes) {
        if (volume.isSilent)
            findings.push_back({ Severity::fail, volumes, silenceOf(volume.path), commandToTakeOff(&volume) });
        else if (volume.problem != FileProblem::none)
            findings.push_back({ Severity::note, volumes, withProblem(volume) });
        else if (!volume.isFit)
            findings.push_back({ Severity::note, volumes,
                volume.path + " is of type " + volume.fileSystem
                    + ": shown, but the editor keeps no libraries there" });
    }
    checkNames(facts, findings);
    if (findings.size() == before)
        findings.push_back({ Severity::ok, volumes,
            facts.volumes.empty() ? "none is mounted"
                                  : apps::quantityText(facts.volumes.size(), "volume") + ", fit for libraries" });
}

} // namespace ombrix
