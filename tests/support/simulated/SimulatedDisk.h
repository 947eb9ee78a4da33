#pragma once

#include "platform/FolderListing.h"
#include "platform/PathWatching.h"

#include <cstdint>
#include <functional>
#include <map>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace tests {

/// A file tree in memory: folders, files, links, permissions, times, and volumes that are mounted on folders.
///
/// Paths are absolute, single slashes, no dots. Whatever changes the tree answers false, and changes nothing, where a
/// real disk would refuse. One thread at a time.
class SimulatedDisk {
public:
    struct Item {
        std::uint64_t number = 0; ///< another one for each item ever made
        platform::ItemKind kind = platform::ItemKind::folder;
        std::string name {};
        Item* parent = nullptr; ///< null at the top of the tree and of a volume that is not mounted
        std::string text {}; ///< a file's content, a link's target
        bool isOpen = true; ///< of a folder: whether it may be listed and entered; of a file: whether it may be read
        platform::Date born {};
        platform::Date modified {};
        platform::Date changed {};
        std::vector<std::unique_ptr<Item>> items {}; ///< in listing order
        Item* mounted = nullptr; ///< the volume that covers this folder

        Item* item(std::string_view itemName) const;
        std::string path() const;
    };

    /// Where a path leads.
    struct Place {
        Item* item = nullptr; ///< null with a problem
        platform::FileProblem problem = platform::FileProblem::none;
        std::string path; ///< real, as far as it could be told
    };
    enum class Links : std::uint8_t { followed, lastKept, refused };

    /// Something that happened in or to `folder`. `name` is empty where it happened to the folder itself.
    struct Change {
        platform::PathChange::Kind kind;
        std::string folder; ///< its real path
        std::string name;
        bool isFolder = false;
        bool heldMore = false;
    };

    explicit SimulatedDisk(std::function<platform::Date()> now);

    /// Hears of every change, once it is made.
    std::function<void(const Change&)> changed {};

    Place placeOf(std::string_view path, Links links = Links::followed) const;
    /// The item at `path`, no link followed; null when there is none.
    Item* itemAt(std::string_view path) const { return placeOf(path, Links::lastKept).item; }
    Item* itemWithNumber(std::uint64_t number) const;

    bool makeFolder(const std::string& path);
    /// With all folders above it.
    void makeFolders(const std::string& path);
    /// A new file that somebody still writes to; its number, or 0.
    std::uint64_t beginFile(const std::string& path);
    /// The writer is done: the file, wherever it is now, holds `text`, and bears a date of the writer's choice or
    /// now's.
    void endFile(std::uint64_t number, const std::string& text, std::optional<platform::Date> date = {});
    /// A whole new file, or other content for one that exists.
    bool writeFile(const std::string& path, const std::string& text);
    bool makeLink(const std::string& path, const std::string& target);
    bool rename(const std::string& from, const std::string& to);
    /// With all that is in it, from the inside out.
    bool remove(const std::string& path);
    bool setOpen(const std::string& path, bool isOpen);
    bool setModified(const std::string& path, platform::Date date);

    /// A volume with nothing in it, not mounted. It lives as long as the disk.
    Item* makeVolume();
    void mount(Item* volume, const std::string& path);
    void unmount(Item* volume);

private:
    Item* folderFor(const std::string& path) const;
    Item* add(const std::string& path, platform::ItemKind kind);
    void touch(Item& folder);
    void forget(const Item& item);
    bool isMountedBelow(const Item& item) const;
    void tell(platform::PathChange::Kind kind, const Item& folder, const std::string& name, bool isFolder = false,
        bool heldMore = false) const;
    void tellFound(const Item& folder) const;

    const std::function<platform::Date()> _now;
    std::uint64_t _last = 0;
    std::unique_ptr<Item> _top;
    std::vector<std::unique_ptr<Item>> _volumes {};
    std::map<std::uint64_t, Item*> _byNumber {};
    std::map<std::uint64_t, bool> _written {}; // files that are being written: whether from the beginning
};

} // namespace tests
