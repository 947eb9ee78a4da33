#include "platform/linux/StandardErrorConsole.h"

#include "platform/linux/Descriptor.h"

#include <string>

#include <poll.h>

namespace platform {

namespace {

    // A full pipe whose reader made it answer at once instead of waiting. Whether it can be written to again; a reader
    // that has stopped reading loses the rest of the line rather than stop this program.
    bool waitUntilWritable(int descriptor)
    {
        constexpr int longestWait = 1000; // milliseconds
        pollfd state { descriptor, POLLOUT, 0 };
        return uninterrupted([&] { return poll(&state, 1, longestWait); }) > 0;
    }

} // namespace

StandardErrorConsole::StandardErrorConsole(int descriptor)
    : _descriptor(descriptor)
{
}

void StandardErrorConsole::log(std::string_view text)
{
    const std::string line = std::string(text) + '\n';
    Locked guard(_lock);
    for (std::string_view rest = line; !rest.empty();) {
        const ssize_t count = uninterrupted([&] { return write(_descriptor, rest.data(), rest.size()); });
        if (count > 0)
            rest.remove_prefix(static_cast<std::size_t>(count));
        else if (count == 0 || errno != EAGAIN || !waitUntilWritable(_descriptor))
            return;
    }
}

} // namespace platform
