// What the source tells an operator beside its tree. Nothing here runs a load.

#include "plugin/MontaroConstants.h"
#include "plugin/OBMontaroPlugin.h"
#include "plugin/SearchFolders.h"

#include "host/OBConstants.h"

using platform::Text;

namespace {

bool liesInFolderCalled(const std::string& path, const std::string& name)
{
    return (path + "/").find("/" + name + "/") != std::string::npos;
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
    if (!liesInFolderCalled(path, MontaroProjectsFolderName) && !liesInFolderCalled(path, MontaroEventsFolderName))
        return std::nullopt;
    return OBUnsearchedPlace { "its volume or folder is not searched; folders of that name are searched in the home "
                               "folder's Movies and at the top of local volumes and removable media",
        "move the library there, or mount its volume" };
}
