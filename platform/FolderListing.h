#pragma once

#include "platform/Text.h"
#include "platform/Value.h"

#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

namespace platform {

/// What stands at a path, links not followed.
enum class ItemKind : std::uint8_t { file, folder, symbolicLink, other };

/// Why an answer of the file system is empty.
enum class FileProblem : std::uint8_t {
    none,
    missing, ///< nothing is there, or a link on the way leads nowhere
    notAFolder, ///< something on the way, or the item itself, is no folder
    notAPlainFile, ///< a folder, device, pipe or socket where a file is to be read
    notPermitted,
    pathTooLong, ///< longer than the system takes
    linksInCircles,
    linkOnTheWay, ///< only where links were to stop the call (LinkPolicy::stop)
    readError, ///< the disk or the network failed
};

/// Whether a call follows symbolic links in the path it is given.
enum class LinkPolicy : std::uint8_t {
    follow, ///< as the system does
    stop, ///< answer FileProblem::linkOnTheWay when any component of the path, the last included, is a link
};

/// Facts about one item.
struct ItemStatus {
    ItemKind kind = ItemKind::other;
    std::uint64_t size = 0; ///< bytes
    Date modificationDate;
    /// The earlier of birth time and modification time, so that a copy keeps the day it was shot;
    /// the modification time where no birth time is kept.
    Date creationDate;
};

/// What a list of files shows of one, and what it is ordered by.
struct FileFacts {
    Date creationDate; ///< as in `ItemStatus`
    std::uint64_t size = 0; ///< bytes

    friend bool operator==(const FileFacts&, const FileFacts&) = default;
};

/// The flags by which a browser decides whether and how it shows an item.
struct ItemFlags {
    bool invisible = false; ///< its name begins with a full stop, or its folder's `.hidden` names it
    bool container = false; ///< a folder; a symbolic link is none, whatever it points to
    bool package = false; ///< a container that is shown as one file, told by its extension
};

/// Whether an item holds the entry that a listing asked for.
enum class MarkerAnswer : std::uint8_t {
    absent,
    present,
    link, ///< only with LinkPolicy::stop: a link of that name is there, and was not followed to anything
};

/// The folder that holds a listed one, links followed.
struct FolderHolder {
    bool hasMarker = false;
    std::optional<Date> modificationDate {}; ///< of one that has the marker
};

class FolderListing;
struct FolderItem;

/// What a listing is to find out beside names and flags, so that a scan needs no second call an item.
struct ListingRequest {
    /// For every item that can hold one: is there an entry of this name inside it, links followed?
    /// Not asked when empty.
    std::string_view marker {};
    /// The modification date, links followed, of every item that holds the marker.
    bool datesOfHolders = false;
    /// The folder's own facts.
    bool folderStatus = false;
    /// For every item that holds the marker: the names and kinds of what is in the folder of this name inside it, where
    /// that needs no link to be followed. Not asked when empty.
    std::string_view subfolder {};
    /// The size and the creation date of every item that is neither a folder, nor a link, nor hidden by its name.
    bool fileFacts = false;
    /// Of the folder that holds the listed one: is there an entry of this name in it, links followed, and since when
    /// has it been as it is? Where there is none, nothing is listed. Not asked when empty.
    std::string_view markerBeside {};
    /// A listing that is needed no longer, or null. It is emptied, and the answer lies in its memory.
    FolderListing* spare = nullptr;
    LinkPolicy links = LinkPolicy::follow;
    /// With LinkPolicy::stop: a link of the marker's name inside a folder is followed all the same where the system
    /// comes to something by it.
    bool followsMarkers = false;
};

/// The items of a folder inside an item of a listing, in the order in which the file system lists them: names and
/// kinds.
class SubfolderItems {
public:
    SubfolderItems(const FolderListing& listing, std::uint32_t first, std::uint32_t count)
        : _listing(&listing)
        , _first(first)
        , _count(count)
    {
    }
    std::size_t size() const noexcept { return _count; }
    FolderItem operator[](std::size_t index) const;

private:
    friend class FolderListing;
    const FolderListing* _listing;
    std::uint32_t _first;
    std::uint32_t _count;
};

/// One entry of a folder, as a listing answers it.
struct FolderItem {
    std::string_view name {}; ///< bytes as on disk; valid while the listing lives
    ItemKind kind = ItemKind::other;
    ItemFlags flags {};
    MarkerAnswer marker = MarkerAnswer::absent;
    std::optional<Date> modificationDate {}; ///< where the request asked for it and it could be read
    std::optional<FileFacts> facts {}; ///< likewise
    /// Where the request asked for it and it could be told in the same pass; nothing in it when the folder is missing.
    /// Absent, it has to be listed by itself.
    std::optional<SubfolderItems> subfolder {};
};

/// The items of one folder in the order in which the file system lists them, without "." and "..".
///
/// A value: names lie in one block, so a folder of a hundred thousand items costs a handful of allocations.
class FolderListing {
public:
    FolderListing() = default;
    explicit FolderListing(FileProblem problem)
        : _problem(problem)
    {
    }

