#include "platform/linux/watching/InotifyLimits.h"

#include "platform/PathText.h"
#include "platform/linux/WholeSystemFile.h"

#include <algorithm>
#include <array>
#include <charconv>
#include <memory>
#include <string_view>
#include <vector>

#include <dirent.h>
#include <sys/stat.h>
#include <unistd.h>

namespace platform {

namespace {

    constexpr const char* watchesLimit = "max_user_watches";
    constexpr const char* instancesLimit = "max_user_instances";
    // What desktops set of themselves; a folder costs the kernel about a kilobyte at most.
    constexpr std::uint64_t usualWatches = 524'288;
    constexpr std::uint64_t usualInstances = 128;

    /// The numbers among the names in a folder: processes, or descriptors.
    std::vector<std::string> numbersIn(const std::string& folder)
    {
        std::vector<std::string> numbers;
        const std::unique_ptr<DIR, int (*)(DIR*)> open(::opendir(folder.c_str()), ::closedir);
        while (const dirent* entry = open ? ::readdir(open.get()) : nullptr) {
            const std::string_view name = entry->d_name;
            if (name.find_first_not_of("0123456789") == name.npos)
                numbers.emplace_back(name);
        }
        return numbers;
    }

    bool isInotify(const std::string& descriptor)
    {
        constexpr std::string_view kind = "anon_inode:inotify";
        std::array<char, 32> target {};
        const ssize_t length = ::readlink(descriptor.c_str(), target.data(), target.size());
        return length > 0 && std::string_view(target.data(), static_cast<std::size_t>(length)) == kind;
    }

    std::uint64_t watchesIn(const std::string& information)
    {
        constexpr std::string_view line = "inotify wd";
        constexpr std::size_t sizeAtMost = std::size_t { 1 } << 30;
        const std::string text = readWholeSystemFile(information, sizeAtMost);
        std::uint64_t count = 0;
        for (std::size_t at = text.find(line); at != text.npos; at = text.find(line, at + line.size()))
            count += at == 0 || text[at - 1] == '\n';
        return count;
    }

} // namespace

InotifyUse inotifyUse(const std::string& procFolder, unsigned user)
{
    InotifyUse use;
    for (const std::string& process : numbersIn(procFolder)) {
        const std::string folder = pathJoined(procFolder, process);
        struct stat facts { };
        if (::stat(folder.c_str(), &facts) != 0 || facts.st_uid != user)
            continue;
        const std::string descriptors = pathJoined(folder, "fd");
        const std::string information = pathJoined(folder, "fdinfo");
        for (const std::string& descriptor : numbersIn(descriptors)) {
            if (!isInotify(pathJoined(descriptors, descriptor)))
                continue;
            ++use.instances;
            use.watches += watchesIn(pathJoined(information, descriptor));
        }
    }
    return use;
}

std::uint64_t inotifyLimit(const std::string& name)
{
    const std::string text = readWholeSystemFile("/proc/sys/fs/inotify/" + name, 64);
    std::uint64_t limit = 0;
    std::from_chars(text.data(), text.data() + text.size(), limit);
    return limit;
}

std::string commandForInotifyLimit(const std::string& name, std::uint64_t limit)
{
    return "sudo sysctl fs.inotify." + name + '=' + std::to_string(limit);
}

std::optional<WatchingLimits> inotifyLimits(std::uint64_t furtherWatches)
{
    WatchingLimits limits;
    limits.watches.allowed = inotifyLimit(watchesLimit);
    limits.instances.allowed = inotifyLimit(instancesLimit);
    if (limits.watches.allowed == 0 || limits.instances.allowed == 0)
        return std::nullopt;
    const InotifyUse use = inotifyUse("/proc", ::geteuid());
    limits.watches.inUse = use.watches;
    limits.instances.inUse = use.instances;
    limits.watches.remedy = commandForInotifyLimit(
        watchesLimit, std::max({ usualWatches, limits.watches.allowed * 2, (use.watches + furtherWatches) * 2 }));
    limits.instances.remedy
        = commandForInotifyLimit(instancesLimit, std::max(usualInstances, limits.instances.allowed * 2));
    return limits;
}

} // namespace platform
