#include "apps/common/Terminal.h"

#include <cstdlib>

#include <fcntl.h>
#include <sys/ioctl.h>
#include <unistd.h>

namespace apps {

bool isTerminal(int descriptor)
{
    return ::isatty(descriptor) == 1;
}

TerminalSize sizeOfTerminal(int descriptor)
{
    winsize told {};
    TerminalSize size;
    if (::ioctl(descriptor, TIOCGWINSZ, &told) != 0)
        return size;
    if (told.ws_col > 0)
        size.columns = told.ws_col;
    if (told.ws_row > 0)
        size.lines = told.ws_row;
    return size;
}

std::string_view environmentVariable(const char* name)
{
    const char* value = std::getenv(name);
    return value ? value : std::string_view();
}

std::string hostName()
{
    char name[256] = "";
    if (::gethostname(name, sizeof name - 1) != 0)
        return {};
    return name;
}

void guardStandardDescriptors()
{
    // open() takes the lowest free number, so an earlier gap is filled before a later one.
    for (int descriptor = 0; descriptor <= 2; ++descriptor) {
        if (::fcntl(descriptor, F_GETFD) < 0)
            (void)::open("/dev/null", O_RDONLY);
    }
}

void endProcess(int status)
{
    std::_Exit(status);
}

} // namespace apps
