#pragma once

#include "host/OBExport.h"

#include <string_view>

/// Compares two texts without regard to case: Unicode simple case folding, by code point, in no locale. Bytes that are
/// no UTF-8 count as U+FFFD each. -1, 0 or +1. Any thread.
OB_EXPORT int OBCaseInsensitiveCompare(std::string_view left, std::string_view right);
