#include "platform/linux/MountTable.h"

#include "platform/PathText.h"
#include "platform/linux/Descriptor.h"
#include "platform/linux/WholeSystemFile.h"

#include <algorithm>
#include <charconv>
#include <unordered_map>
#include <unordered_set>
#include <utility>

#include <fcntl.h>
#include <poll.h>

namespace platform {

namespace {

    std::string_view takeUpTo(std::string_view& text, char separator)
    {
        const std::string_view taken = text.substr(0, text.find(separator));
        text.remove_prefix(std::min(text.size(), taken.size() + 1));
        return taken;
    }

    template <class Number> bool readNumber(std::string_view text, Number& number)
    {
        const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), number);
        return error == std::errc() && end == text.data() + text.size();
    }

    bool isOctal(char byte)
    {
        return byte >= '0' && byte <= '7';
    }

    // The kernel writes white space and backslashes as a backslash and three octal digits.
    std::string withoutEscapes(std::string_view text)
    {
        std::string plain;
        plain.reserve(text.size());
        for (std::size_t index = 0; index < text.size(); ++index) {
            const std::string_view digits = text.substr(index + 1, 3);
            const bool isEscape
                = text[index] == '\\' && digits.size() == 3 && std::all_of(digits.begin(), digits.end(), isOctal);
            if (!isEscape) {
                plain.push_back(text[index]);
                continue;
            }
            plain.push_back(static_cast<char>((digits[0] - '0') * 64 + (digits[1] - '0') * 8 + (digits[2] - '0')));
            index += 3;
        }
        return plain;
    }

    std::optional<Mount> mountOfLine(std::string_view line)
    {
        Mount mount;
        if (!readNumber(takeUpTo(line, ' '), mount.identifier) || !readNumber(takeUpTo(line, ' '), mount.parent))
            return std::nullopt;
        std::string_view device = takeUpTo(line, ' ');
        if (!readNumber(takeUpTo(device, ':'), mount.device.major) || !readNumber(device, mount.device.minor))
            return std::nullopt;
        mount.root = withoutEscapes(takeUpTo(line, ' '));
        mount.mountPoint = withoutEscapes(takeUpTo(line, ' '));
        // The options of the mount and any number of optional fields, of which none matters here.
        takeUpTo(line, ' ');
        while (!line.empty() && takeUpTo(line, ' ') != "-") { }
        mount.fileSystemType = withoutEscapes(takeUpTo(line, ' '));
        mount.source = withoutEscapes(takeUpTo(line, ' '));
        mount.superOptions = withoutEscapes(line);
        const bool isWhole = !mount.root.empty() && !mount.fileSystemType.empty();
        if (!isWhole || mount.mountPoint.empty() || mount.mountPoint.front() != '/')
            return std::nullopt;
        return mount;
    }

    // Which mounts a path can reach. A mount hangs on its parent at its mount point; another child of that parent,
    // mounted later at the same point or on a folder above it, leads every path away from it.
    class Reachability {
    public:
        explicit Reachability(const std::vector<Mount>& mounts)
            : _mounts(mounts)
        {
            for (std::size_t index = 0; index < mounts.size(); ++index) {
                _byIdentifier[mounts[index].identifier] = index;
                _childrenOf[mounts[index].parent][mounts[index].mountPoint] = index;
            }
        }

        bool isReachable(std::size_t index) const
        {
            if (isCoveredAt(_mounts[index], _mounts[index].mountPoint))
                return false;
            // A damaged table may name parents in circles.
            for (std::size_t steps = 0; steps < _mounts.size(); ++steps) {
                const auto parent = _byIdentifier.find(_mounts[index].parent);
                if (parent == _byIdentifier.end() || parent->second == index)
                    return true;
                if (isHiddenInParent(index, _mounts[parent->second]))
                    return false;
                index = parent->second;
            }
            return false;
        }

    private:
        using Children = std::unordered_map<std::string_view, std::size_t>;

        const Children* childrenOf(const Mount& mount) const
        {
            const auto found = _childrenOf.find(mount.identifier);
            return found == _childrenOf.end() ? nullptr : &found->second;
        }
        bool isCoveredAt(const Mount& mount, std::string_view path) const
        {
            const Children* children = childrenOf(mount);
            const auto found = children ? children->find(path) : Children::const_iterator();
            return children && found != children->end() && _mounts[found->second].identifier != mount.identifier;
        }
        bool isHiddenInParent(std::size_t index, const Mount& parent) const
        {
            const Children& siblings = *childrenOf(parent);
            const std::string_view mountPoint = _mounts[index].mountPoint;
            if (siblings.at(mountPoint) != index)
                return true;
            for (std::string_view above = mountPoint; above.size() > 1 && above != parent.mountPoint;) {
                above = pathByRemovingLastComponent(above);
                const auto found = siblings.find(above);
                if (found != siblings.end() && _mounts[found->second].identifier != parent.identifier)
                    return true;
            }
            return false;
        }

        const std::vector<Mount>& _mounts;
        std::unordered_map<std::uint64_t, std::size_t> _byIdentifier {};
        std::unordered_map<std::uint64_t, Children> _childrenOf {};
    };

    bool beginsWith(std::string_view text, std::string_view start)
    {
        return text.substr(0, start.size()) == start;
    }

    bool isFuse(std::string_view type)
    {
        return type == "fuse" || type == "fuseblk" || beginsWith(type, "fuse.");
    }

    // Drivers that spread over several devices, and so have none of their own.
    bool isOnSeveralDevices(const Mount& mount)
    {
        if (mount.fileSystemType == "zfs")
            return true;
        const bool spreads = mount.fileSystemType == "btrfs" || mount.fileSystemType == "bcachefs";
        return spreads && beginsWith(mount.source, "/dev/");
    }

    bool isSystemType(std::string_view type)
    {
        constexpr std::string_view systemTypes[] = { "squashfs", "autofs", "rootfs", "swap", "fuse.gvfsd-fuse",
            "fuse.portal", "fuse.lxcfs", "fuse.snapfuse", "fuse.squashfuse", "fuse.squashfuse_ll",
            "fuse.fuse-overlayfs", "fuse.revokefs-fuse", "fuse.vmware-vmblock", "fuse.xdg-desktop-portal" };
        return std::find(std::begin(systemTypes), std::end(systemTypes), type) != std::end(systemTypes);
    }

    bool isSystemPlace(std::string_view mountPoint)
    {
        constexpr std::string_view systemFolders[] = { "/boot", "/efi", "/proc", "/sys", "/dev", "/snap", "/var/snap",
            "/var/lib/snapd", "/var/lib/docker", "/var/lib/containers", "/var/lib/containerd", "/var/lib/kubelet",
            "/run/docker", "/run/containerd", "/run/user", "/run/credentials", "/run/snapd" };
        const bool isMountedProgram = beginsWith(mountPoint, "/tmp/.mount_");
        return isMountedProgram
            || std::any_of(std::begin(systemFolders), std::end(systemFolders),
                [&](std::string_view folder) { return isSameOrBelow(mountPoint, folder); });
    }

    // A subvolume of btrfs is mounted by its path within the file system, which the options repeat; a folder inside
    // one, mounted elsewhere, has a longer path.
    bool isWholeSubvolume(const Mount& mount)
    {
        if (mount.fileSystemType != "btrfs")
            return false;
        constexpr std::string_view key = "subvol=";
        std::string_view options = mount.superOptions;
        const std::size_t start = beginsWith(options, key) ? 0 : options.find(",subvol=");
        if (start == std::string_view::npos)
            return true;
        options.remove_prefix(options.find(key, start) + key.size());
        return beginsWith(options, mount.root)
            && (options.size() == mount.root.size() || options[mount.root.size()] == ',');
    }

} // namespace

