#pragma once

#include "platform/Value.h"

#include <string>
#include <string_view>
#include <vector>

namespace platform {

/// What a person copies or drags: one thing in several representations, each of a type. One thread at a time.
class Pasteboard {
public:
    virtual ~Pasteboard() = default;

    /// Begins anew: what was there is gone, and representations of `types` are offered by `owner`, an identity that is
    /// never dereferenced.
    virtual void declareTypes(const std::vector<std::string>& types, const void* owner) = 0;
    /// Offers further types beside those that are there.
    virtual void addTypes(const std::vector<std::string>& types, const void* owner) = 0;

    /// The representation of a type that has been declared: bytes, or a property list. False for any other type.
    virtual bool setData(std::string bytes, std::string_view type) = 0;
    virtual bool setPropertyList(Value value, std::string_view type) = 0;
};

} // namespace platform
