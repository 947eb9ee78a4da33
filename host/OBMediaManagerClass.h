#pragma once

#include "host/OBExport.h"
#include "platform/Value.h"

#include <memory>
#include <string_view>

class OBManagerContext;
class OBMediaManager;

namespace platform {
struct Platform;
}

/// The class operations of a plug-in's manager, which the framework calls without an instance, and its factory.
///
/// A plug-in's library holds one, for as long as the process lives, and hands it out through its C entry point. Any
/// thread.
class OB_EXPORT OBMediaManagerClass {
public:
    virtual ~OBMediaManagerClass();

    /// Whether the framework itself manages the media of this source. For applications; no load depends on it.
    virtual bool isManagedMediaSource() const;
    /// A list of the pasteboard types that this source can write.
    virtual platform::Value supportedPasteboardTypes() const;
    /// A new manager on which `init` has not been called yet.
    virtual std::unique_ptr<OBMediaManager> alloc(const OBManagerContext& context) const = 0;
    /// Whether the volume that holds `path` has a type of file system that may be scanned. May block.
    virtual bool validDiskFormat(std::string_view path) const;
};

/// The machine that class operations run on, which have no manager to ask; null while there is no host.
OB_EXPORT std::shared_ptr<const platform::Platform> OBSharedPlatform();

/// The C function by which a plug-in's library hands out its class; it may answer null when it does not want to be
/// loaded.
using OBPluginEntryPoint = const OBMediaManagerClass* (*)();

/// The name of that function.
inline constexpr const char* OBPluginEntryPointName = "OBPluginMediaManagerClass";
