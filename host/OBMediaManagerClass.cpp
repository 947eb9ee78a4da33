#include "host/OBMediaManagerClass.h"

#include "host/FrameworkCore.h"
#include "host/OBMediaManager.h"
#include "platform/FileSystem.h"

OBMediaManagerClass::~OBMediaManagerClass() = default;

bool OBMediaManagerClass::isManagedMediaSource() const
{
    return true;
}

platform::Value OBMediaManagerClass::supportedPasteboardTypes() const
{
    return platform::Value::List {};
}

bool OBMediaManagerClass::validDiskFormat(std::string_view path) const
{
    const auto platform = OBSharedPlatform();
    return platform && platform->fileSystem.exists(path);
}

std::shared_ptr<const platform::Platform> OBSharedPlatform()
{
    const auto core = FrameworkCore::current();
    return core ? std::shared_ptr<const platform::Platform>(core, &core->platform()) : nullptr;
}
