#include "apps/common/ExportedProjects.h"

#include "platform/common/MemoryPasteboard.h"
#include "platform/formats/PropertyList.h"

namespace apps {

std::optional<std::string> propertyListWritten(
    std::string_view type, const std::function<void(platform::Pasteboard&)>& write)
{
    platform::MemoryPasteboard pasteboard;
    write(pasteboard);
    const platform::MemoryPasteboard::Item* item = pasteboard.item(type);
    if (!item || !item->propertyList)
        return std::nullopt;
    return platform::writeXmlPropertyList(*item->propertyList);
}

} // namespace apps
