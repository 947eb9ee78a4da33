#include "platform/common/WholeFile.h"

#include "platform/FileSystem.h"

#include <algorithm>
#include <span>

namespace platform {

std::string readBytes(const OpenFile& file, std::size_t limit)
{
    constexpr std::size_t smallestChunk = std::size_t { 16 } << 10;
    constexpr std::size_t largestChunk = std::size_t { 1 } << 20;
    std::string bytes;
    std::size_t filled = 0;
    while (filled < limit) {
        const std::size_t chunk = std::min(limit - filled, std::clamp(filled, smallestChunk, largestChunk));
        bytes.resize(filled + chunk);
        const std::span<char> free = std::span(bytes).subspan(filled);
        const std::size_t count = file.read(filled, std::as_writable_bytes(free));
        filled += count;
        if (count < chunk)
            break;
    }
    bytes.resize(filled);
    return bytes;
}

} // namespace platform
