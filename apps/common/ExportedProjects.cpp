#include "apps/common/ExportedProjects.h"

#include "platform/common/MemoryPasteboard.h"
#include "platform/formats/PropertyList.h"

#include <utility>

namespace apps {
namespace {

    /// A property list is of a private type, whose name becomes a MIME type of its own.
    constexpr std::string_view privateTypes = "application/x-ombrix-";

} // namespace

Exported exportedBy(const std::function<void(platform::Pasteboard&)>& write, std::string_view type)
{
    platform::MemoryPasteboard pasteboard;
    write(pasteboard);
    Exported exported;
    for (const platform::MemoryPasteboard::Item& item : pasteboard.items()) {
        if (item.data)
            exported.items.push_back({ item.type, *item.data });
        if (!item.propertyList)
            continue;
        std::string text = platform::writeXmlPropertyList(*item.propertyList);
        if (item.type == type)
            exported.propertyList = text;
        exported.items.push_back({ std::string(privateTypes) + item.type, std::move(text) });
    }
    return exported;
}

} // namespace apps
