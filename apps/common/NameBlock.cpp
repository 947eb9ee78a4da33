// A library holds a million names, and a search that looked at each object would spend its time on fetching objects. So
// the file names of whole batches are folded and searched as they lie, and only what holds the longest word is looked at
// by itself.

#include "apps/common/NameBlock.h"

#include "platform/PathText.h"
#include "platform/formats/FoldedText.h"
#include "platform/formats/Unicode.h"

#include <algorithm>
#include <cstring>
#include <utility>

namespace apps {
namespace {

    constexpr std::string_view representative = "Project Representative";
    constexpr std::size_t blockSize = 16 * 1024;

} // namespace

bool isRepresentative(const OBMediaObject& object)
{
    return !object.attributeForKey(representative).isNull();
}

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
    endPiece({ start, _folded.size(), owner, {}, 0 });
}

void NameBlock::addRun(const Owner& owner, std::size_t count, NameBlock& strays)
{
    const std::string_view names = owner.batch->fileNames(count);
    const std::size_t start = _folded.size();
    if (!platform::appendFoldedAscii(_folded, names))
        moveStrays(owner, names, start, strays);
    endPiece({ start, _folded.size(), owner, names, count });
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
}

std::optional<std::size_t> NameBlock::nextNeedle(std::size_t start) const
{
    const void* at = ::memmem(_folded.data() + start, _folded.size() - start, _needle.data(), _needle.size());
    if (!at)
        return std::nullopt;
    return static_cast<std::size_t>(static_cast<const char*>(at) - _folded.data());
}

/// Looks at the name of the run that holds the byte at `at`; answers where it ends.
std::size_t NameBlock::takeOfRun(const Piece& run, std::size_t at)
{
    Owner owner = run.owner;
    owner.index = owner.batch->indexOfFileNameAt(at - run.start);
    owner.position += static_cast<std::uint32_t>(owner.index);
    const std::string_view fileName = owner.batch->fileNameAtIndex(owner.index);
    const std::size_t start = run.start + static_cast<std::size_t>(fileName.data() - run.fileNames.data());
    take(owner, platform::nameWithoutExtension(std::string_view(_folded).substr(start, fileName.size())));
    return start + fileName.size();
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
    if (object && isRepresentative(*object))
        return;
    _mayRepeat |= !owner.isOnlyHere;
    _hits.push_back({ std::move(object), owner.group, owner.position, *match });
}

} // namespace apps
