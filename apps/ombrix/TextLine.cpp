#include "apps/ombrix/TextLine.h"

#include "apps/common/DisplayWidth.h"

#include <algorithm>

namespace ombrix {
namespace {

    constexpr int directlyBehind = -1;
    constexpr int smallestGap = 2;
    constexpr int leastWorthShowing = 4;

} // namespace

TextLine& TextLine::add(int column, std::string_view laidOut, Look look, std::string_view path, Excess excess)
{
    if (!laidOut.empty())
        _pieces.push_back({ column, std::string(laidOut), look, std::string(path), excess });
    return *this;
}

TextLine& TextLine::add(int column, std::string_view laidOut, Look look, std::string_view path)
{
    return add(column, laidOut, look, path, Excess::cutAtEnd);
}

TextLine& TextLine::addBehind(std::string_view laidOut, Look look, std::string_view path)
{
    return add(directlyBehind, laidOut, look, path, Excess::cutAtEnd);
}

TextLine& TextLine::addName(int column, std::string_view laidOut, Look look)
{
    return add(column, laidOut, look, {}, Excess::cutInMiddle);
}

TextLine& TextLine::addMoving(int column, std::string_view laidOut, Look look)
{
    return add(column, laidOut, look, {}, Excess::moveThenCut);
}

TextLine& TextLine::addWhole(int column, std::string_view laidOut, Look look)
{
    return add(column, laidOut, look, {}, Excess::moveThenOverflow);
}

bool TextLine::place(Piece& piece, int end) const
{
    const bool isBehind = piece.column == directlyBehind || end == 0;
    piece.column = isBehind ? std::max(piece.column, end) : std::max(piece.column, end + smallestGap);
    const int width = apps::displayWidth(piece.laidOut);
    if (!_columns || piece.column + width <= *_columns)
        return true;
    if (piece.excess == Excess::moveThenCut || piece.excess == Excess::moveThenOverflow)
        piece.column = std::max(end + smallestGap, *_columns - width);
    if (piece.excess == Excess::moveThenOverflow)
        return true;
    const int room = *_columns - piece.column;
    piece.laidOut = piece.excess == Excess::cutInMiddle ? apps::cutInMiddle(piece.laidOut, room)
                                                        : apps::cutAtEnd(piece.laidOut, room);
    return room >= std::min(width, leastWorthShowing);
}

std::vector<TextLine::Piece> TextLine::placedPieces() const
{
    std::vector<Piece> placed;
    int end = 0;
    for (Piece piece : _pieces) {
        if (!place(piece, end))
            break;
        end = piece.column + apps::displayWidth(piece.laidOut);
        placed.push_back(std::move(piece));
    }
    return placed;
}

std::string TextLine::text() const
{
    std::string line;
    int end = 0; // the column after what is drawn so far
    for (const Piece& piece : placedPieces()) {
        line.append(static_cast<std::size_t>(piece.column - end), ' ');
        line += drawn(piece);
        end = piece.column + apps::displayWidth(piece.laidOut);
    }
    return line;
}

std::size_t TextLine::height() const
{
    const std::vector<Piece> placed = placedPieces();
    if (!_columns || placed.empty())
        return 1;
    const int width = placed.back().column + apps::displayWidth(placed.back().laidOut);
    return static_cast<std::size_t>(std::max(1, (width + *_columns - 1) / *_columns));
}

std::string TextLine::drawn(const Piece& piece) const
{
    switch (piece.look) {
    case Look::bold:
        return _style.bold(piece.laidOut, piece.path);
    case Look::dim:
        return _style.dim(piece.laidOut);
    case Look::warning:
        return _style.warning(piece.laidOut);
    case Look::failure:
        return _style.failure(piece.laidOut);
    case Look::plain:
        break;
    }
    return _style.plain(piece.laidOut);
}

} // namespace ombrix
