#include "platform/formats/BoxReader.h"

namespace platform {
namespace {

    constexpr std::uint64_t shortHeader = 8;
    constexpr std::uint64_t longHeader = 16;

} // namespace

BoxStep BoxReader::next(FileRange& rest, ZeroSize zeroSize, Box& box)
{
    if (rest.size() < shortHeader)
        return BoxStep::end;
    if (++_boxes > mostBoxes || _reads >= mostReads)
        return BoxStep::tooMuch;
    const bool mayBeLong = rest.size() >= longHeader;
    const std::byte* header = bytesAt(rest.start, mayBeLong ? longHeader : shortHeader);
    if (!header)
        return BoxStep::broken;
    box.type = number32(header + 4);
    std::uint64_t size = number32(header);
    std::uint64_t headerSize = shortHeader;
    if (size == 0 && zeroSize == ZeroSize::endsList)
        return BoxStep::end;
    if (size == 0) {
        size = rest.size();
    } else if (size == 1 && mayBeLong) {
        size = number64(header + 8);
        headerSize = longHeader;
    }
    if (size < headerSize || size > rest.size())
        return BoxStep::broken;
    box.content = { rest.start + headerSize, rest.start + size };
    rest.start += size;
    return BoxStep::box;
}

const std::byte* BoxReader::bytesOutsideWindow(std::uint64_t offset, std::size_t count)
{
    if (offset > _size || _size - offset < count || ++_reads > mostReads)
        return nullptr;
    _windowStart = offset;
    _windowLength = _file.read(offset, _window);
    return _windowLength < count ? nullptr : _window.data();
}

} // namespace platform
