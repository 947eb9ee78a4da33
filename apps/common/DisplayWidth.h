#pragma once

#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

namespace apps {

/// Columns of a terminal and UTF-8. A control character and a byte that is no UTF-8 count as nothing and as one column.

/// What a reader sees as one letter, at the start of a text.
struct Letter {
    std::size_t length = 0; ///< bytes
    int columns = 0; ///< 0, 1 or 2; of an escape as many as it has letters
};

/// The letter at the start of `text`, which is not empty, with its combining marks; emoji that are joined are one, and
/// so is an escape between its marks.
Letter letterAtStart(std::string_view text);

/// How many columns a terminal needs for `text`.
int displayWidth(std::string_view text);

/// `text` in at most `columns` columns: what is too long ends with an ellipsis.
std::string cutAtEnd(std::string_view text, int columns);

/// `text` in at most `columns` columns: what is too long loses its middle, and keeps its start and its extension.
std::string cutInMiddle(std::string_view text, int columns);

/// `text` in lines of at most `columns` columns, broken at spaces; a word that is longer has a line of its own.
std::vector<std::string> wrappedWords(std::string_view text, int columns);

/// `text` with spaces after it, or before it, up to `columns` columns.
std::string paddedAfter(std::string_view text, int columns);
std::string paddedBefore(std::string_view text, int columns);

} // namespace apps
