#pragma once

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

namespace platform {

struct JsonMember;

/// A value of a JSON document, with the place at which it was written.
///
/// Only the field that belongs to the kind is set. Keys of an object are distinct.
struct JsonNode {
    enum class Kind : std::uint8_t { null, boolean, integer, real, text, list, object };

    Kind kind = Kind::null;
    int line = 0; ///< counted from 1
    int column = 0; ///< counted from 1, in bytes
    bool boolean = false;
    std::int64_t integer = 0;
    double real = 0; ///< set for an integer too
    std::string text; ///< UTF-8, escapes resolved; may hold a zero byte
    std::vector<JsonNode> items;
    std::vector<JsonMember> members; ///< in the order of the document

    /// The value under `key` of an object that has it, else null.
    const JsonNode* member(std::string_view key) const noexcept;
};

/// One key of an object, its place and its value.
struct JsonMember {
    std::string key;
    int line = 0;
    int column = 0;
    JsonNode value;
};

/// A document, or why there is none.
struct JsonResult {
    JsonNode root;
    std::string problem; ///< one line that begins with the number of the line: "12: …"; empty when read
};

/// The largest document that is read, in bytes.
inline constexpr std::size_t largestJsonDocument = 16 * 1024 * 1024;

/// Reads a JSON document (RFC 8259): UTF-8, a mark at its start skipped, without comments. Refuses repeated keys, more
/// than 256 levels and more than a million values. Time and memory are linear in its size.
JsonResult readJson(std::string_view bytes);

} // namespace platform
