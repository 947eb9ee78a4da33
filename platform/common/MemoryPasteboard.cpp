#include "platform/common/MemoryPasteboard.h"

#include <algorithm>
#include <utility>

namespace platform {

void MemoryPasteboard::declareTypes(const std::vector<std::string>& types, const void* owner)
{
    _items.clear();
    addTypes(types, owner);
}

void MemoryPasteboard::addTypes(const std::vector<std::string>& types, const void* owner)
{
    for (const std::string& type : types) {
        if (Item* known = find(type))
            known->owner = owner;
        else
            _items.push_back({ type, owner });
    }
}

bool MemoryPasteboard::setData(std::string bytes, std::string_view type)
{
    Item* item = find(type);
    if (!item)
        return false;
    item->data = std::move(bytes);
    item->propertyList.reset();
    return true;
}

bool MemoryPasteboard::setPropertyList(Value value, std::string_view type)
{
    Item* item = find(type);
    if (!item)
        return false;
    item->propertyList = std::move(value);
    item->data.reset();
    return true;
}

const MemoryPasteboard::Item* MemoryPasteboard::item(std::string_view type) const
{
    const auto found
        = std::find_if(_items.begin(), _items.end(), [type](const Item& item) { return item.type == type; });
    return found != _items.end() ? &*found : nullptr;
}

MemoryPasteboard::Item* MemoryPasteboard::find(std::string_view type)
{
    return const_cast<Item*>(item(type));
}

} // namespace platform
