#pragma once

#include "apps/common/Style.h"

#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace ombrix {

/// A line for people, made of pieces that stand at columns. A piece moves to the right of what stands before it; on a
/// terminal, which has only so many columns, it is cut so that the line stays one line.
class TextLine {
public:
    enum class Look { plain, bold, dim, warning };

    TextLine(const apps::Style& style, std::optional<int> columns)
        : _style(style)
        , _columns(columns)
    {
    }

    /// Adds a laid-out text that begins at `column`. A bold one links to `path`.
    TextLine& add(int column, std::string_view laidOut, Look look = Look::plain, std::string_view path = {});

    /// Adds a text directly after what stands before it.
    TextLine& addBehind(std::string_view laidOut, Look look = Look::plain, std::string_view path = {});

    /// Adds a text that moves to the left before it is cut: where it stands matters less than that it can be read.
    TextLine& addWhole(int column, std::string_view laidOut, Look look = Look::plain);

    std::string text() const;

private:
    struct Piece {
        int column;
        std::string laidOut;
        Look look;
        std::string path;
        bool movesLeft = false;
    };
    std::string drawn(const Piece& piece, std::string_view laidOut) const;

    const apps::Style& _style;
    const std::optional<int> _columns;
    std::vector<Piece> _pieces;
};

} // namespace ombrix
