#include "tests/plugin/support/EventMachine.h"
#include "tests/plugin/support/RecordText.h"

#include <doctest/doctest.h>

#include <sys/stat.h>

using namespace tests;
using platform::FileProblem;

namespace {

/// An event as an expected text shows it, with one clip of 2011.
void makeEvent(const LibraryBuilder& library, std::string_view name)
{
    EventMachine::datedClip(LibraryBuilder(library).event(name), "a.mov", noonOf(2011));
}

/// The names of the events of a library that holds what `make` makes, all of 2011.
template <class Make> std::string eventsInLibrary(const Make& make)
{
    EventMachine machine;
    LibraryBuilder library = machine.events();
    make(machine, library);
    const OBMediaGroupList years = machine.library()->childGroups();
    return years.size() == 0 ? "" : years.size() > 1 ? "several years" : childNames(*years[0]);
}

/// The tree in short, and the flat list after a dash, of an event whose folder of clips `make` makes.
template <class Make> std::string eventWithClips(const Make& make)
{
    EventMachine machine;
    BundleBuilder event = machine.events().event("Trip");
    make(machine, event);
    const auto source = machine.makeSource();
    const OBMediaGroupRef root = machine.load(*source).rootMediaGroup;
    return EventMachine::outline(root->childGroups()[0]) + " - " + EventMachine::flatNames(*source);
}

} // namespace

TEST_CASE("events lie in years, years in the library, and clips are the editor's files")
{
    EventMachine machine;
    machine.clip("Trip", "a.mov", noonOf(2010));
    machine.clip("Trip", "b.jpeg", noonOf(2012));
    makeEvent(machine.bootEvents(), "Walk");
    CHECK(machine.libraryText() == R"(
EventLibrary Events ID=Events parent=Montaro icon=eventIcon path=- undated {}
  EventCalendar 2012 ID=2012 parent=Montaro icon=calendarIcon path=- undated {MontaroEventCreationYear=2012}
    Event Trip ID=EVENTS/Trip parent=EVENTS icon=eventIcon path=EVENTS/Trip dated {MontaroEventCreationYear=2012, MontaroEventOldestClipDate=@2010-07-01, MontaroEventNewestClipDate=@2012-07-01}
      * a 3/4 org.ombrix.Montaro path=EVENTS/Trip/Original Media/a.mov icon=smallAppIcon {Project Path=EVENTS/Trip/Original Media/a.mov}
      * b 3/4 org.ombrix.Montaro path=EVENTS/Trip/Original Media/b.jpeg icon=smallAppIcon {Project Path=EVENTS/Trip/Original Media/b.jpeg}
  EventCalendar 2011 ID=2011 parent=Montaro icon=calendarIcon path=- undated {MontaroEventCreationYear=2011}
    Event Walk ID=/Montaro Events/Walk parent=/Montaro Events icon=eventIcon path=/Montaro Events/Walk dated {MontaroEventCreationYear=2011, MontaroEventOldestClipDate=@2011-07-01, MontaroEventNewestClipDate=@2011-07-01}
      * a 3/4 org.ombrix.Montaro path=DISK/boot/Montaro Events/Walk/Original Media/a.mov icon=smallAppIcon {Project Path=DISK/boot/Montaro Events/Walk/Original Media/a.mov}
)");
}

TEST_CASE("oldest first, the same events stand in the years of their oldest clips, the oldest year first")
{
    EventMachine machine;
    machine.arrangeNewestFirst(false);
    machine.clip("Trip", "a.mov", noonOf(2010));
    machine.clip("Trip", "b.mov", noonOf(2012));
    machine.clip("Walk", "c.mov", noonOf(2011));
    const OBMediaGroupRef library = machine.library();
    CHECK(EventMachine::outline(library) == "2010: Trip(a b) | 2011: Walk(c)");
    CHECK(EventMachine::yearAndDates(*library->childGroups()[0]->childGroups()[0]) == "2010, 2010-07-01 to 2012-07-01");
}

TEST_CASE("the library bears the parent that the scan is given, and its years the root's ID")
{
    EventMachine machine;
    makeEvent(machine.events(), "Trip");
    const auto source = machine.makeSource();
    machine.load(*source);
    const OBMediaGroupRef library = source->_reloadMontaroEvents_updateRootMediaGroup("some parent", false);
    CHECK(library->parentID() == "some parent");
    CHECK(library->childGroups()[0]->parentID() == "Montaro");
    CHECK(library->childGroups()[0]->childGroups()[0]->parentID().string() == machine.events().path());
}

TEST_CASE("events stand in the order in which their folder lists them, with names as they are listed")
{
    EventMachine machine;
    machine.arrangeNewestFirst(false);
    machine.files.order = std::greater<>();
    for (const char* name : { "b", "A", "Trip.mtrevent", "c.app" })
        machine.undatedClip(name, "a.mov");
    CHECK(childNames(*machine.library()->childGroups()[0]) == "c.app b Trip.mtrevent A");
}

