#pragma once

#include "platform/formats/Json.h"

#include <span>

namespace platform {

/// A set of JSON types, combined with `|`.
enum class JsonTypes : std::uint8_t {
    null = 1,
    boolean = 2,
    integer = 4,
    number = 12, ///< an integer is one too
    text = 16,
    list = 32,
    object = 64,
};

constexpr JsonTypes operator|(JsonTypes left, JsonTypes right) noexcept
{
    return static_cast<JsonTypes>(static_cast<unsigned>(left) | static_cast<unsigned>(right));
}

/// Whether a key must be there.
enum class JsonPresence : std::uint8_t { optional, required };

/// One key that an object may hold.
struct JsonKey {
    std::string_view name;
    JsonTypes types = JsonTypes::text;
    JsonPresence presence = JsonPresence::required;
};

/// Whether `node` is of one of `types`.
bool isOfTypes(const JsonNode& node, JsonTypes types) noexcept;

/// What is wrong with the type of `node`, told with its line as `JsonResult::problem` is, `name` being what the node is
/// called ("key "path""); empty when it is of one of `types`.
std::string typeProblem(const JsonNode& node, JsonTypes types, std::string_view name);

/// The first thing wrong with `object`, told with its line as `JsonResult::problem` is: no object at all (`name` says
/// what it is called, such as "the description"), an unknown key, with a suggestion, a value of the wrong type, or a
/// missing key. Empty when all is well.
std::string shapeProblem(const JsonNode& object, std::span<const JsonKey> keys, std::string_view name);

} // namespace platform