    /// Why there are no items, or `none`. A folder that was read and is empty has no problem; one of which the disk
    /// gave only a part answers that part, and `readError`.
    FileProblem problem() const noexcept { return _problem; }
    /// The folder's own facts, links followed, taken while it was listed; absent when it could not be listed, and when
    /// the request did not ask for them.
    const std::optional<ItemStatus>& folderStatus() const noexcept { return _folderStatus; }

    /// What the request asked of the folder that holds the listed one. Absent where it did not, and where that could
    /// not be told in the same pass: then it is to be asked for by itself, and all items are listed.
    const std::optional<FolderHolder>& holder() const noexcept { return _holder; }

    /// Whether the folder's path, as it was asked for, is known to hold no symbolic link and so is its own real path.
    bool pathIsReal() const noexcept { return _pathIsReal; }
    /// The folder's real path where the listing came by it on the way and it is another than the one asked for; empty
    /// otherwise.
    const std::string& otherRealPath() const noexcept { return _otherRealPath; }

    std::size_t size() const noexcept { return _entries.size(); }
    bool empty() const noexcept { return _entries.empty(); }
    /// Whether an item is a link, or may hold a linked marker.
    bool hasLinks() const noexcept { return _hasLinks; }
    FolderItem operator[](std::size_t index) const
    {
        const Entry& entry = _entries[index];
        FolderItem item { std::string_view(_names).substr(entry.nameOffset, entry.nameLength), entry.kind, entry.flags,
            entry.marker };
        if (entry.hasDate)
            item.modificationDate = Date { entry.seconds, entry.nanoseconds };
        if (entry.hasFacts)
            item.facts = FileFacts { { entry.seconds, entry.nanoseconds }, entry.size };
        if (entry.hasSubfolder)
            item.subfolder.emplace(
                *this, static_cast<std::uint32_t>(entry.size >> 32), static_cast<std::uint32_t>(entry.size));
        return item;
    }

    class Iterator {
    public:
        Iterator(const FolderListing* listing, std::size_t index)
            : _listing(listing)
            , _index(index)
        {
        }
        FolderItem operator*() const { return (*_listing)[_index]; }
        Iterator& operator++()
        {
            ++_index;
            return *this;
        }
        friend bool operator==(const Iterator&, const Iterator&) = default;

    private:
        const FolderListing* _listing;
        std::size_t _index;
    };
    Iterator begin() const { return { this, 0 }; }
    Iterator end() const { return { this, _entries.size() }; }

    /// For whoever makes a listing: an empty one in the memory of another.
    static FolderListing inMemoryOf(FolderListing&& spare);
    void append(const FolderItem& item);
    /// Makes room for so many more items, whose names take so many bytes; more may come.
    void reserve(std::size_t items, std::size_t bytesOfNames);
    void setItem(std::size_t index, const FolderItem& item);
    /// Adds an item of the subfolder of the item that is appended next.
    void appendToSubfolder(std::string_view name, ItemKind kind);
    /// What has been added to the subfolder of the item that is appended next.
    SubfolderItems takeSubfolder();
    void setFolderStatus(const ItemStatus& status) { _folderStatus = status; }
    void setHolder(const FolderHolder& holder) { _holder = holder; }
    void setProblem(FileProblem problem) { _problem = problem; }
    void setPathIsReal(bool isReal) { _pathIsReal = isReal; }
    void setOtherRealPath(std::string path) { _otherRealPath = std::move(path); }

private:
    friend class SubfolderItems;
    FolderItem adopted(const FolderItem& item);
    void appendOwn(const FolderItem& item);
    void noteLinks(const FolderItem& item)
    {
        _hasLinks = _hasLinks || item.kind == ItemKind::symbolicLink || item.marker == MarkerAnswer::link;
    }
    struct SubfolderEntry {
        std::uint32_t nameOffset = 0;
        std::uint32_t nameLength = 0;
        ItemKind kind = ItemKind::other;
    };
    /// Folders have a modification date and other items have facts, so one date serves both, and what a subfolder holds
    /// may stand in place of a size. A folder of a hundred thousand items is walked twice: half the bytes are half the
    /// way.
    struct Entry {
        std::int64_t seconds = 0;
        std::uint64_t size = 0; // or where the subfolder's entries begin, and 32 bits below, how many there are
        std::uint32_t nanoseconds = 0;
        std::uint32_t nameOffset = 0;
        std::uint16_t nameLength = 0;
        ItemKind kind = ItemKind::other;
        MarkerAnswer marker = MarkerAnswer::absent;
        ItemFlags flags;
        bool hasDate : 1 = false;
        bool hasFacts : 1 = false;
        bool hasSubfolder : 1 = false;