std::vector<Mount> parseMountTable(std::string_view text)
{
    std::vector<Mount> mounts;
    while (!text.empty()) {
        if (auto mount = mountOfLine(takeUpTo(text, '\n')))
            mounts.push_back(std::move(*mount));
    }
    return mounts;
}

MountTable::MountTable(const std::vector<Mount>& mounts)
{
    const Reachability reachability(mounts);
    std::unordered_set<std::string_view> mountPoints;
    for (std::size_t index = 0; index < mounts.size(); ++index) {
        if (reachability.isReachable(index) && mountPoints.insert(mounts[index].mountPoint).second)
            _mounts.push_back(mounts[index]);
    }
}

Descriptor MountTable::open(const std::string& procFolder)
{
    const std::string path = procFolder + "/self/mountinfo";
    return Descriptor(uninterrupted([&] { return ::open(path.c_str(), O_RDONLY | O_CLOEXEC | O_NONBLOCK); }));
}

MountTable MountTable::read(const std::string& procFolder)
{
    constexpr std::size_t sizeAtMost = 64 << 20;
    constexpr int triesAtMost = 5;
    std::string text;
    // The kernel hands the table out in pieces; a change between two of them tears it, and shows on the descriptor.
    for (int tries = 0; tries < triesAtMost; ++tries) {
        const Descriptor file = open(procFolder);
        if (!file.isOpen())
            break;
        text = readToEnd(file.number(), sizeAtMost);
        if (!hasChanged(file.number()))
            break;
    }
    return MountTable(parseMountTable(text));
}

bool MountTable::hasChanged(int openTable)
{
    pollfd changes { openTable, POLLPRI, 0 };
    return uninterrupted([&] { return poll(&changes, 1, 0); }) > 0 && (changes.revents & POLLPRI) != 0;
}

const Mount* MountTable::mountAt(std::string_view mountPoint) const
{
    const auto found = std::find_if(
        _mounts.begin(), _mounts.end(), [&](const Mount& mount) { return mount.mountPoint == mountPoint; });
    return found == _mounts.end() ? nullptr : &*found;
}

const Mount* MountTable::mountHolding(std::string_view path) const
{
    const Mount* longest = nullptr;
    for (const Mount& mount : _mounts) {
        const bool isLonger = !longest || mount.mountPoint.size() > longest->mountPoint.size();
        if (isLonger && isSameOrBelow(path, mount.mountPoint))
            longest = &mount;
    }
    return longest;
}

const Mount* MountTable::mountWithIdentifier(std::uint64_t identifier) const
{
    const auto found = std::find_if(
        _mounts.begin(), _mounts.end(), [&](const Mount& mount) { return mount.identifier == identifier; });
    return found == _mounts.end() ? nullptr : &*found;
}

bool isLocalVolume(const Mount& mount)
{
    // The part of the name that says that the folder it was mounted on has been removed since.
    constexpr std::string_view removedSuffix = "//deleted";
    const std::string_view mountPoint = mount.mountPoint;
    const bool isRemoved = mountPoint.size() > removedSuffix.size()
        && mountPoint.substr(mountPoint.size() - removedSuffix.size()) == removedSuffix;
    if (mountPoint == "/")
        return true;
    const bool isDisk = mount.device.major != 0 || isFuse(mount.fileSystemType) || isOnSeveralDevices(mount);
    const bool isWhole = mount.root == "/" || isWholeSubvolume(mount);
    return isDisk && isWhole && !isRemoved && !isSystemType(mount.fileSystemType) && !isSystemPlace(mountPoint);
}

} // namespace platform
