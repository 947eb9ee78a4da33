// What a folder of a library holds: whether it is an event, its clips, and the years that they give it.
//
// The one surprise: every file is a clip, whatever its extension; and a link becomes the file that it leads to, named
// and placed as that is.

#include "plugin/MontaroConstants.h"
#include "plugin/ScanFindings.h"
#include "plugin/events/EventScan.h"

#include "host/OBConstants.h"
#include "host/OBMediaGroup.h"
#include "platform/Calendar.h"
#include "platform/PathText.h"

#include <string>
#include <utility>
#include <vector>

using platform::Date;
using platform::FolderItem;
using platform::ItemKind;
using platform::Text;

namespace {

constexpr int yearOfNoDate = -1;
constexpr int latestRecordedYear = 9999;
constexpr std::string_view dateFormat = "%-d %b %Y"; // for people who ask about a clip

/// Names and flags of the entries, what a clip's list and an event's year need of each file, and whether it is an
/// event.
constexpr platform::ListingRequest clipListing { .fileFacts = true,
    .markerBeside = MontaroEventIdentifierPathComponent };

/// The years of dates. Clips of one event were mostly shot in one year, so a date between two that were asked for needs
/// no calendar.
class YearsOfDates {
public:
    explicit YearsOfDates(const platform::Calendar& calendar)
        : _calendar(calendar)
    {
    }

    int yearOf(Date date) { return _first <= date && date <= _last ? _year : yearByCalendar(date); }

private:
    int yearByCalendar(Date date)
    {
        const int year = _calendar.yearOfDate(date);
        if (year != _year || _last < _first) {
            _year = year;
            _first = _last = date;
        }
        _first = std::min(_first, date);
        _last = std::max(_last, date);
        return year;
    }

    const platform::Calendar& _calendar;
    int _year = 0;
    Date _first { 1, 0 };
    Date _last { 0, 0 }; // before the first: no date was asked for yet
};

/// A file that becomes a clip.
struct FoundFile {
    std::string_view entry; ///< what the folder of clips calls it
    std::string_view path; ///< where it lies; elsewhere for a link
    std::optional<platform::FileFacts> facts {};
    bool isLinked = false;
    bool isPlainFile = false;
};

/// The year that a clip counts to, and the date that gave it.
struct ClipYear {
    int year = yearOfNoDate;
    std::optional<Date> date {};
    bool isRecorded = false;
};

} // namespace

/// Reads the folder of one event's clips, in listing order.
class OBMontaroPlugin::ClipReader {
public:
    /// The listing of `folder` lies in `scratch`, which outlives the reader.
    ClipReader(OBMontaroPlugin& plugin, const EventScan& scan, const Text& folder, ClipScratch& scratch)
        : _plugin(plugin)
        , _scan(scan)
        , _years(plugin.platform().calendar)
        , _listing(scratch.listing)
        , _plainClips(scratch.files)
    {
        _result.folder = folder;
        _result.problem = _listing.problem();
    }

    EventClips read();

private:
    Text realFolder() const;
    std::string entryPath(std::string_view name) const { return platform::pathJoined(_result.folder, name); }
    void takeLink(std::string_view name);
    void take(const FoundFile& file);
    void explain(const FoundFile& file, const ClipYear& year) const;
    ClipYear yearOf(const FoundFile& file, const std::optional<Date>& recorded);
    std::optional<Date> fileDate(const FoundFile& file) const;
    void addClip(std::string_view name, const FoundFile& file);
    void addPlainClips();

    OBMontaroPlugin& _plugin;
    const EventScan& _scan;
    YearsOfDates _years;
    const platform::FolderListing& _listing;
    std::vector<OBFileOfFolder>& _plainClips; // not yet among the clips
    Text _realFolder {};
    EventClips _result {};
};

