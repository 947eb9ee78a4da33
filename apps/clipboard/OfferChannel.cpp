#include "apps/clipboard/OfferChannel.h"

#include <array>
#include <cerrno>
#include <cstdlib>
#include <utility>

#include <fcntl.h>
#include <sys/socket.h>
#include <unistd.h>

namespace {

bool isStream(int descriptor)
{
    int kind = 0;
    socklen_t size = sizeof(kind);
    return ::getsockopt(descriptor, SOL_SOCKET, SO_TYPE, &kind, &size) == 0 && kind == SOCK_STREAM;
}

} // namespace

void endNow(int status)
{
    std::_Exit(status);
}

OfferChannel::OfferChannel(int descriptor)
    : _descriptor(descriptor)
{
}

std::optional<OfferChannel> OfferChannel::ofThisProcess()
{
    if (!isStream(STDIN_FILENO))
        return std::nullopt;
    // Libraries may print to standard output.
    const int descriptor = ::dup3(STDIN_FILENO, STDERR_FILENO + 1, O_CLOEXEC);
    ::close_range(static_cast<unsigned>(descriptor) + 1, ~0U, 0);
    const int nowhere = ::open("/dev/null", O_RDWR | O_CLOEXEC);
    ::dup2(nowhere, STDIN_FILENO);
    ::dup2(nowhere, STDOUT_FILENO);
    return OfferChannel(descriptor);
}

void OfferChannel::say(apps::ClipboardWord word)
{
    // Where nobody listens any more, the next look at what has arrived ends the process.
    static_cast<void>(::send(_descriptor, &word, sizeof(word), MSG_NOSIGNAL));
}

std::optional<std::vector<apps::ClipboardItem>> OfferChannel::receive()
{
    std::array<char, 65536> bytes;
    const ssize_t count = ::recv(_descriptor, bytes.data(), bytes.size(), MSG_DONTWAIT);
    if (count < 0 && (errno == EINTR || errno == EAGAIN))
        return std::nullopt;
    if (count <= 0)
        endNow(1);
    _arrived.append(bytes.data(), static_cast<std::size_t>(count));
    if (_isOffered) {
        _isKept = _arrived.front() == apps::keepClipboard;
        return std::nullopt;
    }
    std::optional<std::vector<apps::ClipboardItem>> items = apps::readOffer(_arrived);
    if (items) {
        _isOffered = true;
        _arrived.clear();
    }
    return items;
}
