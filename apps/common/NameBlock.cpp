// A library holds a million names, and a search that looked at each object would spend its time on fetching objects. So
// the file names of whole batches are folded and searched as they lie, and only what holds the longest word is looked
// at by itself.

#include "apps/common/NameBlock.h"

#include "platform/PathText.h"
#include "platform/formats/FoldedText.h"
#include "platform/formats/Unicode.h"

#include <algorithm>
#include <cstring>
#include <utility>

namespace apps {
namespace {

    constexpr std::size_t blockSize = 16 * 1024;

} // namespace

NameBlock::NameBlock(const NameQuery& query)
    : _query(query)
    , _needle(query.longestWord())
{
    _folded.reserve(2 * blockSize);
}

void NameBlock::addName(const Owner& owner, std::string_view name)
{
    const std::size_t start = _folded.size();
    platform::appendFolded(_folded, name);
    endPiece({ start, _folded.size(), owner, {}, 0, _others.size() });
}

void NameBlock::addRun(const Owner& owner, std::size_t count, NameBlock& strays)
{
    const std::string_view names = owner.batch->fileNames(count);
    const std::size_t start = _folded.size();
    const std::size_t firstOther = _others.size();
    if (!platform::appendFoldedOneByOne(_folded, names, _others)) {
        platform::appendFoldedAscii(_folded, names);
        moveStrays(owner, names, start, strays);
    }
    endPiece({ start, _folded.size(), owner, names, count, firstOther });
}

std::vector<NameHit> NameBlock::takeHits()
{
    search();
    return std::move(_hits);
}

void NameBlock::moveStrays(const Owner& owner, std::string_view names, std::size_t start, NameBlock& strays)
{
    std::size_t foreign = platform::lengthOfAsciiPrefix(names);
    while (foreign < names.size()) {
        Owner stray = owner;
        stray.index = owner.batch->indexOfFileNameAt(foreign);
        stray.position += static_cast<std::uint32_t>(stray.index);
        const std::string_view fileName = owner.batch->fileNameAtIndex(stray.index);
        const auto offset = static_cast<std::size_t>(fileName.data() - names.data());
        std::fill_n(_folded.begin() + static_cast<std::ptrdiff_t>(start + offset), fileName.size(), '\0');
        strays.addName(stray, platform::nameWithoutExtension(fileName));
        const std::size_t next = offset + fileName.size();
        foreign = next + platform::lengthOfAsciiPrefix(names.substr(next));
    }
}

void NameBlock::endPiece(const Piece& piece)
{
    _pieces.push_back(piece);
    _folded += '\0';
    if (_folded.size() >= blockSize)
        search();
}

void NameBlock::search()
{
    std::size_t start = 0;
    auto piece = _pieces.begin();
    while (const std::optional<std::size_t> at = nextNeedle(start)) {
        while (piece->end <= *at)
            ++piece;
        if (piece->count > 0) {
            start = takeOfRun(*piece, *at);
        } else {
            take(piece->owner, std::string_view(_folded).substr(piece->start, piece->end - piece->start));
            start = piece->end;
        }
    }
    _folded.clear();
    _pieces.clear();
    _others.clear();
}

std::optional<std::size_t> NameBlock::nextNeedle(std::size_t start) const
{
    const void* at = ::memmem(_folded.data() + start, _folded.size() - start, _needle.data(), _needle.size());
    if (!at)
        return std::nullopt;
    return static_cast<std::size_t>(static_cast<const char*>(at) - _folded.data());
}

/// The last character of the run that is not ASCII and ends, at `place`, not behind `position`; the beginning of the
/// run where there is none.
platform::FoldedCharacter NameBlock::otherBefore(
    const Piece& run, std::size_t platform::FoldedCharacter::*place, std::size_t position) const
{
    const auto first = _others.begin() + static_cast<std::ptrdiff_t>(run.firstOther);
    const auto next = (&run == &_pieces.back()) ? _others.end()
                                                : _others.begin() + static_cast<std::ptrdiff_t>((&run + 1)->firstOther);
    const auto behind = std::upper_bound(first, next, position,
        [place](std::size_t wanted, const platform::FoldedCharacter& other) { return wanted < other.*place; });
    return behind == first ? platform::FoldedCharacter { 0, run.start } : behind[-1];
}

/// Looks at the name of the run that holds the byte at `at`; answers where it ends.
std::size_t NameBlock::takeOfRun(const Piece& run, std::size_t at)
{
    using platform::FoldedCharacter;
    // Of a character that is not ASCII, `at` is the first byte, as a needle begins with a whole one.
    const FoldedCharacter before = otherBefore(run, &FoldedCharacter::foldedEnd, at);
    Owner owner = run.owner;
    owner.index = owner.batch->indexOfFileNameAt(before.end + (at - before.foldedEnd));
    owner.position += static_cast<std::uint32_t>(owner.index);
    const std::string_view fileName = owner.batch->fileNameAtIndex(owner.index);
    const std::size_t nameStart = static_cast<std::size_t>(fileName.data() - run.fileNames.data());
    const std::size_t nameEnd = nameStart + fileName.size();
    const FoldedCharacter beforeEnd = otherBefore(run, &FoldedCharacter::end, nameEnd);
    const std::size_t end = beforeEnd.foldedEnd + (nameEnd - beforeEnd.end);
    if (beforeEnd.end > nameStart)
        take(owner, platform::foldedText(platform::nameWithoutExtension(fileName)));
    else
        take(owner,
            platform::nameWithoutExtension(std::string_view(_folded).substr(end - fileName.size(), fileName.size())));
    return end;
}

void NameBlock::take(const Owner& owner, std::string_view folded)
{
    const std::optional<NameMatch> match = _query.matchOf(folded);
    if (!match)
        return;
    OBMediaObjectRef object;
    if (owner.batch)
        object = owner.batch->objectAtIndex(owner.index);
    else if (owner.object)
        object = owner.object;
    if (object && object->isRepresentative())
        return;
    _mayRepeat |= !owner.isOnlyHere;
    _hits.push_back({ std::move(object), owner.group, owner.position, *match });
}

} // namespace apps
