// Event libraries become one library group of years and events.
//
// The one surprise: whether a library is watched is asked of the folder that holds it.

#include "plugin/MontaroConstants.h"
#include "plugin/ScanFindings.h"
#include "plugin/SharedValues.h"
#include "plugin/events/EventScan.h"

#include "host/OBConstants.h"
#include "host/OBPathWatcher.h"
#include "platform/PathText.h"

#include <vector>

using platform::Date;
using platform::FolderItem;
using platform::FolderListing;
using platform::Locked;
using platform::Text;
using platform::Value;

namespace {

/// Names and flags of the entries. Which of them are events is found out where several threads may wait for a disk.
constexpr platform::ListingRequest libraryListing { .folderStatus = true };

OBMediaGroupRef makeGroup(
    OBTypeIdentifierRef type, const Text& name, const Text& identifier, const Text& parentID, const OBImageRef& icon)
{
    return OBMediaGroup::withFields(
        { .typeIdentifier = type, .name = name, .ID = identifier, .parentID = parentID, .icon = icon });
}

/// What all clips of all events share. They are the editor's own files, so they bear the editor's identifier.
std::shared_ptr<const OBMediaObjectKind> clipKind()
{
    return std::make_shared<const OBMediaObjectKind>(OBMediaObjectKind { OBMediaTypeMovie, OBMediaSourceTypePlugin,
        MontaroBundleIdentifier, sharedValues().smallAppIcon.load(), { OBMontaroProjectPathKey } });
}

/// The folders of a library that may be events.
std::vector<FoundFolder> foldersInLibrary(const ScanReport& report, const Text& library, const FolderListing& listing)
{
    std::vector<FoundFolder> folders;
    for (const FolderItem item : listing) {
        if (report.passes(rules::nameIsNotHidden, item, library) && report.passes(rules::isVisible, item, library)
            && report.passes(rules::isEventFolder, item, library))
            folders.push_back({ item.name, Text::joined(library, "/", item.name) });
    }
    return folders;
}

void setAttributesOfClips(OBMediaGroup& event, const ClipDates& dates, bool newestFirst)
{
    const std::optional<int> year = dates.creationYear(newestFirst);
    if (!year)
        return;
    Value::Dictionary attributes = event.attributes();
    attributes.emplace_back(OBMontaroEventCreationYear, *year);
    if (dates.oldest())
        attributes.emplace_back(OBMontaroEventOldestClipDate, *dates.oldest());
    if (dates.newest())
        attributes.emplace_back(OBMontaroEventNewestClipDate, *dates.newest());
    event.setAttributes(std::move(attributes));
}

void setClips(const ReadEvent& event, bool newestFirst)
{
    if (!event.group)
        return;
    event.group->setMediaObjects(event.clips.clips);
    if (!event.clips.clips.empty())
        setAttributesOfClips(*event.group, event.clips.dates, newestFirst);
}

} // namespace

EventScan OBMontaroPlugin::newEventScan(MontaroFlatGroupList flatGroups)
{
    return { ScanReport(*this), std::move(flatGroups), clipKind(), localizedString("MontaroClipNameDisplayFormat"),
        sharedValues().eventIcon.load(), sharedValues().calendarIcon.load() };
}

OBMediaGroupRef OBMontaroPlugin::_reloadMontaroEvents_updateRootMediaGroup(const Text& parentID, bool updateRoot)
{
    _poolingEventsReload = false;
    const EventScan scan = newEventScan(listOrNew({}));
    const ScanHistory::Number number = _eventScans.begin(_flatEventGroupsList, scan.flatGroups);
    if (!updateRoot)
        _eventScans.beganForLoad(number);
    const Text name = localizedString("MontaroEventLibrary");
    const OBMediaGroupRef collected = makeGroup(OBMontaroRootGroupTypeIdentifier, name, name, parentID, scan.eventIcon);

    walkEventLibraries(*collected, scan);
    if (isCancelLoadRequestPending())
        return nullptr;

    OBMediaGroupRef library = makeGroup(OBMontaroEventLibraryGroupTypeIdentifier, name, name, parentID, scan.eventIcon);
    groupEventsByYear(*library, collected->childGroups(), scan);
    sortEventsWithinYears(*library);
    if (!isCancelLoadRequestPending()) {
        _eventScans.keep(number, library);
        if (updateRoot)
            publish([&] { return replaceEvents(library, number); });
    }
    return library;
}

