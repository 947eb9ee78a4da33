// Which disks the editor can keep its libraries on.

#include "plugin/OBMontaroPlugin.h"

#include "host/OBMediaManagerClass.h"
#include "platform/Platform.h"
#include "platform/Volumes.h"

#include <algorithm>
#include <array>

namespace {

constexpr std::array<std::string_view, 6> refusedTypes { "msdos", "ntfs", "nfs", "orbfs", "webdav", "udf" };

} // namespace

bool OBMontaroPlugin::validDiskFormat(std::string_view path)
{
    const auto machine = OBSharedPlatform();
    const std::optional<std::string> type = machine ? machine->volumes.fileSystemType(path) : std::nullopt;
    return type && std::find(refusedTypes.begin(), refusedTypes.end(), *type) == refusedTypes.end();
}
