// The icons: one root icon an instance, five icons that all instances share.
//
// The one surprise: whatever stood in for the editor's icon at first stays for the life of the instance.

#include "plugin/MontaroConstants.h"
#include "plugin/OBMontaroPlugin.h"
#include "plugin/SharedValues.h"

#include "host/OBMediaBrowserImageManager.h"
#include "platform/Workspace.h"

using platform::Locked;
using platform::Size;
using platform::Text;

namespace {

constexpr Size iconSize { 16.0, 16.0 };

} // namespace

OBImageRef OBMontaroPlugin::rootMediaGroupIcon()
{
    Locked guard(*_appIconLock);
    if (_appIcon)
        return _appIcon;
    if (const Text editor = getAppPath()) {
        if (const auto file = platform().workspace.applicationIconFile(editor))
            _appIcon = OBImage::pictureNamed(MontaroAppIconFile, iconSize, Text(*file));
    }
    if (!_appIcon) {
        if (const auto imageManager = OBMediaBrowserImageManager::sharedInstance())
            _appIcon = imageManager->imageNamed_inBundle(MontaroAppIconFile, pluginBundle());
    }
    if (_appIcon) {
        _appIcon->setScalesWhenResized(true);
        _appIcon->setSize(iconSize);
    }
    return _appIcon;
}

void OBMontaroPlugin::_grabMontaroIcons()
{
    SharedValues& shared = sharedValues();
    if (!shared.smallAppIcon.load()) {
        if (const OBImageRef rootIcon = rootMediaGroupIcon()) {
            const OBImageRef copy = rootIcon->copyNamed("smallAppIcon");
            copy->setSize(iconSize);
            shared.smallAppIcon.store(copy);
        }
    }
    if (!shared.projectIcon.load())
        shared.projectIcon.store(pluginBundle().imageNamed(MontaroProjectIconFile, "projectIcon"));
    if (!shared.emptyProjectIcon.load())
        shared.emptyProjectIcon.store(shared.projectIcon.load());
    if (!shared.eventIcon.load())
        shared.eventIcon.store(pluginBundle().imageNamed(MontaroEventIconFile, "eventIcon"));
    if (!shared.calendarIcon.load())
        shared.calendarIcon.store(pluginBundle().imageNamed(MontaroCalendarIconFile, "calendarIcon"));
}
