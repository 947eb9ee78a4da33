// What the source tells an operator beside its tree. Nothing here runs a load.

#include "plugin/MontaroConstants.h"
#include "plugin/OBMontaroPlugin.h"
#include "plugin/ScanReason.h"
#include "plugin/SearchFolders.h"

#include "host/OBConstants.h"
#include "platform/PathText.h"

#include <utility>

using platform::Text;

namespace {

bool liesInFolderCalled(const std::string& path, const std::string& name)
{
    return (path + "/").find("/" + name + "/") != std::string::npos;
}

/// Of `path` in the search folder `folder`, where what passes `rule` is listed, and of what is in that only the content
/// of `folderInside`: why it is none of it. Absent where that is not why.
std::optional<OBUnsearchedPlace> whyNotLookedFor(const platform::FileSystem& fileSystem, const std::string& path,
    const std::string& folder, const ScanRule& rule, std::string_view folderInside)
{
    std::string_view outermost;
    for (std::string_view step = path; step.size() > folder.size();
         step = platform::pathByRemovingLastComponent(step)) {
        if (fileSystem.exists(platform::pathJoined(step, rule.marker)))
            outermost = step;
    }
    if (outermost.empty() || outermost == path
        || platform::isSameOrBelow(path, platform::pathJoined(outermost, folderInside)))
        return std::nullopt;
    ScanReason reason = reasonInside(fileSystem, rule, outermost, path);
    return OBUnsearchedPlace { std::move(reason.text), std::move(reason.remedy) };
}

} // namespace

OBSourceInspection* OBMontaroPlugin::inspection()
{
    return this;
}

std::vector<std::string> OBMontaroPlugin::projectSearchPaths()
{
    const MontaroSearchPaths paths = _MontaroSearchPaths.load();
    return stringsOf(paths ? *paths : foldersToSearch(platform(), _MontaroDefaultPath(), MontaroProjectsFolderName));
}

std::vector<std::string> OBMontaroPlugin::eventSearchPaths()
{
    const MontaroSearchPaths paths = _MontaroEventsSearchPaths.load();
    return stringsOf(
        paths ? *paths : foldersToSearch(platform(), _MontaroDefaultEventsFolderPath(), MontaroEventsFolderName));
}

std::optional<bool> OBMontaroPlugin::mostRecentEventFirst() const
{
    return _mostRecentEventFirst;
}

std::vector<std::string> OBMontaroPlugin::preferencesDomains() const
{
    return { MontaroBundleIdentifier, std::string(OBHostPreferencesDomain) };
}

std::optional<double> OBMontaroPlugin::pluginVersionNumber() const
{
    return OBMBMontaroPluginVersionNumber;
}

std::optional<std::string> OBMontaroPlugin::pluginVersionString() const
{
    return std::string(reinterpret_cast<const char*>(OBMBMontaroPluginVersionString));
}

std::optional<OBUnsearchedPlace> OBMontaroPlugin::whyUnsearched(const std::string& path) const
{
    const auto folderAround = [&path](const MontaroSearchPaths& folders) -> std::optional<std::string> {
        for (const Text& folder : folders ? *folders : std::vector<Text>()) {
            if (platform::isSameOrBelow(path, folder))
                return folder.string();
        }
        return std::nullopt;
    };
    const platform::FileSystem& files = platform().fileSystem;
    if (const auto folder = folderAround(_MontaroSearchPaths.load()))
        return whyNotLookedFor(files, path, *folder, rules::hasProjectMarker, sharedItemsFolder);
    if (const auto folder = folderAround(_MontaroEventsSearchPaths.load()))
        return whyNotLookedFor(files, path, *folder, rules::hasEventMarker, clipsFolder);
    if (!liesInFolderCalled(path, MontaroProjectsFolderName) && !liesInFolderCalled(path, MontaroEventsFolderName))
        return std::nullopt;
    return OBUnsearchedPlace { "its volume or folder is not searched; folders of that name are searched in the home "
                               "folder's Movies and at the top of local volumes and removable media",
        "move the library there, or mount its volume" };
}
