#include "apps/clipboard/PendingReads.h"

#include <algorithm>
#include <cerrno>

#include <fcntl.h>
#include <unistd.h>

namespace {

/// Whether nothing is left to give, or nobody takes it any more.
bool isDone(int pipe, std::string_view& left)
{
    while (!left.empty()) {
        const ssize_t count = ::write(pipe, left.data(), left.size());
        if (count < 0 && errno == EAGAIN)
            return false;
        if (count < 0 && errno != EINTR)
            return true;
        left.remove_prefix(static_cast<std::size_t>(std::max<ssize_t>(count, 0)));
    }
    return true;
}

} // namespace

void PendingReads::add(int pipe, std::string_view bytes)
{
    ::fcntl(pipe, F_SETFL, ::fcntl(pipe, F_GETFL) | O_NONBLOCK);
    _reads.push_back({ pipe, bytes });
    goOn();
}

std::vector<pollfd> PendingReads::sides() const
{
    std::vector<pollfd> sides;
    for (const Read& read : _reads)
        sides.push_back({ read.pipe, POLLOUT, 0 });
    return sides;
}

void PendingReads::goOn()
{
    std::erase_if(_reads, [](Read& read) {
        const bool ends = isDone(read.pipe, read.left);
        if (ends)
            ::close(read.pipe);
        return ends;
    });
}
