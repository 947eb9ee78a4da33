#pragma once

#include "platform/FileSystem.h"

#include <array>
#include <cstddef>
#include <cstdint>
#include <string_view>

namespace platform {

/// A type of box as the number that its four letters make.
constexpr std::uint32_t boxType(std::string_view letters) noexcept
{
    std::uint32_t type = 0;
    for (std::size_t index = 0; index < 4; ++index)
        type = (type << 8) | static_cast<std::uint8_t>(letters[index]);
    return type;
}

/// A stretch of a file, in bytes from its start.
struct FileRange {
    std::uint64_t start = 0;
    std::uint64_t end = 0;

    std::uint64_t size() const noexcept { return end - start; }
};

/// One box of a movie file: its type, and where its content lies.
struct Box {
    std::uint32_t type = 0;
    FileRange content;
};

/// What stands at a place where a box can begin.
enum class BoxStep {
    box, ///< a box that lies wholly within its surroundings
    end, ///< nothing more: the surroundings end here, or all but end
    broken, ///< a box whose size is none, or that is longer than its surroundings
    tooMuch, ///< more boxes or bytes were read than any sensible header needs
};

/// Whether a box of size 0 reaches to the end of its surroundings, as it does at the top level of a file. Elsewhere a
/// size of 0 ends the list of boxes.
enum class ZeroSize { reachesToEnd, endsList };

/// Reads boxes (ISO base media file format, 4.2) and numbers out of a file through one window of 4 KiB, so that the
/// header of a usual movie costs two or three reads. How much is read is bounded whatever the file holds.
class BoxReader {
public:
    explicit BoxReader(const OpenFile& file)
        : _file(file)
        , _size(file.status().size)
    {
    }

    FileRange wholeFile() const noexcept { return { 0, _size }; }

    /// Looks at the box at the start of `rest`; where there is one, puts it in `box` and moves `rest` behind it.
    BoxStep next(FileRange& rest, ZeroSize zeroSize, Box& box);

    /// The bytes from `offset` on, at most 128 of them, null when the file ends before, cannot be read, or too much was
    /// read already. Valid until the next call.
    const std::byte* bytesAt(std::uint64_t offset, std::size_t count)
    {
        const std::uint64_t inWindow = offset - _windowStart; // far beyond the window where it lies before it
        if (inWindow <= _windowLength && _windowLength - inWindow >= count)
            return _window.data() + inWindow;
        return bytesOutsideWindow(offset, count);
    }

    /// Big-endian numbers out of what `bytesAt` answers.
    static std::uint16_t number16(const std::byte* bytes) noexcept
    {
        return static_cast<std::uint16_t>(at(bytes, 0) << 8 | at(bytes, 1));
    }
    static std::uint32_t number32(const std::byte* bytes) noexcept
    {
        return at(bytes, 0) << 24 | at(bytes, 1) << 16 | at(bytes, 2) << 8 | at(bytes, 3);
    }
    static std::uint64_t number64(const std::byte* bytes) noexcept
    {
        return std::uint64_t { number32(bytes) } << 32 | number32(bytes + 4);
    }

private:
    static constexpr std::size_t mostBoxes = 10'000;
    static constexpr std::size_t mostReads = 10'000;

    static std::uint32_t at(const std::byte* bytes, std::size_t index) noexcept
    {
        return std::to_integer<std::uint32_t>(bytes[index]);
    }

    const std::byte* bytesOutsideWindow(std::uint64_t offset, std::size_t count);

    const OpenFile& _file;
    const std::uint64_t _size;
    std::uint64_t _windowStart = 0;
    std::size_t _windowLength = 0;
    std::size_t _boxes = 0;
    std::size_t _reads = 0;
    std::array<std::byte, 4096> _window;
};

} // namespace platform