EventClips OBMontaroPlugin::ClipReader::read()
{
    if (_listing.empty())
        return std::move(_result);
    _scan.report.found([&] { return findings::clipsFolder(_result.folder, _listing.size()); });
    _realFolder = realFolder();
    _plainClips.reserve(_listing.size());
    const bool isElsewhere = _realFolder != _result.folder;
    std::string path = std::string(_realFolder) + '/';
    const std::size_t folderLength = path.size();
    for (const FolderItem item : _listing) {
        if (!_scan.report.passes(rules::nameIsNotHidden, item, _result.folder))
            continue;
        if (item.kind == ItemKind::symbolicLink) {
            takeLink(item.name);
            continue;
        }
        path.resize(folderLength);
        path.append(item.name);
        if (isElsewhere)
            _scan.report.linkFollowed([&] { return entryPath(item.name); }, path);
        if (_scan.report.passes(rules::isVisible, item, _result.folder)
            && _scan.report.passes(rules::isNoFolder, item, _result.folder))
            take({ item.name, path, item.facts, false, item.kind == ItemKind::file });
    }
    addPlainClips();
    return std::move(_result);
}

/// Where the clips really lie, without a slash at its end: empty for the top of the file system.
Text OBMontaroPlugin::ClipReader::realFolder() const
{
    if (_listing.pathIsReal())
        return _result.folder;
    const std::string path = _listing.otherRealPath().empty()
        ? _plugin.platform().fileSystem.resolvedPath(_result.folder)
        : _listing.otherRealPath();
    return Text(std::string_view(path).substr(path == "/" ? 1 : 0));
}

void OBMontaroPlugin::ClipReader::takeLink(std::string_view name)
{
    const platform::FileSystem& files = _plugin.platform().fileSystem;
    const std::string path = files.resolvedPath(entryPath(name));
    _scan.report.linkFollowed([&] { return entryPath(name); }, path);
    _scan.report.found([&] { return findings::linkedClip(entryPath(name), path, files.exists(path)); });
    FolderItem target;
    target.name = name;
    target.kind = ItemKind::symbolicLink;
    target.flags = files.itemFlags(path);
    if (!_scan.report.passes(rules::targetIsVisible, target, _result.folder)
        || !_scan.report.passes(rules::targetIsNoFolder, target, _result.folder))
        return;
    std::optional<platform::FileFacts> facts;
    if (const auto status = files.status(path))
        facts = { status->creationDate, status->size };
    take({ name, path, facts, true });
}

/// A file among the clips is named and placed as its folder says; any other is a clip by itself.
void OBMontaroPlugin::ClipReader::take(const FoundFile& file)
{
    const std::optional<Date> recorded = _plugin._dateFromExtendedFileAttributeAtPath(file.path);
    if (recorded) {
        addClip(_plugin.platform().calendar.textOfDate(*recorded, _scan.clipNameFormat), file);
    } else if (file.isLinked) {
        addClip(platform::nameWithoutExtension(platform::lastPathComponent(file.path)), file);
    } else {
        OBFileOfFolder& clip = _plainClips.emplace_back();
        clip.name = file.entry;
        clip.isPlainFile = file.isPlainFile;
        clip.facts = file.facts;
    }
    const ClipYear year = yearOf(file, recorded);
    if (_scan.report.isObserved())
        explain(file, year);
}

void OBMontaroPlugin::ClipReader::explain(const FoundFile& file, const ClipYear& year) const
{
    const auto path = [&] { return entryPath(file.entry); };
    _scan.report.foundRecord(path, [&] {
        const platform::Calendar& calendar = _plugin.platform().calendar;
        const std::string date = year.date ? calendar.textOfDate(*year.date, dateFormat) : std::string();
        return findings::yearOfClip(path(), year.year, date, year.isRecorded);
    });
}

/// The year of a clip is that of its recording where that can be a year of a clip, else that of its file. Counts it for
/// the event.
ClipYear OBMontaroPlugin::ClipReader::yearOf(const FoundFile& file, const std::optional<Date>& recorded)
{
    if (recorded) {
        const int year = _plugin.platform().calendar.yearOfDate(*recorded);
        if (year >= 0 && year <= latestRecordedYear) {
            _result.dates.take(year, recorded);
            return { year, recorded, true };
        }
    }
    const std::optional<Date> ofFile = fileDate(file);
    const int year = ofFile ? _years.yearOf(*ofFile) : yearOfNoDate;
    if (recorded)
        _result.dates.take(year, recorded);
    else
        _result.dates.take(year, ofFile);
    return { year, ofFile, false };
}

