#pragma once

#include "apps/common/Style.h"

#include <cstddef>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace ombrix {

/// A line for people, made of pieces that stand at columns. A piece moves to the right of what stands before it; on a
/// terminal, which has only so many columns, it is cut so that the line stays one line.
class TextLine {
public:
    enum class Look { plain, bold, dim, warning, failure };

    TextLine(const apps::Style& style, std::optional<int> columns)
        : _style(style)
        , _columns(columns)
    {
    }

    /// Adds a laid-out text that begins at `column`. A bold one links to `path`.
    TextLine& add(int column, std::string_view laidOut, Look look = Look::plain, std::string_view path = {});

    /// Adds a text directly after what stands before it.
    TextLine& addBehind(std::string_view laidOut, Look look = Look::plain, std::string_view path = {});

    /// Adds a name or path, which is cut in its middle.
    TextLine& addName(int column, std::string_view laidOut, Look look = Look::plain);

    /// Adds a text that moves to the left before it is cut: where it stands matters less than that it can be read.
    TextLine& addMoving(int column, std::string_view laidOut, Look look = Look::plain);

    /// Adds a text that moves likewise and is never cut, such as a command to be typed: the line gets longer instead.
    TextLine& addWhole(int column, std::string_view laidOut, Look look = Look::plain);

    std::string text() const;
    /// Lines of the terminal that it takes; 1 where there is no terminal.
    std::size_t height() const;

private:
    /// What happens to a piece that is too long for the terminal.
    enum class Excess { cutAtEnd, cutInMiddle, moveThenCut, moveThenOverflow };
    struct Piece {
        int column;
        std::string laidOut;
        Look look;
        std::string path;
        Excess excess = Excess::cutAtEnd;
    };
    /// Changes `piece` to stand where it does behind a line of `end` columns; false when it is not worth showing.
    bool place(Piece& piece, int end) const;
    std::vector<Piece> placedPieces() const;
    std::string drawn(const Piece& piece) const;
    TextLine& add(int column, std::string_view laidOut, Look look, std::string_view path, Excess excess);

    const apps::Style& _style;
    const std::optional<int> _columns;
    std::vector<Piece> _pieces;
};

} // namespace ombrix
