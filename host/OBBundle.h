#pragma once

#include "host/OBExport.h"
#include "host/OBImage.h"
#include "platform/Bundles.h"
#include "platform/Value.h"

#include <string>
#include <string_view>

/// The folder that a plug-in comes in: its manifest, its texts in the user's language, its pictures.
///
/// Texts are those of the first of the user's languages that the bundle has a table for, else the English ones.
/// Constant once made; any thread.
class OB_EXPORT OBBundle {
public:
    /// `bundles` outlives the bundle.
    OBBundle(const platform::Bundles& bundles, std::string folder, platform::BundleManifest manifest,
        platform::Value stringTable);

    platform::Text identifier() const { return _identifier; }
    const std::string& folder() const { return _folder; }
    const platform::BundleManifest& manifest() const { return _manifest; }

    /// The text for `key`; absent when the table has none, which is not the same as an empty text.
    platform::Text localizedString(std::string_view key) const;

    /// A new image of the picture called `name`, at its natural size; null when the bundle has none.
    OBImageRef imageNamed(std::string_view name, platform::Text imageName) const;

private:
    const platform::Bundles& _bundles;
    const std::string _folder;
    const platform::BundleManifest _manifest;
    const platform::Text _identifier;
    const platform::Value _stringTable;
};