std::optional<Date> OBMontaroPlugin::ClipReader::fileDate(const FoundFile& file) const
{
    if (file.facts)
        return file.facts->creationDate;
    const platform::Value changed
        = OBMediaObject::marvexProperties(file.path)->valueForKey("kMDItemFSContentChangeDate");
    return changed.date() ? std::optional(*changed.date()) : std::nullopt;
}

void OBMontaroPlugin::ClipReader::addClip(std::string_view name, const FoundFile& file)
{
    addPlainClips();
    const Text path = file.path;
    const OBMediaObjectRef clip = OBMediaObject::initWithMediaType_name(_scan.clipKind->mediaType, name);
    clip->setMediaSourceType(_scan.clipKind->mediaSourceType);
    clip->setSourcePluginIdentifier(_scan.clipKind->sourcePluginIdentifier);
    clip->setPath(path);
    clip->setAttribute_forKey(path, OBMontaroProjectPathKey);
    clip->setIcon(_scan.clipKind->icon);
    clip->setFileFacts(file.facts);
    _result.clips = _result.clips.appending(clip);
    if (_scan.report.isObserved())
        _scan.report.objectMade(entryPath(file.entry), clip);
}

void OBMontaroPlugin::ClipReader::addPlainClips()
{
    const OBMediaObjectList clips = OBMediaObjectBatch::objects(_scan.clipKind, { _realFolder, true }, _plainClips);
    if (_scan.report.isObserved() && _realFolder != _result.folder) {
        for (std::size_t index = 0; index < clips.size(); ++index)
            _scan.report.objectMade(entryPath(_plainClips[index].name), clips[index]);
    }
    _result.clips = _result.clips.appending(clips);
    _plainClips.clear();
}

/// Looks into one folder of `library`, and tells of the event as soon as there is one. Any thread.
ReadEvent OBMontaroPlugin::readEvent(
    const Text& library, const FoundFolder& folder, const EventScan& scan, const EventFound& found)
{
    ClipScratch scratch = scan.scratches->take();
    ReadEvent event = readEventWith(scratch, library, folder, scan, found);
    scan.scratches->giveBack(std::move(scratch));
    return event;
}

/// From the open folder of clips what holds it is nearer than along the whole path. Of what is no event nothing is
/// read.
ReadEvent OBMontaroPlugin::readEventWith(ClipScratch& scratch, const Text& library, const FoundFolder& folder,
    const EventScan& scan, const EventFound& found)
{
    const Text clips = Text::joined(folder.path, "/", clipsFolder);
    platform::ListingRequest request = clipListing;
    request.spare = &scratch.listing;
    scratch.listing = readFolder(clips, request);
    const std::optional<platform::FolderHolder>& holder = scratch.listing.holder();

    FolderItem item;
    item.name = folder.name;
    item.kind = ItemKind::folder;
    item.flags.container = true;
    const bool isEvent = holder ? holder->hasMarker : _isMTEvent(folder.path);
    item.marker = isEvent ? platform::MarkerAnswer::present : platform::MarkerAnswer::absent;
    if (!scan.report.passes(rules::hasEventMarker, item, library))
        return {};
    ReadEvent event { true };
    if (!scratch.listing.empty()) {
        event.group = OBMediaGroup::withFields({ .typeIdentifier = OBMontaroEventGroupTypeIdentifier,
            .name = folder.name,
            .ID = folder.path,
            .parentID = library,
            .path = folder.path,
            .icon = scan.eventIcon,
            .modificationDate = holder ? holder->modificationDate : OBMediaGroup::modDateForFile(folder.path) });
        found(event.group);
    }
    event.clips = ClipReader(*this, scan, clips, scratch).read();
    return event;
}

/// Clips carry no date of their recording yet; whatever reads one goes here.
std::optional<Date> OBMontaroPlugin::_dateFromExtendedFileAttributeAtPath(std::string_view)
{
    return std::nullopt;
}