TEST_CASE("a folder without the marker is no event, and is not entered")
{
    CHECK(eventsInLibrary([](EventMachine&, LibraryBuilder& library) {
        makeEvent(library, "Trip");
        makeEvent(library, "Folder/Inner");
        library.file("Plain/Original Media/a.mov");
        library.file("CurrentVersion.mtrevent");
    }) == "Trip");
}

TEST_CASE("any item of the marker's name makes an event, a link only when it leads somewhere")
{
    const auto make = [](EventMachine& machine, LibraryBuilder& library) {
        for (const char* name : { "A", "B", "C", "D", "E" }) {
            library.file(std::string(name) + "/Original Media/a.mov");
            setModificationDate(library.path(std::string(name) + "/Original Media/a.mov"), noonOf(2011));
        }
        library.folder("A/CurrentVersion.mtrevent");
        mkfifo(library.path("B/CurrentVersion.mtrevent").c_str(), S_IRUSR);
        library.link("C/CurrentVersion.mtrevent", machine.disk.path());
        library.link("D/CurrentVersion.mtrevent", "nowhere");
        library.file("E/currentversion.mtrevent");
    };
    CHECK(eventsInLibrary(make) == "A B C");
}

TEST_CASE("hidden folders and links to events are no events, and packages are")
{
    CHECK(eventsInLibrary([](EventMachine& machine, LibraryBuilder& library) {
        for (const char* name : { "Trip", "Listed", ".dotted", "Pack.app" })
            makeEvent(library, name);
        makeEvent(machine.bootEvents(), "Walk");
        library.link("Linked", machine.bootEvents().path("Walk"));
        library.hiddenNames("", { "Listed" });
    }) == "Pack.app Trip Walk");
}

TEST_CASE("a folder is an event exactly when an item of the marker's name exists in it")
{
    EventMachine machine;
    machine.events().event("Trip");
    machine.events().folder("Plain");
    machine.events().link("Dangling/CurrentVersion.mtrevent", "nowhere");
    const auto source = machine.makeSource();
    CHECK(source->_isMTEvent(machine.events().path("Trip")));
    CHECK_FALSE(source->_isMTEvent(machine.events().path("Plain")));
    CHECK_FALSE(source->_isMTEvent(machine.events().path("Dangling")));
    CHECK_FALSE(source->_isMTEvent(machine.events().path("missing")));
}

TEST_CASE("an event whose folder of clips holds no clip is in the flat list alone, and has no attributes")
{
    EventMachine machine;
    machine.events().event("Trip").movieWithBytes(".a.mov", "clip").movieSubfolder("folder.mov");
    const auto source = machine.makeSource();
    machine.dateFolders();
    const OBMediaGroupRef root = machine.load(*source).rootMediaGroup;
    CHECK(EventMachine::outline(root->childGroups()[0]) == "");
    CHECK(machine.textOf(source->mediaGroups()[0]) == R"(
Event Trip ID=EVENTS/Trip parent=EVENTS icon=eventIcon path=EVENTS/Trip dated {}
)");
}

TEST_CASE("an event whose folder of clips is missing, empty, a file or a link to nothing is nowhere")
{
    CHECK(eventWithClips([](EventMachine&, BundleBuilder&) {}) == " - ");
    CHECK(eventWithClips([](EventMachine&, BundleBuilder& event) { makeFolder(event.moviePath("")); }) == " - ");
    CHECK(eventWithClips([](EventMachine&, BundleBuilder& event) { event.file("Original Media", "x"); }) == " - ");
    CHECK(eventWithClips([](EventMachine&, BundleBuilder& event) {
        makeLink(event.path() + "/Original Media", "nowhere");
    }) == " - ");
}

TEST_CASE("an event whose folder of clips cannot be read is nowhere, and the rest is scanned")
{
    EventMachine machine;
    for (const char* name : { "A", "B", "C" })
        makeEvent(machine.events(), name);
    machine.files.whenListing = [](std::string_view folder) {
        return folder.ends_with("/B/Original Media") ? FileProblem::notPermitted : FileProblem::none;
    };
    const auto source = machine.makeSource();
    const OBMediaGroupRef root = machine.load(*source).rootMediaGroup;
    CHECK(EventMachine::outline(root->childGroups()[0]) == "2011: A(a) C(a)");
    CHECK(EventMachine::flatNames(*source) == "A C");
    CHECK(source->loadProblems().size() == 1);
    CHECK(machine.takeLog().empty());
}

TEST_CASE("a library that is missing, empty or unreadable yields nothing, and the others are read")
{
    EventMachine machine;
    machine.volumes.local.store({ { "/Volumes/Gone", "Gone" }, { "/Volumes/Closed", "Closed" } });
    makeEvent(machine.volumeEvents("Closed"), "Closed");
    makeFolder(machine.events().path());
    makeEvent(machine.bootEvents(), "Walk");
    machine.files.whenListing = [](std::string_view folder) {
        return folder == "/Volumes/Closed/Montaro Events" ? FileProblem::notPermitted : FileProblem::none;
    };
    CHECK(machine.libraryOutline() == "2011: Walk(a)");
}

