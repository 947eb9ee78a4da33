#include "platform/linux/OpenWithoutLinks.h"

#include "platform/linux/Descriptor.h"

#include <fcntl.h>
#include <linux/openat2.h>
#include <sys/syscall.h>
#include <unistd.h>

namespace platform {

int openWithoutLinks(int parent, const char* path, int flags)
{
    open_how how {};
    how.flags = static_cast<unsigned>(flags);
    how.resolve = RESOLVE_NO_SYMLINKS;
    const auto open = [&] { return syscall(SYS_openat2, parent, path, &how, sizeof(how)); };
    return static_cast<int>(uninterrupted(open));
}

} // namespace platform
