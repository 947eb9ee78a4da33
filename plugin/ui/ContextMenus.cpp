// What a person can do with a movie or a group: open the editor, or see the movie's file.
//
// The one surprise: opening opens the editor itself, whatever was chosen.

#include "plugin/MontaroConstants.h"
#include "plugin/OBMontaroPlugin.h"

#include "host/OBConstants.h"
#include "platform/Notifications.h"
#include "platform/Workspace.h"

#include <array>

using platform::Text;

namespace {

constexpr OBMenuAction openAction { "contextMenuOpen:", [](OBMediaManager& target, const OBMenuItem& item) {
                                       static_cast<OBMontaroPlugin&>(target).contextMenuOpen(item);
                                   } };
constexpr OBMenuAction revealAction { "contextMenuReveal:", [](OBMediaManager& target, const OBMenuItem& item) {
                                         static_cast<OBMontaroPlugin&>(target).contextMenuReveal(item);
                                     } };

constexpr std::array<std::string_view, 1> editorIdentifiers { MontaroBundleIdentifier };

OBMenuRef emptyMenu(std::string_view title)
{
    auto menu = std::make_shared<OBMenu>();
    menu->title = Text(title);
    menu->autoenablesItems = false;
    return menu;
}

} // namespace

OBMenuRef OBMontaroPlugin::contextMenuForMediaObject_inMediaGroup(
    const OBMediaObjectRef& object, const OBMediaGroupRef&)
{
    if (!object)
        return nullptr;
    OBMenuRef menu = emptyMenu("Object Context Menu");
    addItem(*menu, "OpenInMontaro", openAction, object);
    addItem(*menu, "RevealInNavion", revealAction, object);
    return menu;
}

OBMenuRef OBMontaroPlugin::contextMenuForMediaGroup(const OBMediaGroupRef& group)
{
    if (!group)
        return nullptr;
    OBMenuRef menu = emptyMenu("Group Context Menu");
    addItem(*menu, group == rootMediaGroup() ? "OpenMontaro" : "OpenInMontaro", openAction, group);
    return menu;
}

/// Nothing where there is no text for the title.
template <class Represented>
void OBMontaroPlugin::addItem(
    OBMenu& menu, std::string_view titleKey, const OBMenuAction& action, const Represented& representedObject)
{
    if (const Text title = localizedString(titleKey))
        menu.items.push_back({ title, &action, "", representedObject, weak_from_this() });
}

void OBMontaroPlugin::contextMenuOpen(const OBMenuItem&)
{
    for (const std::string_view identifier : editorIdentifiers) {
        const auto location = platform().workspace.applicationPath(identifier);
        if (!location || location->empty())
            continue;
        postWillOpenOrReveal();
        platform().workspace.launchApplication(identifier);
        return;
    }
}

void OBMontaroPlugin::contextMenuReveal(const OBMenuItem& item)
{
    const auto* object = std::get_if<OBMediaObjectRef>(&item.representedObject);
    const Text path = object && *object ? (*object)->aliasResolvedPath() : Text();
    if (path.empty())
        return;
    postWillOpenOrReveal();
    platform().workspace.revealFile(path);
}

void OBMontaroPlugin::postWillOpenOrReveal()
{
    platform().notifications.post({ OBWillOpenOrRevealInSourceNotification, this });
}
