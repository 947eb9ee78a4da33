#pragma once

#include "platform/Value.h"

#include <optional>

// How a preference of any stored type is read as what is wanted.

/// A stored boolean, number or text as a boolean: a number is true unless it is zero; a text when, after white space, a
/// sign and zeros, it begins with Y, y, T, t or 1 to 9. Absent for any other type.
std::optional<bool> booleanOfPreference(const platform::Value& value);

/// A stored number, boolean (1 or 0) or text as a number. Of a text, the decimal number at its start after white space;
/// 0.0 when it does not start with one. Absent for any other type.
std::optional<double> doubleOfPreference(const platform::Value& value);
