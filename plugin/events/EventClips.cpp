// The clips of one event, and the years that they give it.
//
// The one surprise: every file is a clip, whatever its extension; and a link becomes the file that it leads to, named
// and placed as that is.

#include "plugin/MontaroConstants.h"
#include "plugin/events/EventScan.h"

#include "host/OBConstants.h"
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

/// Names and flags of the entries, and what a clip's list and an event's year need of each file.
constexpr platform::ListingRequest clipListing { .fileFacts = true };

/// The years of dates. Clips of one event were mostly shot in one year, so a date between two that were asked for needs
/// no calendar.
class YearsOfDates {
public:
    explicit YearsOfDates(const platform::Calendar& calendar)
        : _calendar(calendar)
    {
    }

    int yearOf(const Date& date)
    {
        if (_first <= date && date <= _last)
            return _year;
        const int year = _calendar.yearOfDate(date);
        if (year != _year || _last < _first) {
            _year = year;
            _first = _last = date;
        }
        _first = std::min(_first, date);
        _last = std::max(_last, date);
        return year;
    }

private:
    const platform::Calendar& _calendar;
    int _year = 0;
    Date _first { 1, 0 };
    Date _last { 0, 0 }; // before the first: no date was asked for yet
};

/// Where a file lies, and what is known of it.
struct FoundFile {
    std::string_view path {};
    const std::optional<platform::FileFacts>& facts;
};

} // namespace

/// Reads the folder of one event's clips, in listing order.
class OBMontaroPlugin::ClipReader {
public:
    ClipReader(OBMontaroPlugin& plugin, const EventScan& scan, const Text& folder)
        : _plugin(plugin)
        , _scan(scan)
        , _years(plugin.platform().calendar)
        , _listing(plugin.readFolder(folder, clipListing))
    {
        _result.folder = folder;
        _result.problem = _listing.problem();
        _result.hasEntries = !_listing.empty();
    }

    EventClips read();

private:
    Text realFolder() const;
    void take(const FolderItem& item);
    void takeLink(const FolderItem& link);
    void takeRecorded(std::string_view path, const Date& recorded);
    bool isClip(const FolderItem& item) const;
    std::optional<Date> fileDate(const FoundFile& file) const;
    void countYear(const std::optional<Date>& recorded, const FoundFile& file);
    void addClip(std::string_view name, std::string_view path);
    void addPlainClips();

    OBMontaroPlugin& _plugin;
    const EventScan& _scan;
    YearsOfDates _years;
    const platform::FolderListing _listing;
    Text _realFolder {};
    std::string _path {}; // of the file at hand; its folder stays
    std::vector<OBFileOfFolder> _plainClips {}; // not yet among the clips
    EventClips _result {};
};

EventClips OBMontaroPlugin::ClipReader::read()
{
    if (!_result.hasEntries)
        return std::move(_result);
    _realFolder = realFolder();
    _path = _realFolder.view();
    _plainClips.reserve(_listing.size());
    for (const FolderItem item : _listing) {
        if (!_scan.report.passes(ScanRules::nameIsNotHidden, item, _result.folder))
            continue;
        if (item.kind == ItemKind::symbolicLink)
            takeLink(item);
        else if (isClip(item))
            take(item);
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

bool OBMontaroPlugin::ClipReader::isClip(const FolderItem& item) const
{
    return _scan.report.passes(ScanRules::isVisible, item, _result.folder)
        && _scan.report.passes(ScanRules::isNoFolder, item, _result.folder);
}

void OBMontaroPlugin::ClipReader::take(const FolderItem& item)
{
    _path.resize(_realFolder.size());
    _path.append(1, '/').append(item.name);
    const FoundFile file { _path, item.facts };
    const std::optional<Date> recorded = _plugin._dateFromExtendedFileAttributeAtPath(_path);
    if (recorded)
        addClip(_plugin.platform().calendar.textOfDate(*recorded, _scan.clipNameFormat), _path);
    else
        _plainClips.push_back({ item.name, item.kind == ItemKind::file });
    countYear(recorded, file);
}

void OBMontaroPlugin::ClipReader::takeLink(const FolderItem& link)
{
    const platform::FileSystem& files = _plugin.platform().fileSystem;
    const std::string path = files.resolvedPath(platform::pathJoined(_result.folder, link.name));
    FolderItem target;
    target.name = link.name;
    target.flags = files.itemFlags(path);
    if (!isClip(target))
        return;
    std::optional<platform::FileFacts> facts;
    if (const auto status = files.status(path))
        facts = { status->creationDate, status->size };
    const std::optional<Date> recorded = _plugin._dateFromExtendedFileAttributeAtPath(path);
    addClip(recorded ? _plugin.platform().calendar.textOfDate(*recorded, _scan.clipNameFormat)
                     : std::string(platform::nameWithoutExtension(platform::lastPathComponent(path))),
        path);
    countYear(recorded, { path, facts });
}

std::optional<Date> OBMontaroPlugin::ClipReader::fileDate(const FoundFile& file) const
{
    if (file.facts)
        return file.facts->creationDate;
    const platform::Value changed
        = OBMediaObject::marvexProperties(file.path)->valueForKey("kMDItemFSContentChangeDate");
    return changed.date() ? std::optional(*changed.date()) : std::nullopt;
}

/// The year of a clip is that of its recording where that can be a year of a clip, else that of its file.
void OBMontaroPlugin::ClipReader::countYear(const std::optional<Date>& recorded, const FoundFile& file)
{
    if (recorded) {
        const int year = _plugin.platform().calendar.yearOfDate(*recorded);
        if (year >= 0 && year <= latestRecordedYear) {
            _result.dates.take(year, recorded);
            return;
        }
    }
    const std::optional<Date> date = fileDate(file);
    _result.dates.take(date ? _years.yearOf(*date) : yearOfNoDate, recorded ? recorded : date);
}

/// A clip that does not bear the name of a file of this folder.
void OBMontaroPlugin::ClipReader::addClip(std::string_view name, std::string_view path)
{
    addPlainClips();
    const OBMediaObjectRef clip = OBMediaObject::initWithMediaType_name(_scan.clipKind->mediaType, name);
    clip->setMediaSourceType(_scan.clipKind->mediaSourceType);
    clip->setSourcePluginIdentifier(_scan.clipKind->sourcePluginIdentifier);
    clip->setPath(path);
    clip->setAttribute_forKey(path, OBMontaroProjectPathKey);
    clip->setIcon(_scan.clipKind->icon);
    _result.clips = _result.clips.appending(clip);
}

void OBMontaroPlugin::ClipReader::addPlainClips()
{
    _result.clips
        = _result.clips.appending(OBMediaObjectBatch::objects(_scan.clipKind, { _realFolder, true }, _plainClips));
    _plainClips.clear();
}

EventClips OBMontaroPlugin::clipsOfEvent(const Text& event, const EventScan& scan)
{
    return ClipReader(*this, scan, Text::joined(event, "/", clipsFolder)).read();
}

/// Clips carry no date of their recording yet; whatever reads one goes here.
std::optional<Date> OBMontaroPlugin::_dateFromExtendedFileAttributeAtPath(std::string_view)
{
    return std::nullopt;
}
