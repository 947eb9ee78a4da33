#pragma once

#include "platform/linux/Descriptor.h"

#include <cstddef>
#include <cstdint>
#include <string_view>
#include <vector>

namespace platform {

/// One report of the kernel (inotify(7)).
struct FolderEvent {
    int watch = -1;
    std::uint32_t mask = 0;
    std::uint32_t cookie = 0; ///< the same for both halves of a move
    std::string_view name {}; ///< of the entry concerned; empty for the watched folder itself

    bool has(std::uint32_t bits) const noexcept { return (mask & bits) != 0; }
};

/// The kernel's reports about folders. One thread at a time.
class InotifyInstance {
public:
    /// Opens one, where `mayBeUsed`.
    explicit InotifyInstance(bool mayBeUsed);

    bool isOpen() const noexcept { return _descriptor.isOpen(); }
    /// Readable while there are events.
    int descriptor() const noexcept { return _descriptor.number(); }

    /// Watches the folder at `path`, which may be no link, for `mask`; answers its watch, or -1 with errno. A folder
    /// that is watched already keeps its watch, for `mask` from now on.
    int watchFolder(const char* path, std::uint32_t mask);
    void stopWatching(int watch);

    /// Takes the events that have come and calls `take` with each, until that answers false, which throws away the rest
    /// of them. False when none had come. More may be left.
    template <class Take> bool forEachEvent(const Take& take)
    {
        const std::size_t length = readEvents();
        std::size_t offset = 0;
        bool goesOn = true;
        while (goesOn && offset < length)
            goesOn = take(eventAt(offset));
        return length > 0;
    }

    /// Throws away what has come.
    void discardEvents();

private:
    std::size_t readEvents();
    FolderEvent eventAt(std::size_t& offset) const;

    Descriptor _descriptor;
    std::vector<char> _buffer;
};

} // namespace platform
