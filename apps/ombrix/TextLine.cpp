#include "apps/ombrix/TextLine.h"

#include "apps/common/DisplayWidth.h"

#include <algorithm>

namespace ombrix {
namespace {

    constexpr int directlyBehind = -1;
    constexpr int smallestGap = 2;
    constexpr int leastWorthShowing = 4;

} // namespace

TextLine& TextLine::add(int column, std::string_view laidOut, Look look, std::string_view path)
{
    if (!laidOut.empty())
        _pieces.push_back({ column, std::string(laidOut), look, std::string(path), false });
    return *this;
}

TextLine& TextLine::addBehind(std::string_view laidOut, Look look, std::string_view path)
{
    return add(directlyBehind, laidOut, look, path);
}

TextLine& TextLine::addWhole(int column, std::string_view laidOut, Look look)
{
    if (!laidOut.empty())
        _pieces.push_back({ column, std::string(laidOut), look, {}, true });
    return *this;
}

std::string TextLine::text() const
{
    std::string line;
    int end = 0; // the column after what is drawn so far
    for (const Piece& piece : _pieces) {
        const bool isBehind = piece.column == directlyBehind || end == 0;
        int column = isBehind ? std::max(piece.column, end) : piece.column;
        if (!isBehind && column <= end)
            column = end + smallestGap;
        std::string laidOut = piece.laidOut;
        int width = apps::displayWidth(laidOut);
        if (_columns && column + width > *_columns) {
            if (piece.movesLeft)
                column = std::max(end + smallestGap, *_columns - width);
            const int room = *_columns - column;
            if (room < std::min(width, leastWorthShowing))
                break;
            laidOut = apps::cutAtEnd(laidOut, room);
            width = apps::displayWidth(laidOut);
        }
        line.append(static_cast<std::size_t>(column - end), ' ');
        line += drawn(piece, laidOut);
        end = column + width;
    }
    return line;
}

std::string TextLine::drawn(const Piece& piece, std::string_view laidOut) const
{
    switch (piece.look) {
    case Look::bold:
        return _style.bold(laidOut, piece.path);
    case Look::dim:
        return _style.dim(laidOut);
    case Look::warning:
        return _style.warning(laidOut);
    case Look::plain:
        break;
    }
    return _style.plain(laidOut);
}

} // namespace ombrix
