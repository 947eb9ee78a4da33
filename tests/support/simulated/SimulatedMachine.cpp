#include "tests/support/simulated/SimulatedMachine.h"

#include "platform/Platform.h"

#include <algorithm>
#include <array>
#include <charconv>

namespace tests {

std::optional<platform::MovieHeader> SimulatedMovies::headerOfMovie(
    std::string_view path, platform::PathKnowledge known) const
{
    const platform::OpenResult opened = _files.openPlainFile(path, known);
    if (!opened.file)
        return std::nullopt;
    std::array<char, 32> text {};
    const std::size_t size = opened.file->read(0, std::as_writable_bytes(std::span(text)));
    int width = 0;
    int height = 0;
    const std::from_chars_result first = std::from_chars(text.data(), text.data() + size, width);
    if (first.ec != std::errc() || *first.ptr != 'x')
        return std::nullopt;
    std::from_chars(first.ptr + 1, text.data() + size, height);
    return platform::MovieHeader { platform::Size { static_cast<double>(width), static_cast<double>(height) }, 1.0 };
}

SimulatedMachine::SimulatedMachine(std::uint64_t seed, void* linkedEntryPoint)
    : chance(seed)
    , _bundles(_kernel, linkedEntryPoint)
{
    volumes.local = { { "/", "Boot" } };
    disk.changed = [this](const SimulatedDisk::Change& change) { pathWatching.diskChanged(change); };
    files.onEachCall = [this](std::string_view) {
        const SimulatedThreads::Undisturbed here;
        if (diskTakesTime && chance.oneIn(6))
            threads.pause(chance.oneIn(3) ? chance.time(std::chrono::seconds(2)) : std::chrono::nanoseconds(0));
    };
    for (const char* folder : { "/Users/ann/Movies", "/Users/ann/Library/Preferences", "/media/ann", "/elsewhere" })
        disk.makeFolders(folder);
}

SimulatedMachine::~SimulatedMachine()
{
    mainRunLoop.quit();
    threads.letAllEnd();
}

platform::Platform SimulatedMachine::platform()
{
    return {
        .fileSystem = files,
        .pathWatching = pathWatching,
        .volumes = _toldVolumes,
        .workspace = workspace,
        .preferences = preferences,
        .metadataIndex = metadataIndex,
        .movies = movies,
        .notifications = notifications,
        .workspaceNotifications = workspaceNotifications,
        .clock = threads,
        .calendar = calendar,
        .threads = threads,
        .mainRunLoop = mainRunLoop,
        .console = console,
        .bundles = _bundles,
        .languages = _languages,
    };
}

SimulatedMachine::Volume SimulatedMachine::makeVolume(
    const std::string& mountPoint, const std::string& displayName, bool isRemovable)
{
    disk.makeFolders(mountPoint);
    return { disk.makeVolume(), mountPoint, displayName, isRemovable };
}

void SimulatedMachine::mount(Volume& volume)
{
    disk.mount(volume.top, volume.mountPoint);
    volume.isMounted = true;
    _mounted.push_back(volume);
    listVolumes(volume);
}

void SimulatedMachine::unmount(Volume& volume)
{
    disk.unmount(volume.top);
    volume.isMounted = false;
    std::erase_if(_mounted, [&](const Volume& other) { return other.top == volume.top; });
    listVolumes(volume);
}

void SimulatedMachine::listVolumes(const Volume& changed)
{
    volumes.local = { { "/", "Boot" } };
    volumes.removable.clear();
    for (const Volume& volume : _mounted) {
        volumes.local.push_back({ volume.mountPoint, volume.displayName });
        if (volume.isRemovable)
            volumes.removable.push_back({ volume.mountPoint, volume.displayName });
    }
    volumes.listsChanged();
    pathWatching.mountsChanged(changed.mountPoint);
}

} // namespace tests
