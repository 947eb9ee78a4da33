#include "tests/live/SimulatedLiveMachine.h"

#include "platform/PathText.h"
#include "plugin/MontaroConstants.h"

#include <utility>

namespace tests {

using platform::ItemKind;

std::optional<ItemKind> SimulatedLiveDisk::kindOf(const std::string& path) const
{
    const SimulatedDisk::Item* const item = _disk.itemAt(path);
    return item ? std::optional(item->kind) : std::nullopt;
}

std::vector<LiveDisk::Item> SimulatedLiveDisk::itemsIn(const std::string& path) const
{
    std::vector<Item> items;
    const SimulatedDisk::Item* const folder = _disk.itemAt(path);
    for (std::size_t index = 0; folder && index < folder->items.size(); ++index)
        items.push_back({ folder->items[index]->name, folder->items[index]->kind });
    return items;
}

std::string SimulatedLiveDisk::linkTarget(const std::string& path) const
{
    const SimulatedDisk::Item* const item = _disk.itemAt(path);
    return item && item->kind == ItemKind::symbolicLink ? item->text : std::string();
}

std::string SimulatedLiveDisk::realPath(const std::string& path) const
{
    return _disk.placeOf(path).path;
}

std::uint64_t SimulatedLiveDisk::numberOf(const std::string& path)
{
    const SimulatedDisk::Item* const item = _disk.itemAt(path);
    return item ? item->number : 0;
}

std::string SimulatedLiveDisk::pathOf(std::uint64_t number) const
{
    const SimulatedDisk::Item* const item = _disk.itemWithNumber(number);
    return item ? item->path() : std::string();
}

SimulatedLiveMachine::SimulatedLiveMachine(std::uint64_t seed, void* linkedEntryPoint, const std::string& bundle)
    : _machine(seed, linkedEntryPoint)
{
    _machine.workspace.applications = { { MontaroBundleIdentifier, "/opt/montaro" } };
    // The bundle's own files are real; that there is one, the simulated disk tells.
    _machine.disk.makeFolders(bundle);
    _machine.disk.changed = [this](const SimulatedDisk::Change& change) {
        if (_disk.changed)
            _disk.changed(
                change.kind, change.name.empty() ? change.folder : platform::pathJoined(change.folder, change.name));
        _machine.pathWatching.diskChanged(change);
    };
}

void SimulatedLiveMachine::makeVolume(const Volume& volume)
{
    volumes.push_back(volume);
    _simulatedVolumes.emplace(
        volume.mountPoint, _machine.makeVolume(volume.mountPoint, volume.displayName, volume.isRemovable));
}

bool SimulatedLiveMachine::mount(Volume& volume)
{
    _machine.mount(_simulatedVolumes.at(volume.mountPoint));
    return volume.isMounted = true;
}

bool SimulatedLiveMachine::unmount(Volume& volume)
{
    _machine.unmount(_simulatedVolumes.at(volume.mountPoint));
    volume.isMounted = false;
    return true;
}

void SimulatedLiveMachine::tellVolumes(const ListedVolumes* told)
{
    if (told)
        _told = *told;
    _machine.toldVolumes = told ? &_told : nullptr;
}

void SimulatedLiveMachine::drawWatching()
{
    Chance& chance = _machine.chance;
    _machine.pathWatching.dropsOneIn = chance.oneIn(3) ? 150 : 0;
    _machine.pathWatching.pollsOneIn = chance.oneIn(4) ? 3 : 0;
}

void SimulatedLiveMachine::tell(const std::string& watchedPath, const platform::PathChange& change)
{
    _machine.pathWatching.tell(watchedPath, change);
}

void SimulatedLiveMachine::setWhenListing(std::function<platform::FileProblem(std::string_view)> whenListing)
{
    _machine.files.whenListing = std::move(whenListing);
}

void SimulatedLiveMachine::pauseBetweenOperations()
{
    Chance& chance = _machine.chance;
    _machine.threads.pause(chance.time(chance.oneIn(10) ? std::chrono::hours(2) : std::chrono::seconds(20)));
}

void SimulatedLiveMachine::after(std::chrono::nanoseconds delay, std::function<void()> call)
{
    _machine.threads.after(delay, std::move(call));
}

void SimulatedLiveMachine::alone(const std::function<void()>& call)
{
    const SimulatedThreads::Undisturbed here;
    call();
}

} // namespace tests