/// Collects the events of all libraries, one folder after the other.
void OBMontaroPlugin::walkEventLibraries(OBMediaGroup& collected, const EventScan& scan)
{
    Locked guard(*_MontaroEventsSearchPathsLock);
    const auto isInHome = [this](const Text& path) { return path == _MontaroDefaultEventsFolderPath(); };
    scan.report.walkLibraries(_MontaroEventsSearchPaths.load(), "events", isInHome, [&](const Text& path) {
        if (const OBMediaGroupRef carrier = eventsInFolder(path, scan)) {
            carrier->setParentID(OBMontaro);
            carrier->setID(path);
            collected.addChildGroups(carrier->childGroups());
        }
        // Asked of the folder that holds the library, while the library is what is watched.
        const auto watcher = OBPathWatcher::sharedPathWatcher();
        if (watcher && watcher->watchPathIsUnique_observer(platform::pathByRemovingLastComponent(path), this))
            _watchPath(path);
    });
}

bool OBMontaroPlugin::_isMTEvent(std::string_view path)
{
    return platform().fileSystem.exists(platform::pathJoined(path, MontaroEventIdentifierPathComponent));
}

OBMediaGroupRef OBMontaroPlugin::_createMontaroEventsFolderForPath(const Text& path)
{
    return eventsInFolder(path, newEventScan(listOrNew(_flatEventGroupsList.load())));
}

OBMediaGroupRef OBMontaroPlugin::eventsInFolder(const Text& path, const EventScan& scan)
{
    if (!path)
        return nullptr;
    const FolderListing listing = listFolder(path, libraryListing);
    scan.report.found([&] { return findings::listedFolder(platform().fileSystem, path, listing); });
    if (listing.empty())
        return nullptr;
    OBMediaGroupRef carrier = makeGroup(OBMontaroEventLibraryGroupTypeIdentifier,
        localizedString("MontaroEventLibrary"), path, path, scan.calendarIcon);
    carrier->setPath(path);
    carrier->setModificationDate(listing.folderStatus() ? std::optional(listing.folderStatus()->modificationDate)
                                                        : OBMediaGroup::modDateForFile(path));

    const std::vector<FoundFolder> folders = foldersInLibrary(scan.report, path, listing);
    std::vector<ReadEvent> events(folders.size());
    ShownEvents shown(scan.flatGroups, folders.size());
    const auto read = [&](std::size_t index) {
        events[index]
            = readEvent(path, folders[index], scan, [&](const OBMediaGroupRef& event) { shown.found(index, event); });
        setClips(events[index], _mostRecentEventFirst);
        shown.read(index);
    };
    const auto take = [&](std::size_t index) {
        carrier->addChildGroup(eventToShow(folders[index], std::exchange(events[index], {}), scan));
    };
    if (scan.report.isObserved()) {
        // Whoever is told of decisions is told of them in their order.
        for (std::size_t index = 0; index < folders.size(); ++index) {
            read(index);
            take(index);
        }
    } else {
        performInOrder(folders.size(), read, take);
    }
    return carrier;
}

/// The event of a folder that was read; null when it has no clips. The flat list shows it all the same where its folder
/// of clips holds anything at all.
OBMediaGroupRef OBMontaroPlugin::eventToShow(const FoundFolder& found, const ReadEvent& read, const EventScan& scan)
{
    if (!read.isEvent)
        return nullptr;
    const EventClips& clips = read.clips;
    noteFolderRead(clips.folder, clips.problem);
    if (!read.group) {
        scan.report.keptOut([&] {
            return findings::eventWithoutClipsFolder(platform().fileSystem, found.path, clips.folder, clips.problem);
        });
        return nullptr;
    }
    noteItemsFound(clips.clips.size());
    if (clips.clips.empty()) {
        scan.report.keptOut([&] { return findings::eventWithoutClips(found.path); });
        return nullptr;
    }
    return read.group;
}
