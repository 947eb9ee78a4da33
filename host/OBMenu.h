#pragma once

#include "host/OBExport.h"
#include "host/OBMediaGroup.h"
#include "host/OBMediaObject.h"
#include "platform/Text.h"

#include <memory>
#include <string_view>
#include <variant>
#include <vector>

class OBMediaManager;
struct OBMenuItem;

/// What a menu item does to its target when it is chosen. Compared by identity; there is one of each.
struct OBMenuAction {
    std::string_view name; ///< the operation's, with its colon
    void (*perform)(OBMediaManager& target, const OBMenuItem& item);
};

/// One item of a menu.
struct OBMenuItem {
    platform::Text title {};
    const OBMenuAction* action = nullptr;
    platform::Text keyEquivalent {};
    /// The media object or group that the menu was built for.
    std::variant<std::monostate, OBMediaObjectRef, OBMediaGroupRef> representedObject {};
    /// Not kept alive by the menu.
    std::weak_ptr<OBMediaManager> target {};

    /// Chooses the item: performs its action, on the calling thread. Nothing when the target has gone.
    OB_EXPORT void choose() const;
};

/// A menu that a window can show and a terminal can print. It belongs to whoever asked for it.
struct OBMenu {
    platform::Text title {};
    bool autoenablesItems = true; ///< false: every item is enabled and stays so
    std::vector<OBMenuItem> items {};
};

using OBMenuRef = std::shared_ptr<OBMenu>;
