#include "tests/live/RandomPlaces.h"

#include "platform/PathText.h"
#include "plugin/MontaroConstants.h"

namespace tests {

using platform::ItemKind;
using platform::pathJoined;

namespace {

    constexpr const char* projects = MontaroProjectsFolderName;
    constexpr const char* events = MontaroEventsFolderName;

    std::vector<std::string> foldersIn(const LiveDisk& disk, const std::string& folder)
    {
        std::vector<std::string> names;
        for (const LiveDisk::Item& item : disk.itemsIn(folder)) {
            if (item.kind == ItemKind::folder)
                names.push_back(item.name);
        }
        return names;
    }

} // namespace

std::string RandomPlaces::library(std::string_view kind)
{
    std::vector<std::string> places { "/Users/ann/Movies", "/Users/ann/Movies", "/" };
    for (const LiveMachine::Volume& volume : _machine.volumes) {
        if (volume.isMounted)
            places.push_back(volume.mountPoint);
    }
    return pathJoined(_chance.of(places), kind);
}

std::string RandomPlaces::anyFolder()
{
    std::string path = _chance.oneIn(8) ? "/elsewhere" : library(_chance.oneIn(2) ? projects : events);
    while (_disk.kindOf(path) && !_chance.oneIn(3)) {
        std::vector<std::string> folders = foldersIn(_disk, path);
        if (folders.empty())
            break;
        path = pathJoined(path, _chance.of(folders));
    }
    return path;
}

/// Something in a folder, or at times a whole library.
std::string RandomPlaces::anyItem()
{
    std::string folder = anyFolder();
    const std::vector<LiveDisk::Item> items = _disk.itemsIn(folder);
    if (items.empty() || _chance.oneIn(20))
        return folder;
    return pathJoined(folder, _chance.of(items).name);
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
