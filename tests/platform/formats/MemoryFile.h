#pragma once

#include "platform/FileSystem.h"

#include <algorithm>
#include <cstring>
#include <string>

namespace platform {

/// A file whose bytes stand in memory; counts its reads.
class MemoryFile : public OpenFile {
public:
    explicit MemoryFile(std::string bytes)
        : _bytes(std::move(bytes))
    {
    }

    ItemStatus status() const override
    {
        ItemStatus status;
        status.kind = ItemKind::file;
        status.size = _bytes.size();
        return status;
    }

    std::size_t read(std::uint64_t offset, std::span<std::byte> buffer) const override
    {
        ++_reads;
        if (offset >= _bytes.size())
            return 0;
        const std::size_t count = std::min<std::size_t>(buffer.size(), _bytes.size() - offset);
        std::memcpy(buffer.data(), _bytes.data() + offset, count);
        return count;
    }

    int reads() const { return _reads; }

private:
    const std::string _bytes;
    mutable int _reads = 0;
};

} // namespace platform