        void take(const FolderItem& item);
    };

    std::string _names;
    std::vector<Entry> _entries;
    std::vector<SubfolderEntry> _subfolderEntries;
    std::size_t _subfolderStart = 0; // of the item that is appended next
    std::optional<ItemStatus> _folderStatus;
    std::optional<FolderHolder> _holder;
    FileProblem _problem = FileProblem::none;
    bool _pathIsReal = false;
    bool _hasLinks = false;
    std::string _otherRealPath;
};

inline void FolderListing::Entry::take(const FolderItem& item)
{
    kind = item.kind;
    marker = item.marker;
    flags = item.flags;
    hasDate = item.modificationDate.has_value();
    hasSubfolder = item.subfolder.has_value();
    hasFacts = !hasDate && !hasSubfolder && item.facts.has_value();
    if (hasDate || hasFacts) {
        const Date date = hasDate ? *item.modificationDate : item.facts->creationDate;
        seconds = date.seconds;
        nanoseconds = date.nanoseconds;
        size = hasFacts ? item.facts->size : 0;
    }
    if (hasSubfolder)
        size = std::uint64_t { item.subfolder->_first } << 32 | item.subfolder->_count;
}

inline FolderItem SubfolderItems::operator[](std::size_t index) const
{
    const FolderListing::SubfolderEntry& entry = _listing->_subfolderEntries[_first + index];
    FolderItem item;
    item.name = std::string_view(_listing->_names).substr(entry.nameOffset, entry.nameLength);
    item.kind = entry.kind;
    return item;
}

inline void FolderListing::appendToSubfolder(std::string_view name, ItemKind kind)
{
    _subfolderEntries.push_back(
        { static_cast<std::uint32_t>(_names.size()), static_cast<std::uint32_t>(name.size()), kind });
    _names.append(name);
}

inline SubfolderItems FolderListing::takeSubfolder()
{
    const std::size_t first = std::exchange(_subfolderStart, _subfolderEntries.size());
    return { *this, static_cast<std::uint32_t>(first), static_cast<std::uint32_t>(_subfolderStart - first) };
}

/// `item`, with what it tells of a subfolder kept in this listing.
inline FolderItem FolderListing::adopted(const FolderItem& item)
{
    FolderItem own = item;
    if (item.subfolder && item.subfolder->_listing != this) {
        for (std::size_t index = 0; index < item.subfolder->size(); ++index)
            appendToSubfolder((*item.subfolder)[index].name, (*item.subfolder)[index].kind);
        own.subfolder = takeSubfolder();
    }
    return own;
}

inline FolderListing FolderListing::inMemoryOf(FolderListing&& spare)
{
    FolderListing listing;
    listing._names = std::move(spare._names);
    listing._entries = std::move(spare._entries);
    listing._subfolderEntries = std::move(spare._subfolderEntries);
    listing._names.clear();
    listing._entries.clear();
    listing._subfolderEntries.clear();
    return listing;
}

inline void FolderListing::reserve(std::size_t items, std::size_t bytesOfNames)
{
    // Only the first call knows how much there is; what grows beyond doubles.
    if (_entries.empty()) {
        _entries.reserve(items);
        _names.reserve(bytesOfNames);
    }
}

inline void FolderListing::append(const FolderItem& item)
{
    const bool isForeign = item.subfolder && item.subfolder->_listing != this;
    return isForeign ? appendOwn(adopted(item)) : appendOwn(item);
}

inline void FolderListing::appendOwn(const FolderItem& item)
{
    Entry& entry = _entries.emplace_back();
    entry.nameOffset = static_cast<std::uint32_t>(_names.size());
    entry.nameLength = static_cast<std::uint16_t>(item.name.size());
    _names.append(item.name);
    entry.take(item);
    noteLinks(item);
}

inline void FolderListing::setItem(std::size_t index, const FolderItem& item)
{
    const FolderItem own = adopted(item);
    _entries[index].take(own);
    noteLinks(own);
}

} // namespace platform
