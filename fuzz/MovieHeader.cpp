#include "platform/formats/MovieHeader.h"

#include "fuzz/FuzzTarget.h"
#include "tests/platform/formats/MemoryFile.h"

#include <cmath>

int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    const platform::MemoryFile file { std::string(fuzz::text(data, size)) };
    const std::optional<platform::MovieHeader> header = platform::readMovieHeader(file);
    if (header && header->resolution)
        fuzz::expect(header->resolution->width > 0 && header->resolution->height > 0);
    if (header && header->duration)
        fuzz::expect(std::isfinite(*header->duration) && *header->duration > 0);
    return 0;
}
