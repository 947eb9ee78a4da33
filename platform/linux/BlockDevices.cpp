#include "platform/linux/BlockDevices.h"

#include "platform/PathText.h"
#include "platform/linux/Descriptor.h"
#include "platform/linux/WholeSystemFile.h"

#include <algorithm>
#include <array>
#include <cstdlib>
#include <filesystem>
#include <memory>
#include <optional>
#include <utility>

#include <sys/stat.h>
#include <sys/sysmacros.h>

namespace platform {

namespace {

    constexpr int deepestStack = 16; // a volume of a pool of an encrypted disk; a circle must come to an end
    constexpr std::string_view deviceFolder = "/dev/";

    std::string realPath(const std::string& path)
    {
        const std::unique_ptr<char, decltype(&std::free)> real(realpath(path.c_str(), nullptr), &std::free);
        return real ? std::string(real.get()) : std::string();
    }

    bool existsAt(const std::string& path)
    {
        struct stat facts;
        return uninterrupted([&] { return stat(path.c_str(), &facts); }) == 0;
    }

    // One of /sys' files of a single line.
    std::string firstLine(const std::string& path)
    {
        const std::string content = readWholeSystemFile(path, 4096);
        return content.substr(0, content.find('\n'));
    }

    std::vector<std::string> namesInFolder(const std::string& folder)
    {
        std::vector<std::string> names;
        std::error_code error;
        for (std::filesystem::directory_iterator entry(folder, error), end; !error && entry != end;
             entry.increment(error))
            names.push_back(entry->path().filename().string());
        std::sort(names.begin(), names.end());
        return names;
    }

    bool isPlugBus(const std::string& folder)
    {
        constexpr std::array<std::string_view, 5> buses { "usb", "mmc", "ieee1394", "firewire", "pcmcia" };
        const std::string link = realPath(folder + "/subsystem");
        const std::string_view bus = lastPathComponent(link);
        // A card is plugged; a chip of the same kind, which says so, is soldered to the board.
        if (bus == "mmc" && firstLine(folder + "/type") == "MMC")
            return false;
        return std::find(buses.begin(), buses.end(), bus) != buses.end();
    }

    int valueOfHexDigit(char digit)
    {
        constexpr std::string_view digits = "0123456789abcdef";
        const std::size_t value
            = digits.find(digit >= 'A' && digit <= 'F' ? static_cast<char>(digit - 'A' + 'a') : digit);
        return value == std::string_view::npos ? -1 : static_cast<int>(value);
    }

    // udev writes what a file name cannot hold as \x and two digits.
    std::string withoutUdevEscapes(std::string_view name)
    {
        std::string plain;
        for (std::size_t index = 0; index < name.size(); ++index) {
            const bool isEscape = name.substr(index, 2) == "\\x" && index + 3 < name.size()
                && valueOfHexDigit(name[index + 2]) >= 0 && valueOfHexDigit(name[index + 3]) >= 0;
            if (isEscape) {
                plain.push_back(
                    static_cast<char>(valueOfHexDigit(name[index + 2]) * 16 + valueOfHexDigit(name[index + 3])));
                index += 3;
            } else {
                plain.push_back(name[index]);
            }
        }
        return plain;
    }

    bool isDevice(const std::string& path, DeviceNumber device)
    {
        struct stat facts;
        return uninterrupted([&] { return stat(path.c_str(), &facts); }) == 0 && S_ISBLK(facts.st_mode)
            && facts.st_rdev == makedev(device.major, device.minor);
    }

} // namespace

BlockDevices::BlockDevices(SystemFolders folders)
    : _folders(std::move(folders))
{
}

bool BlockDevices::isRemovable(const Mount& mount, const MountTable& table) const
{
    const std::string folder = systemFolderOf(mount);
    if (!folder.empty())
        return isRemovableDevice(folder, table, 0);
    // What has no device of its own is judged by the place where desktops mount what was plugged in.
    const bool knowsDevices = existsAt(_folders.sys + "/dev/block");
    return knowsDevices && mount.device.major == 0 && mount.mountPoint != "/"
        && (isSameOrBelow(mount.mountPoint, "/media") || isSameOrBelow(mount.mountPoint, "/run/media"));
}

std::string BlockDevices::label(const Mount& mount) const
{
    const std::string folder = _folders.dev + "/disk/by-label";
    const std::string source = pathOfSource(mount.source);
    for (const std::string& name : namesInFolder(folder)) {
        const std::string target = realPath(pathJoined(folder, name));
        if (target.empty())
            continue;
        if (target == source || (mount.device.major != 0 && isDevice(target, mount.device)))
            return withoutUdevEscapes(name);
    }
    return {};
}

// Where /dev/mapper/NAME and its like lead; empty for what is no device.
std::string BlockDevices::pathOfSource(std::string_view source) const
{
    if (source.substr(0, deviceFolder.size()) != deviceFolder)
        return {};
    const std::string path = pathJoined(_folders.dev, source.substr(deviceFolder.size()));
    const std::string real = realPath(path);
    return real.empty() ? path : real;
}

// The real folder of the device's facts below /sys; empty when it has none.
std::string BlockDevices::systemFolderOf(const Mount& mount) const
{
    const std::string number = std::to_string(mount.device.major) + ':' + std::to_string(mount.device.minor);
    std::string folder = mount.device.major == 0 ? std::string() : realPath(_folders.sys + "/dev/block/" + number);
    if (!folder.empty())
        return folder;
    const std::string device = pathOfSource(mount.source);
    const std::string devices
        = pathWithoutTrailingSlashes(_folders.dev) == "/" ? std::string() : realPath(_folders.dev);
    std::string name(pathRelativeTo(device, devices.empty() ? _folders.dev : devices));
    std::replace(name.begin(), name.end(), '/', '!');
    return name.empty() ? std::string() : realPath(_folders.sys + "/class/block/" + name);
}

bool BlockDevices::isRemovableDevice(const std::string& folder, const MountTable& table, int depth) const
{
    if (depth >= deepestStack)
        return false;
    const std::string disk
        = existsAt(folder + "/partition") ? std::string(pathByRemovingLastComponent(folder)) : folder;
    const std::vector<std::string> slaves = namesInFolder(disk + "/slaves");
    if (!slaves.empty()) {
        return std::any_of(slaves.begin(), slaves.end(), [&](const std::string& slave) {
            const std::string below = realPath(disk + "/slaves/" + slave);
            return !below.empty() && isRemovableDevice(below, table, depth + 1);
        });
    }
    const std::string backingFile = firstLine(disk + "/loop/backing_file");
    if (!backingFile.empty()) {
        const Mount* holder = table.mountHolding(backingFile);
        const std::string below = holder ? systemFolderOf(*holder) : std::string();
        return !below.empty() && isRemovableDevice(below, table, depth + 1);
    }
    return isRemovableDisk(disk);
}

bool BlockDevices::isRemovableDisk(const std::string& folder) const
{
    if (firstLine(folder + "/removable") == "1")
        return true;
    const std::string top = realPath(_folders.sys);
    // A disk in a box on a plug calls itself fixed; the bus above it, or the port, knows better.
    for (std::string_view above = folder; above != top && above.size() > 1;
         above = pathByRemovingLastComponent(above)) {
        const std::string place(above);
        if (isPlugBus(place) || firstLine(place + "/removable") == "removable")
            return true;
    }
    return false;
}

} // namespace platform
