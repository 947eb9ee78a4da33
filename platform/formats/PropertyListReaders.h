#pragma once

#include "platform/formats/PropertyList.h"

namespace platform {

/// What both forms of property lists are held to.
inline constexpr std::size_t deepestPropertyList = 256;
inline constexpr std::size_t mostPropertyListValues = 1'000'000;

/// The two readers behind `readPropertyList`.
PropertyListResult readXmlPropertyList(std::string_view bytes);
PropertyListResult readBinaryPropertyList(std::string_view bytes);

} // namespace platform
