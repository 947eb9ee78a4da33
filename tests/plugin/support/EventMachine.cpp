#include "tests/plugin/support/EventMachine.h"

#include "host/OBConstants.h"
#include "host/OBMediaManagerClass.h"
#include "platform/PathText.h"
#include "plugin/MontaroConstants.h"
#include "tests/plugin/support/RecordText.h"

#include <charconv>
#include <chrono>
#include <filesystem>

namespace tests {

namespace {

    using platform::Date;
    using platform::Value;

    class RecordedSource final : public OBMontaroPlugin {
    public:
        using OBMontaroPlugin::OBMontaroPlugin;

        std::optional<Date> _dateFromExtendedFileAttributeAtPath(std::string_view path) override
        {
            if (EventMachine::whenDateIsAsked())
                EventMachine::whenDateIsAsked()(path);
            const auto known = EventMachine::recordedDates().find(platform::lastPathComponent(path));
            return known == EventMachine::recordedDates().end() ? std::nullopt : std::optional(known->second);
        }
    };

    class RecordedSourceClass final : public OBMediaManagerClass {
    public:
        std::unique_ptr<OBMediaManager> alloc(const OBManagerContext& context) const override
        {
            return std::make_unique<RecordedSource>(context);
        }
    };

    const OBMediaManagerClass* recordedSourceClass()
    {
        static const RecordedSourceClass sourceClass;
        return &sourceClass;
    }

    std::string dayOf(std::int64_t seconds)
    {
        using namespace std::chrono;
        const year_month_day day(floor<days>(sys_seconds(std::chrono::seconds(seconds))));
        const auto twoDigits = [](unsigned number) { return (number < 10 ? "-0" : "-") + std::to_string(number); };
        return std::to_string(static_cast<int>(day.year())) + twoDigits(static_cast<unsigned>(day.month()))
            + twoDigits(static_cast<unsigned>(day.day()));
    }

    /// `text` with the day in place of each "@SECONDS".
    std::string withDays(std::string_view text)
    {
        std::string result;
        while (!text.empty()) {
            const std::size_t length = text.find('@') + 1;
            result += text.substr(0, length == 0 ? text.size() : length);
            text.remove_prefix(length == 0 ? text.size() : length);
            std::int64_t seconds = 0;
            const char* const end = std::from_chars(text.data(), text.data() + text.size(), seconds).ptr;
            if (end != text.data())
                result += dayOf(seconds);
            text.remove_prefix(static_cast<std::size_t>(end - text.data()));
        }
        return result;
    }

    std::string dayOfValue(const Value& value)
    {
        return value.date() ? dayOf(value.date()->seconds) : "-";
    }

} // namespace

Date noonOf(int year, unsigned month, unsigned day)
{
    using namespace std::chrono;
    const sys_days date = std::chrono::year(year) / std::chrono::month(month) / std::chrono::day(day);
    return { duration_cast<seconds>((date + 12h).time_since_epoch()).count(), 0 };
}

EventMachine::EventMachine()
{
    bundles.linkedEntryPoint = reinterpret_cast<void*>(&recordedSourceClass);
}

EventMachine::~EventMachine()
{
    waitForThreads();
    recordedDates().clear();
}

LibraryBuilder EventMachine::volumeEvents(const std::string& name) const
{
    return LibraryBuilder(disk.path("Volumes/" + name + "/Montaro Events"));
}

void EventMachine::clip(std::string_view event, std::string_view name, Date date) const
{
    datedClip(events().event(event), name, date);
}

void EventMachine::datedClip(BundleBuilder event, std::string_view name, Date date)
{
    event.movieWithBytes(name, "clip");
    setModificationDate(event.moviePath(name), date);
}

void EventMachine::undatedClip(std::string_view event, std::string_view name) const
{
    events().event(event).movieLink(name, "/nowhere/" + std::string(name));
}

void EventMachine::dateFolders() const
{
    for (const auto& entry : std::filesystem::recursive_directory_iterator(disk.path())) {
        if (entry.symlink_status().type() == std::filesystem::file_type::directory)
            setModificationDate(entry.path().string(), dateOfEverything);
    }
}

void EventMachine::arrangeNewestFirst(bool isNewestFirst)
{
    preferences.set(
        MontaroBundleIdentifier, "ZREventLibraryModule.arrangeEventsByMostRecent", platform::Value(isNewestFirst));
}

OBMediaGroupRef EventMachine::library()
{
    dateFolders();
    const auto source = makeSource();
    const OBMediaGroupList children = load(*source).rootMediaGroup->childGroups();
    return children[children.size() - 1];
}

std::string EventMachine::libraryText()
{
    return textOf(library());
}

std::string EventMachine::textOf(const OBMediaGroupRef& group) const
{
    std::string lines = withDays(text(group));
    const std::string folder = "DISK/home/Movies/Montaro Events";
    for (std::size_t at = lines.find(folder); at != std::string::npos; at = lines.find(folder, at))
        lines.replace(at, folder.size(), "EVENTS");
    return lines;
}

std::string EventMachine::outline(const OBMediaGroupRef& library)
{
    if (!library)
        return "no library";
    std::string text;
    for (const OBMediaGroupRef& year : library->childGroups()) {
        text += (text.empty() ? "" : " | ") + year->name().string() + ":";
        for (const OBMediaGroupRef& event : year->childGroups())
            text += " " + event->name().string() + "(" + objectNames(event->ownMediaObjects()) + ")";
    }
    return text;
}

std::string EventMachine::yearAndDates(const OBMediaGroup& event)
{
    const Value year = event.attributeForKey(OBMontaroEventCreationYear);
    return (year.integer() ? std::to_string(*year.integer()) : "-") + ", "
        + dayOfValue(event.attributeForKey(OBMontaroEventOldestClipDate)) + " to "
        + dayOfValue(event.attributeForKey(OBMontaroEventNewestClipDate));
}

std::string EventMachine::flatNames(OBMontaroPlugin& source)
{
    std::string names;
    for (const OBMediaGroupRef& group : source.mediaGroups()) {
        if (group->typeIdentifier() == OBMontaroEventGroupTypeIdentifier)
            names += (names.empty() ? "" : " ") + group->name().string();
    }
    return names;
}

std::function<void(std::string_view)>& EventMachine::whenDateIsAsked()
{
    static std::function<void(std::string_view)> call;
    return call;
}

std::map<std::string, Date, std::less<>>& EventMachine::recordedDates()
{
    static std::map<std::string, Date, std::less<>> dates;
    return dates;
}

} // namespace tests
