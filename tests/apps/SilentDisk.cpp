#include "tests/apps/SilentDisk.h"

#include <fcntl.h>
#include <sched.h>
#include <sys/mount.h>
#include <unistd.h>

namespace tests {

SilentDisk::SilentDisk(const std::string& folder)
    : _folder(folder)
    , _device(::open("/dev/fuse", O_RDWR | O_CLOEXEC))
{
    if (_device < 0 || ::unshare(CLONE_NEWNS) != 0 || ::mount("none", "/", nullptr, MS_REC | MS_PRIVATE, nullptr) != 0)
        return;
    const std::string options = "fd=" + std::to_string(_device) + ",rootmode=40000,user_id=0,group_id=0";
    _isMounted = ::mount("silent", _folder.c_str(), "fuse.silent", 0, options.c_str()) == 0;
}

SilentDisk::~SilentDisk()
{
    if (_device >= 0)
        ::close(_device);
    if (_isMounted)
        (void)::umount2(_folder.c_str(), MNT_DETACH);
}

} // namespace tests
