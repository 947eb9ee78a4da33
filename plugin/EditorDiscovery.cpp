// Where the editor is. A fresh look at every call: the editor may be installed or removed while the source is shown.

#include "plugin/MontaroConstants.h"
#include "plugin/OBMontaroPlugin.h"

#include "host/OBLog.h"
#include "platform/Workspace.h"

using platform::Text;

Text OBMontaroPlugin::getAppPath()
{
    const auto path = platform().workspace.applicationPath(MontaroBundleIdentifier);
    if (!path) {
        OBLog("OBMBMontaroPlugin -- getAppPath -- could not find Montaro Application", 2, this);
        return {};
    }
    return Text(*path);
}

bool OBMontaroPlugin::appInstalled()
{
    const Text path = getAppPath();
    if (!path)
        return false;
    OBLog("appInstalled: OS told me: " + path.string(), 2, this);
    return true;
}

Text OBMontaroPlugin::applicationVersion()
{
    return MontaroApplicationVersion;
}
