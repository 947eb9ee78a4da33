#pragma once

#include "platform/Bundles.h"

#include <string_view>

namespace platform {

/// Reads a bundle's manifest, a JSON object with the keys identifier, version, hostInterface (an object with the whole
/// numbers minimum and maximum), library, class and languages (a list of texts); all are required, no other is allowed.
///
/// The problem begins with the number of the line, so that whoever knows the file's name puts it and a colon before it.
ManifestAnswer readManifest(std::string_view bytes);

} // namespace platform
