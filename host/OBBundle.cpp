#include "host/OBBundle.h"

#include <utility>

using platform::Text;

OBBundle::OBBundle(const platform::Bundles& bundles, std::string folder, platform::BundleManifest manifest,
    platform::Value stringTable)
    : _bundles(bundles)
    , _folder(std::move(folder))
    , _manifest(std::move(manifest))
    , _identifier(_manifest.identifier)
    , _stringTable(std::move(stringTable))
{
}

Text OBBundle::localizedString(std::string_view key) const
{
    const platform::Value value = _stringTable.valueForKey(key);
    const Text* text = value.text();
    return text ? *text : Text();
}

OBImageRef OBBundle::imageNamed(std::string_view name, Text imageName) const
{
    const auto resource = _bundles.imageResource(_folder, name);
    return resource ? OBImage::pictureNamed(std::move(imageName), resource->size, Text(resource->file)) : nullptr;
}
