#pragma once

#include "platform/Value.h"

#include <cstddef>
#include <string>
#include <string_view>

namespace platform {

/// A property list's value, or why there is none.
struct PropertyListResult {
    Value value;
    /// One line with the place, by line and column in XML and by offset in a binary file; empty when read.
    std::string problem;
};

/// The largest property list that is read, in bytes.
inline constexpr std::size_t largestPropertyList = 64 * 1024 * 1024;

/// Reads a property list, XML (version 1.0) or binary (bplist00), as its first bytes tell.
///
/// Whatever the bytes are, time and memory are linear in their number, and what is not exactly right is refused:
/// unknown elements, entities of its own, repeated keys, numbers and dates out of range, references in circles, more
/// than 256 levels, or more than a million values, where a value that several refer to counts each time.
/// Numbers become integers where 64 bits with a sign hold them, else reals; what is only a reference inside an archive
/// (UID) becomes data.
PropertyListResult readPropertyList(std::string_view bytes);

/// `value` as an XML property list. Any reader of XML takes it whatever bytes the texts hold: control characters other
/// than tab, line feed and carriage return, characters that XML excludes, and each byte that is no UTF-8 are written
/// as U+FFFD. A size becomes its text, {640, 480}; what is null is left out; dates lose their fraction.
std::string writeXmlPropertyList(const Value& value);

} // namespace platform
