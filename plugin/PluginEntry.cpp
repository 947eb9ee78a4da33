#include "plugin/OBMontaroPlugin.h"

#include "host/OBMediaManagerClass.h"

#include <memory>

namespace {

/// Forwards the framework's class calls to the class.
class MontaroPluginClass final : public OBMediaManagerClass {
public:
    bool isManagedMediaSource() const override { return OBMontaroPlugin::isManagedMediaSource(); }
    platform::Value supportedPasteboardTypes() const override { return OBMontaroPlugin::supportedPasteboardTypes(); }
    std::unique_ptr<OBMediaManager> alloc(const OBManagerContext& context) const override
    {
        return std::make_unique<OBMontaroPlugin>(context);
    }
    bool validDiskFormat(std::string_view path) const override { return OBMontaroPlugin::validDiskFormat(path); }
};

} // namespace

extern "C" OB_EXPORT const OBMediaManagerClass* OBPluginMediaManagerClass()
{
    static const MontaroPluginClass pluginClass;
    return &pluginClass;
}
