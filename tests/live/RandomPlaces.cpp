#include "tests/live/RandomPlaces.h"

#include "platform/PathText.h"
#include "plugin/MontaroConstants.h"

namespace tests {

using platform::ItemKind;
using platform::pathJoined;

namespace {

    constexpr const char* projects = MontaroProjectsFolderName;
    constexpr const char* events = MontaroEventsFolderName;

    std::vector<std::string> foldersIn(const SimulatedDisk::Item& folder)
    {
        std::vector<std::string> names;
        for (const auto& item : folder.items) {
            if (item->kind == ItemKind::folder)
                names.push_back(item->name);
        }
        return names;
    }

} // namespace

std::string RandomPlaces::library(std::string_view kind)
{
    std::vector<std::string> places { "/Users/ann/Movies", "/Users/ann/Movies", "/" };
    for (const SimulatedMachine::Volume& volume : volumes) {
        if (volume.isMounted)
            places.push_back(volume.mountPoint);
    }
    return pathJoined(_chance.of(places), kind);
}

std::string RandomPlaces::anyFolder()
{
    std::string path = _chance.oneIn(8) ? "/elsewhere" : library(_chance.oneIn(2) ? projects : events);
    const SimulatedDisk::Item* item = _disk.itemAt(path);
    while (item && !_chance.oneIn(3)) {
        std::vector<std::string> folders = foldersIn(*item);
        if (folders.empty())
            break;
        path = pathJoined(path, _chance.of(folders));
        item = _disk.itemAt(path);
    }
    return path;
}

/// Something in a folder, or at times a whole library.
std::string RandomPlaces::anyItem()
{
    const std::string folder = anyFolder();
    const SimulatedDisk::Item* const item = _disk.itemAt(folder);
    if (!item || item->items.empty() || _chance.oneIn(20))
        return folder;
    return pathJoined(folder, _chance.of(item->items)->name);
}

std::string RandomPlaces::newName()
{
    static const std::vector<std::string> names { "Trip", "Old", "b", "A", "alpha", "Zed", "Ber\xc3\xa9nice",
        "x.mtrproject", "Pack.app", ".dot", "clip.mov", "two.m4v", "shot.MOV", "note.txt", "Shared Items",
        "Original Media", "Montaro Projects", "Montaro Events" };
    return _chance.of(names);
}

std::string RandomPlaces::freePath()
{
    return pathJoined(anyFolder(), newName());
}

std::string RandomPlaces::folderOfFiles()
{
    for (int attempt = 0; attempt < 12; ++attempt) {
        std::string folder = anyFolder();
        if (folder.ends_with("/Shared Items") || folder.ends_with("/Original Media"))
            return folder;
    }
    return anyFolder();
}

std::string RandomPlaces::movie()
{
    static const std::vector<std::string> movies { "1280x720", "1920x1080", "640x480", "1920x800", "no movie" };
    return _chance.of(movies);
}

} // namespace tests
