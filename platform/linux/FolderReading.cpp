#include "platform/linux/FolderReading.h"

#include "platform/linux/Descriptor.h"
#include "platform/linux/FolderOpening.h"
#include "platform/linux/HiddenNamesReading.h"
#include "platform/linux/ItemReading.h"

#include <string>

#include <dirent.h>
#include <fcntl.h>
#include <sys/stat.h>

namespace platform {

namespace {

    class FolderReader {
    public:
        FolderReader(int folder, const ListingRequest& request)
            : _folder(folder)
            , _request(request)
            , _asksForMarker(!request.marker.empty() && request.marker.find('\0') == std::string_view::npos)
        {
            if (request.spare)
                _listing = FolderListing::inMemoryOf(std::move(*request.spare));
        }

        FolderListing listing();

    private:
        bool lookBeside();
        void takeBlock(const char* block, std::size_t length);
        void take(const dirent64& entry);
        static ItemKind kindOfItem(int folder, const dirent64& entry);
        void readFacts(FolderItem& item, const char* name);
        MarkerAnswer markerInside(const char* name, ItemKind kind);
        std::optional<SubfolderItems> itemsOfSubfolder(const char* holder);
        bool readSubfolder(int folder);

        int _folder;
        const ListingRequest& _request;
        bool _asksForMarker;
        bool _sawHiddenNames = false;
        std::string _markerPath {};
        FolderListing _listing {};
    };

    FolderListing FolderReader::listing()
    {
        // A file system that never comes to an end (FUSE) must not eat the memory.
        constexpr std::size_t itemsAtMost = 20'000'000;
        if (_request.folderStatus) {
            if (const auto status = readItemStatus(_folder, "", AT_EMPTY_PATH))
                _listing.setFolderStatus(*status);
        }
        if (!_request.markerBeside.empty() && !lookBeside())
            return std::move(_listing);
        alignas(dirent64) char block[64 * 1024];
        ssize_t length = 0;
        do {
            length = uninterrupted([&] { return getdents64(_folder, block, sizeof(block)); });
            if (length > 0)
                takeBlock(block, static_cast<std::size_t>(length));
        } while (length > 0 && _listing.size() < itemsAtMost);
        if (length != 0)
            _listing.setProblem(FileProblem::readError);
        if (_sawHiddenNames) {
            if (const HiddenNames names = readHiddenNames(_folder); !names.empty())
                names.applyTo(_listing);
        }
        return std::move(_listing);
    }

    // Whether the items are wanted. The folder is open by a path without links, so what holds it is what the path says.
    bool FolderReader::lookBeside()
    {
        _markerPath.assign("../").append(_request.markerBeside);
        if (uninterrupted([&] { return faccessat(_folder, _markerPath.c_str(), F_OK, 0); }) == -1) {
            // A link may lead somewhere all the same, by links that are no links of this system's; and from inside it
            // may be forbidden to look at what the whole path leads to.
            struct stat status { };
            const bool isMissing = errno == ENOENT
                && fstatat(_folder, _markerPath.c_str(), &status, AT_SYMLINK_NOFOLLOW) == -1 && errno == ENOENT;
            if (isMissing)
                _listing.setHolder({});
            return !isMissing;
        }
        if (const auto status = readItemStatus(_folder, "..", 0))
            _listing.setHolder({ true, status->modificationDate });
        return true;
    }

    void FolderReader::takeBlock(const char* block, std::size_t length)
    {
        // Most folders fit one block, which bounds what they hold; an entry takes twice its name and some more.
        constexpr std::size_t usualEntry = 32;
        _listing.reserve(length / usualEntry + 1, length / 2);
        for (std::size_t offset = 0; offset < length;) {
            const auto* entry = reinterpret_cast<const dirent64*>(block + offset);
            take(*entry);
            offset += entry->d_reclen;
        }
    }

    void FolderReader::take(const dirent64& entry)
    {
        const std::string_view name = entry.d_name;
        const bool isHidden = name.front() == '.';
        if (isHidden && (name == "." || name == ".."))
            return;
        FolderItem item;
        item.name = name;
        item.kind = kindOfItem(_folder, entry);
        item.flags = flagsOfItem(name, item.kind);
        if (_request.fileFacts)
            readFacts(item, entry.d_name);
        if (_asksForMarker)
            item.marker = markerInside(entry.d_name, item.kind);
        if (_request.datesOfHolders && item.marker != MarkerAnswer::absent) {
            if (const auto status = readItemStatus(_folder, entry.d_name, 0))
                item.modificationDate = status->modificationDate;
        }
        if (!_request.subfolder.empty() && item.marker == MarkerAnswer::present && item.kind == ItemKind::folder)
            item.subfolder = itemsOfSubfolder(entry.d_name);
        _sawHiddenNames = _sawHiddenNames || (isHidden && name == HiddenNames::fileName);
        _listing.append(item);
    }

