#pragma once

#include <string>
#include <string_view>

namespace apps {

/// Around what was escaped, so that it can be drawn dim; no escaped text holds these bytes otherwise. No columns wide.
inline constexpr char escapeBegins = '\x01';
inline constexpr char escapeEnds = '\x02';

/// `name` fit for a terminal: control characters, characters that draw nothing but turn the writing direction, hide or
/// begin a line, and bytes that are no UTF-8 stand as \x1b or \u202e, between the two marks above. What joins pictures
/// to one emoji stays.
std::string escapedName(std::string_view name);

/// `text` fit to stand in a one-line message: escaped likewise, without marks.
std::string escapedText(std::string_view text);

/// An escaped text without its marks.
std::string withoutMarks(std::string_view escaped);

} // namespace apps
