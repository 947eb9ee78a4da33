#include "apps/common/Output.h"

#include <cerrno>
#include <csignal>
#include <cstring>

#include <unistd.h>

namespace apps {

Output::Output(int descriptor)
    : _descriptor(descriptor)
{
}

Output::Output(std::string& text)
    : _descriptor(-1)
    , _text(&text)
{
}

void Output::flush()
{
    writeAll(_block);
    _block.clear();
}

void Output::writeThrough(std::string_view bytes)
{
    flush();
    writeAll(bytes);
}

void Output::writeAll(std::string_view bytes)
{
    if (_text) {
        _text->append(bytes);
        return;
    }
    while (!bytes.empty() && _problem.empty()) {
        const ssize_t written = ::write(_descriptor, bytes.data(), bytes.size());
        if (written >= 0) {
            bytes.remove_prefix(static_cast<std::size_t>(written));
        } else if (errno == EPIPE) {
            // Whoever started us may have told us to ignore the signal, but nobody is left to read a message.
            std::signal(SIGPIPE, SIG_DFL);
            std::raise(SIGPIPE);
        } else if (errno != EINTR) {
            _problem = std::strerror(errno);
            if (_problem[0] >= 'A' && _problem[0] <= 'Z')
                _problem[0] = static_cast<char>(_problem[0] - 'A' + 'a');
        }
    }
}

} // namespace apps