TEST_CASE("libraries follow one another from home over volumes and boot volume to removable media, each once a listing")
{
    EventMachine machine;
    machine.arrangeNewestFirst(false);
    machine.volumes.local.store({ { "/Volumes/Stick", "Stick" } });
    machine.volumes.removable.store({ { "/Volumes/Stick", "Stick" } });
    machine.undatedClip("Home", "a.mov");
    machine.volumeEvents("Stick").event("Stick").movieLink("a.mov", "/nowhere/a.mov");
    machine.bootEvents().event("Boot").movieLink("a.mov", "/nowhere/a.mov");
    const auto source = machine.makeSource();
    const OBMediaGroupRef root = machine.load(*source).rootMediaGroup;
    const OBMediaGroupList events = root->childGroups()[0]->childGroups()[0]->childGroups();
    CHECK(childNames(*root->childGroups()[0]->childGroups()[0]) == "Home Stick Boot Stick");
    CHECK(EventMachine::flatNames(*source) == "Home Stick Boot Stick");
    CHECK(events[1] != events[3]);
    CHECK(machine.text(events[1]) == machine.text(events[3]));
    CHECK(events[1]->parentID() == "/Volumes/Stick/Montaro Events");
}

TEST_CASE("an event is dated by its folder, with its fractions")
{
    EventMachine machine;
    makeEvent(machine.events(), "Trip");
    setModificationDate(machine.events().path("Trip"), { 1'234'567'890, 123'456'789 });
    const auto source = machine.makeSource();
    machine.load(*source);
    CHECK(source->mediaGroups()[0]->modificationDate() == platform::Date { 1'234'567'890, 123'456'789 });
}

TEST_CASE("the flat list shares its events with the tree, and stands before the projects")
{
    EventMachine machine;
    makeEvent(machine.events(), "Trip");
    machine.projects().project("Project");
    const auto source = machine.makeSource();
    const OBMediaGroupRef root = machine.load(*source).rootMediaGroup;
    CHECK(source->mediaGroups()[0] == root->childGroups()[1]->childGroups()[0]->childGroups()[0]);
    CHECK(source->mediaGroups()[1] == root->childGroups()[0]);
}

TEST_CASE("every scan builds a new tree and a new flat list, and leaves the old ones as they were")
{
    EventMachine machine;
    makeEvent(machine.events(), "Trip");
    const auto source = machine.makeSource();
    const OBMediaGroupRef before = machine.load(*source).rootMediaGroup->childGroups()[0];
    const OBMediaGroupList flatBefore = source->mediaGroups();
    makeEvent(machine.events(), "Walk");
    const OBMediaGroupRef after = source->_reloadMontaroEvents_updateRootMediaGroup("Montaro", false);
    CHECK(EventMachine::outline(before) == "2011: Trip(a)");
    CHECK(EventMachine::outline(after) == "2011: Trip(a) Walk(a)");
    CHECK(flatBefore[0]->name() == "Trip");
    CHECK(source->mediaGroups()[0] != flatBefore[0]);
    CHECK(EventMachine::flatNames(*source) == "Trip Walk");
}

TEST_CASE("an events reload puts a library with clips into the root, and takes it out when the clips are gone")
{
    EventMachine machine;
    makeEvent(machine.events(), "Trip");
    const auto source = machine.makeSource();
    const OBMediaGroupRef root = machine.load(*source).rootMediaGroup;
    makeEvent(machine.events(), "Walk");
    const OBMediaGroupRef library = source->_reloadMontaroEvents();
    CHECK(library == root->childGroups()[0]);
    CHECK(objectNames(root->ownMediaObjects()) == "a a");
    removeItem(machine.events().path());
    CHECK(EventMachine::outline(source->_reloadMontaroEvents()) == "");
    CHECK(childNames(*root) == "");
    CHECK(root->ownMediaObjects().empty());
}

TEST_CASE("a library on a volume that was mounted later is read and watched from the next scan on")
{
    EventMachine machine;
    makeEvent(machine.volumeEvents("Late"), "Trip");
    const auto source = machine.makeSource();
    machine.load(*source);
    const auto watched
        = [&] { return machine.abbreviated(machine.host->pathWatcher().pathsWatchedBy(source.get())).back(); };
    machine.volumes.local.store({ { "/Volumes/Late", "Late" } });
    CHECK(watched() == "/Montaro Events");
    machine.tellOfVolume("/Volumes/Late");
    const OBMediaGroupRef library = source->_reloadMontaroEvents_updateRootMediaGroup("Montaro", false);
    CHECK(EventMachine::outline(library) == "2011: Trip(a)");
    CHECK(watched() == "/Volumes/Late/Montaro Events");
}
