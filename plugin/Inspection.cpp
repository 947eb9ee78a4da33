// What the source tells an operator beside its tree. Nothing here runs a load.

#include "plugin/MontaroConstants.h"
#include "plugin/OBMontaroPlugin.h"
#include "plugin/SearchFolders.h"

#include "host/OBConstants.h"

using platform::Text;

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
