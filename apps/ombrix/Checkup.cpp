// What is known of the editor, the watching and the preferences, and what it means.

#include "apps/ombrix/Checkup.h"

#include "apps/common/HumanText.h"
#include "apps/ombrix/ShellWord.h"

#include <algorithm>

namespace ombrix {
namespace {

    using apps::countText;
    using platform::FollowingMeans;
    using platform::WatchingLimit;

    void checkEditor(const CheckupFacts& facts, std::vector<Finding>& findings)
    {
        constexpr const char* subject = "editor";
        if (!facts.editorAnswered)
            findings.push_back(
                { Severity::fail, subject, "where the editor is, the disk that would tell does not answer" });
        else if (!facts.editorPath && facts.canLoad)
            return; // a source that loads without an editor has none
        else if (!facts.editorPath)
            findings.push_back({ Severity::fail, subject, "it is not installed, so its libraries are not shown" });
        else if (!facts.canLoad)
            findings.push_back({ Severity::fail, subject,
                "nothing exists at " + *facts.editorPath
                    + ", where it is said to be, so its libraries are not shown" });
        else
            findings.push_back({ Severity::ok, subject, *facts.editorPath });
    }

    std::string limitText(const WatchingLimit& limit)
    {
        return countText(limit.inUse) + " of " + countText(limit.allowed);
    }

    void checkLimits(const CheckupFacts& facts, std::vector<Finding>& findings)
    {
        constexpr const char* subject = "watching";
        const std::uint64_t wanted = foldersToWatch(facts);
        const std::vector<const FolderState*> folders = distinctSearchFolders(facts);
        const bool hasMore
            = std::any_of(folders.begin(), folders.end(), [](const FolderState* folder) { return folder->hasMore; });
        const std::string folderText = (hasMore ? "more than " : "") + apps::quantityText(wanted, "folder");
        if (!facts.limits) {
            findings.push_back({ Severity::note, subject, "what the kernel allows to be watched cannot be told" });
            return;
        }
        const auto& [watches, instances] = *facts.limits;
        const std::uint64_t room = watches.allowed - std::min(watches.allowed, watches.inUse);
        if (instances.inUse >= instances.allowed)
            findings.push_back({ Severity::warn, subject,
                folderText + " would be looked at every 10 s: all inotify instances that the kernel allows ("
                    + countText(instances.allowed) + ") are in use",
                instances.remedy });
        else if (wanted > room)
            findings.push_back({ Severity::warn, subject,
                countText(wanted - room) + " of " + folderText + " would be looked at every 10 s: " + limitText(watches)
                    + " watches that the kernel allows are in use",
                watches.remedy });
        else
            findings.push_back({ Severity::ok, subject,
                folderText + " to follow; " + limitText(watches) + " watches and " + limitText(instances)
                    + " inotify instances are in use" });
    }

    void checkMeans(const CheckupFacts& facts, std::vector<Finding>& findings)
    {
        for (const FolderState* folder : distinctSearchFolders(facts)) {
            if (folder->means == FollowingMeans::looking)
                findings.push_back({ Severity::note, "watching",
                    folder->path
                        + " is looked at every 10 s: the kernel does not report what others change on a file "
                          "system of type "
                        + folder->fileSystem });
            else if (folder->means == FollowingMeans::nothing)
                findings.push_back({ Severity::note, "watching", folder->path + " is not followed" });
        }
    }

    void checkPreferences(const CheckupFacts& facts, std::vector<Finding>& findings)
    {
        constexpr const char* subject = "preferences";
        for (const DamagedPreferences& preferences : facts.preferences) {
            if (preferences.isSilent) {
                findings.push_back({ Severity::fail, subject,
                    "the disk that holds those of " + preferences.domain + " does not answer" });
                continue;
            }
            const std::string file = shellWord(preferences.file);
            const std::string remedy = preferences.file.empty() ? std::string()
                : preferences.isNotPermitted                    ? "chmod u+r " + file
                                             : "mv -n " + file + " " + shellWord(preferences.file + ".damaged");
            findings.push_back({ remedy.empty() ? Severity::note : Severity::warn, subject,
                preferences.problem + "; the defaults are used", remedy });
        }
        if (facts.preferences.empty() && facts.preferencesAsked > 0)
            findings.push_back({ Severity::ok, subject, "none is damaged" });
    }

} // namespace

std::string_view textOfSeverity(Severity severity)
{
    switch (severity) {
    case Severity::ok:
        return "ok";
    case Severity::note:
        return "note";
    case Severity::warn:
        return "warn";
    case Severity::fail:
        break;
    }
    return "fail";
}

std::vector<Finding> findingsOf(const CheckupFacts& facts)
{
    std::vector<Finding> findings;
    checkEditor(facts, findings);
    checkLibraries(facts, findings);
    checkLimits(facts, findings);
    checkMeans(facts, findings);
    checkVolumes(facts, findings);
    checkPreferences(facts, findings);
    return findings;
}

} // namespace ombrix
