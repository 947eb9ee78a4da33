#pragma once

#include "platform/Pasteboard.h"

#include <optional>

namespace platform {

/// A pasteboard that keeps what is written, for whoever hands it on or looks at it.
class MemoryPasteboard final : public Pasteboard {
public:
    struct Item {
        std::string type;
        const void* owner = nullptr;
        std::optional<std::string> data {};
        std::optional<Value> propertyList {};
    };

    void declareTypes(const std::vector<std::string>& types, const void* owner) override;
    void addTypes(const std::vector<std::string>& types, const void* owner) override;
    bool setData(std::string bytes, std::string_view type) override;
    bool setPropertyList(Value value, std::string_view type) override;

    /// In the order in which the types were declared.
    const std::vector<Item>& items() const { return _items; }
    /// The item of a type, or null.
    const Item* item(std::string_view type) const;

private:
    Item* find(std::string_view type);

    std::vector<Item> _items;
};

} // namespace platform
