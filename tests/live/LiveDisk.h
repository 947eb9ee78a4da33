#pragma once

#include "platform/FolderListing.h"
#include "platform/PathWatching.h"

#include <cstdint>
#include <functional>
#include <optional>
#include <string>
#include <vector>

namespace tests {

/// The disks of a machine on which a tree is left open, for whoever changes them: in memory, or real ones.
///
/// Paths are absolute, single slashes, no dots, and the same for every machine. Whatever changes a disk answers false
/// where the disk refuses. One thread at a time.
class LiveDisk {
public:
    struct Item {
        std::string name;
        platform::ItemKind kind;
    };

    LiveDisk() = default;
    virtual ~LiveDisk() = default;
    LiveDisk(const LiveDisk&) = delete;
    LiveDisk& operator=(const LiveDisk&) = delete;

    /// Hears of every change once it is made, with the real path of what changed.
    std::function<void(platform::PathChange::Kind kind, const std::string& path)> changed {};

    /// What is at `path`, no link followed; absent when nothing is.
    virtual std::optional<platform::ItemKind> kindOf(const std::string& path) const = 0;
    /// What is in the folder at `path`; nothing where that is no folder.
    virtual std::vector<Item> itemsIn(const std::string& path) const = 0;
    virtual std::string linkTarget(const std::string& path) const = 0;
    /// Where `path` leads, as far as that can be told.
    virtual std::string realPath(const std::string& path) const = 0;
    /// By which the item at `path` is found again; 0 when there is none.
    virtual std::uint64_t numberOf(const std::string& path) = 0;
    /// Where the item is by now; empty when it is gone.
    virtual std::string pathOf(std::uint64_t number) const = 0;

    virtual bool makeFolder(const std::string& path) = 0;
    /// A new file that somebody still writes to; its number, or 0.
    virtual std::uint64_t beginFile(const std::string& path) = 0;
    /// The writer is done: the file, wherever it is now, holds `text`, and bears a date of the writer's choice or
    /// now's.
    virtual void endFile(std::uint64_t number, const std::string& text, std::optional<platform::Date> date) = 0;
    /// A whole new file, or other content for one that exists. "640x480" makes it a movie of that size.
    virtual bool writeFile(const std::string& path, const std::string& text) = 0;
    virtual bool makeLink(const std::string& path, const std::string& target) = 0;
    virtual bool rename(const std::string& from, const std::string& to) = 0;
    /// With all that is in it.
    virtual bool remove(const std::string& path) = 0;
    /// Whether a folder may be listed and entered, a file read.
    virtual bool setOpen(const std::string& path, bool isOpen) = 0;
    virtual bool setModified(const std::string& path, platform::Date date) = 0;

    /// A folder with all those above it.
    void makeFolders(const std::string& path)
    {
        for (std::size_t end = path.find('/', 1); end != std::string::npos; end = path.find('/', end + 1))
            makeFolder(path.substr(0, end));
        makeFolder(path);
    }
};

} // namespace tests