    ItemKind FolderReader::kindOfItem(int folder, const dirent64& entry)
    {
        switch (entry.d_type) {
        case DT_REG:
            return ItemKind::file;
        case DT_DIR:
            return ItemKind::folder;
        case DT_LNK:
            return ItemKind::symbolicLink;
        case DT_UNKNOWN: {
            const auto status = readItemStatus(folder, entry.d_name, AT_SYMLINK_NOFOLLOW);
            return status ? status->kind : ItemKind::other;
        }
        default:
            return ItemKind::other;
        }
    }

    // Who replaces a file by a link or a folder while it is listed gets what stands there now, without facts.
    void FolderReader::readFacts(FolderItem& item, const char* name)
    {
        const auto isAsked = [&] {
            return item.kind != ItemKind::folder && item.kind != ItemKind::symbolicLink && !item.flags.invisible;
        };
        if (!isAsked())
            return;
        const auto status = readItemStatus(_folder, name, AT_SYMLINK_NOFOLLOW);
        if (!status)
            return;
        if (status->kind != item.kind) {
            item.kind = status->kind;
            item.flags = flagsOfItem(item.name, item.kind);
        }
        if (isAsked())
            item.facts = FileFacts { status->creationDate, status->size };
    }

    MarkerAnswer FolderReader::markerInside(const char* name, ItemKind kind)
    {
        const bool follows = _request.links == LinkPolicy::follow;
        if (kind != ItemKind::folder && !(follows && kind == ItemKind::symbolicLink))
            return MarkerAnswer::absent;
        _markerPath.assign(name).append(1, '/').append(_request.marker);
        // Less work for the system than to tell what stands there, which is then asked only where there is nothing.
        if (follows || _request.followsMarkers) {
            const int answer = uninterrupted([&] { return faccessat(_folder, _markerPath.c_str(), F_OK, 0); });
            if (answer == 0 || follows)
                return answer == 0 ? MarkerAnswer::present : MarkerAnswer::absent;
        }
        struct stat facts;
        const auto ask = [&] { return fstatat(_folder, _markerPath.c_str(), &facts, AT_SYMLINK_NOFOLLOW); };
        if (uninterrupted(ask) == -1)
            return MarkerAnswer::absent;
        return S_ISLNK(facts.st_mode) ? MarkerAnswer::link : MarkerAnswer::present;
    }

    // Absent when a link is in the way or the folder cannot be read: whoever asks for it alone is told why.
    std::optional<SubfolderItems> FolderReader::itemsOfSubfolder(const char* holder)
    {
        _markerPath.assign(holder).append(1, '/').append(_request.subfolder);
        const OpenedFolder subfolder = openFolderIn(_folder, _markerPath.c_str());
        const bool isNone = subfolder.problem == FileProblem::missing || subfolder.problem == FileProblem::notAFolder;
        const bool isRead = subfolder.descriptor.isOpen() && readSubfolder(subfolder.descriptor.number());
        const SubfolderItems items = _listing.takeSubfolder();
        return isNone || isRead ? std::optional(items) : std::nullopt;
    }

    bool FolderReader::readSubfolder(int folder)
    {
        constexpr int blocksAtMost = 1000; // some hundred thousand items; more are listed by themselves
        alignas(dirent64) char block[32 * 1024];
        for (int count = 0; count < blocksAtMost; ++count) {
            const ssize_t length = uninterrupted([&] { return getdents64(folder, block, sizeof(block)); });
            if (length <= 0)
                return length == 0;
            for (ssize_t offset = 0; offset < length;) {
                const auto* entry = reinterpret_cast<const dirent64*>(block + offset);
                const std::string_view name = entry->d_name;
                if (name != "." && name != "..")
                    _listing.appendToSubfolder(name, kindOfItem(folder, *entry));
                offset += entry->d_reclen;
            }
        }
        return false;
    }

} // namespace

FolderListing readOpenFolder(int folder, const ListingRequest& request)
{
    return FolderReader(folder, request).listing();
}

} // namespace platform
