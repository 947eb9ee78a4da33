#include "platform/formats/MovieHeader.h"

#include "fuzz/FuzzTarget.h"

#include <algorithm>
#include <cmath>
#include <cstring>

namespace {

/// The input as a file.
class InputFile : public platform::OpenFile {
public:
    explicit InputFile(std::string_view bytes)
        : _bytes(bytes)
    {
    }

    platform::ItemStatus status() const override
    {
        platform::ItemStatus status;
        status.kind = platform::ItemKind::file;
        status.size = _bytes.size();
        return status;
    }

    std::size_t read(std::uint64_t offset, std::span<std::byte> buffer) const override
    {
        if (offset >= _bytes.size())
            return 0;
        const std::size_t count = std::min<std::size_t>(buffer.size(), _bytes.size() - offset);
        std::memcpy(buffer.data(), _bytes.data() + offset, count);
        return count;
    }

private:
    const std::string_view _bytes;
};

} // namespace

int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    const InputFile file(fuzz::text(data, size));
    const std::optional<platform::MovieHeader> header = platform::readMovieHeader(file);
    if (header && header->resolution)
        fuzz::expect(header->resolution->width > 0 && header->resolution->height > 0);
    if (header && header->duration)
        fuzz::expect(std::isfinite(*header->duration) && *header->duration > 0);
    return 0;
}
