#include "tests/support/OwnMounts.h"

#include <array>
#include <fstream>

#include <linux/capability.h>
#include <sched.h>
#include <sys/mount.h>
#include <sys/syscall.h>
#include <unistd.h>

namespace tests {

namespace {

    bool becomeRootOfOwnUsers()
    {
        const uid_t user = geteuid();
        const gid_t group = getegid();
        if (unshare(CLONE_NEWUSER | CLONE_NEWNS) != 0)
            return false;
        std::ofstream("/proc/self/setgroups") << "deny";
        std::ofstream users("/proc/self/uid_map");
        users << "0 " << user << " 1";
        std::ofstream groups("/proc/self/gid_map");
        groups << "0 " << group << " 1";
        return users.flush() && groups.flush();
    }

} // namespace

bool enterOwnMounts()
{
    return (unshare(CLONE_NEWNS) == 0 || becomeRootOfOwnUsers())
        && mount("none", "/", nullptr, MS_REC | MS_PRIVATE, nullptr) == 0;
}

bool mountMemory(const std::string& path)
{
    return mount("memory", path.c_str(), "tmpfs", 0, nullptr) == 0;
}

void giveUpReadingEverything()
{
    __user_cap_header_struct header { _LINUX_CAPABILITY_VERSION_3, 0 };
    std::array<__user_cap_data_struct, _LINUX_CAPABILITY_U32S_3> rights {};
    if (syscall(SYS_capget, &header, rights.data()) != 0)
        return;
    rights[0].effective &= ~((1U << CAP_DAC_OVERRIDE) | (1U << CAP_DAC_READ_SEARCH));
    syscall(SYS_capset, &header, rights.data());
}

} // namespace tests
