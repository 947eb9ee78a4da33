#include "tests/plugin/support/EventMachine.h"
#include "tests/plugin/support/RecordText.h"

#include <doctest/doctest.h>

using namespace tests;

namespace {

/// A clip of the event that the tests here look at: recorded at a date, else the file's date, else undated.
struct MadeClip {
    std::optional<platform::Date> file {};
    std::optional<platform::Date> recorded {};
};

/// Year and dates that the event got from these clips, listed in this order.
std::string gotFrom(const std::vector<MadeClip>& clips, bool newestFirst)
{
    EventMachine machine;
    machine.arrangeNewestFirst(newestFirst);
    char name[] = "a.mov";
    for (const MadeClip& clip : clips) {
        if (clip.file)
            machine.clip("Trip", name, *clip.file);
        else
            machine.undatedClip("Trip", name);
        if (clip.recorded)
            EventMachine::recordedDates()[name] = *clip.recorded;
        ++name[0];
    }
    return EventMachine::yearAndDates(*machine.library()->childGroups()[0]->childGroups()[0]);
}

std::string oldestFirst(const std::vector<MadeClip>& clips)
{
    return gotFrom(clips, false);
}

std::string newestFirst(const std::vector<MadeClip>& clips)
{
    return gotFrom(clips, true);
}

MadeClip file(int year, unsigned month = 7)
{
    return { noonOf(year, month), {} };
}

MadeClip recorded(int year)
{
    return { noonOf(2011), noonOf(year) };
}

const MadeClip undated {};

} // namespace

TEST_CASE("an event counts to the year of its newest clip or of its oldest, as the editor's user arranges events")
{
    const std::vector<MadeClip> clips { file(2011), file(2010), file(2012) };
    CHECK(newestFirst(clips) == "2012, 2010-07-01 to 2012-07-01");
    CHECK(oldestFirst(clips) == "2010, 2010-07-01 to 2012-07-01");
}

TEST_CASE("within the oldest and the newest year the first clip listed gives the date, whatever its day")
{
    CHECK(oldestFirst({ file(2011, 3), file(2011, 1), file(2011, 12) }) == "2011, 2011-03-01 to 2011-03-01");
    CHECK(newestFirst({ file(2011, 3), file(2012, 5), file(2011, 1), file(2012, 4), file(2012, 6) })
        == "2012, 2011-03-01 to 2012-05-01");
}

TEST_CASE("a clip without a date counts to the year before 0, oldest first, and lends its event no oldest date")
{
    CHECK(oldestFirst({ file(2011), undated, file(2012) }) == "-1, 2012-07-01 to 2012-07-01");
    CHECK(newestFirst({ file(2011), undated, file(2012) }) == "2012, 2012-07-01 to 2012-07-01");
    CHECK(oldestFirst({ undated, undated }) == "-1, - to -");
    CHECK(oldestFirst({ MadeClip { {}, noonOf(10'000) } }) == "-1, 10000-07-01 to -");
}

TEST_CASE("an event whose clips all lack dates has no attributes, newest first")
{
    EventMachine machine;
    machine.undatedClip("Trip", "a.mov");
    machine.events().event("Trip").movieLink("circle.mov", "circle.mov");
    CHECK(machine.libraryText() == R"(
EventLibrary Events ID=Events parent=Montaro icon=eventIcon path=- undated {}
  EventCalendar 0 ID=0 parent=Montaro icon=calendarIcon path=- undated {}
    Event Trip ID=EVENTS/Trip parent=EVENTS icon=eventIcon path=EVENTS/Trip dated {}
      * a 3/4 org.ombrix.Montaro path=/nowhere/a.mov real=- icon=smallAppIcon {Project Path=/nowhere/a.mov}
      * circle 3/4 org.ombrix.Montaro path=EVENTS/Trip/Original Media/circle.mov real=- icon=smallAppIcon {Project Path=EVENTS/Trip/Original Media/circle.mov}
)");
}

TEST_CASE("oldest first, such an event lies in the year before 0 with nothing but the year")
{
    EventMachine machine;
    machine.arrangeNewestFirst(false);
    machine.undatedClip("Trip", "a.mov");
    CHECK(machine.libraryText() == R"(
EventLibrary Events ID=Events parent=Montaro icon=eventIcon path=- undated {}
  EventCalendar -1 ID=-1 parent=Montaro icon=calendarIcon path=- undated {MontaroEventCreationYear=-1}
    Event Trip ID=EVENTS/Trip parent=EVENTS icon=eventIcon path=EVENTS/Trip dated {MontaroEventCreationYear=-1}
      * a 3/4 org.ombrix.Montaro path=/nowhere/a.mov real=- icon=smallAppIcon {Project Path=/nowhere/a.mov}
)");
}

TEST_CASE("newest first, a year from 1 on counts, and without one there are neither year nor dates")
{
    CHECK(newestFirst({ recorded(1) }) == "1, 1-07-01 to 1-07-01");
    CHECK(newestFirst({ recorded(0) }) == "-, - to -");
    CHECK(newestFirst({ recorded(9999) }) == "9999, 9999-07-01 to 9999-07-01");
}

TEST_CASE("oldest first, a year up to 9998 counts, and without one there are neither year nor dates")
{
    CHECK(oldestFirst({ recorded(9998) }) == "9998, 9998-07-01 to 9998-07-01");
    CHECK(oldestFirst({ recorded(9999) }) == "-, - to -");
    CHECK(oldestFirst({ recorded(0) }) == "0, 0-07-01 to -");
    CHECK(oldestFirst({ recorded(9999), recorded(0) }) == "0, 0-07-01 to 9999-07-01");
}

TEST_CASE("newest first, an event of the year 9999 alone has its newest date for its oldest")
{
    CHECK(newestFirst({ recorded(9999) }) == "9999, 9999-07-01 to 9999-07-01");
    CHECK(newestFirst({ recorded(9999), undated }) == "9999, 9999-07-01 to 9999-07-01");
}

TEST_CASE("events without a year get a group each, called 0, and events of one year share theirs")
{
    EventMachine machine;
    machine.undatedClip("A", "a.mov");
    machine.clip("B", "b.mov", noonOf(2011));
    machine.undatedClip("C", "c.mov");
    machine.clip("D", "d.mov", noonOf(2011));
    CHECK(machine.libraryOutline() == "0: A(a) | 2011: B(b) D(d) | 0: C(c)");
}

TEST_CASE("events of the year 0 share a group, which events without a year do not join")
{
    EventMachine machine;
    machine.arrangeNewestFirst(false);
    for (const char* name : { "A", "B", "C", "D" })
        machine.clip(name, std::string(name) + ".mov", noonOf(2011));
    EventMachine::recordedDates()["A.mov"] = noonOf(0);
    EventMachine::recordedDates()["B.mov"] = noonOf(9999);
    EventMachine::recordedDates()["C.mov"] = noonOf(9999);
    EventMachine::recordedDates()["D.mov"] = noonOf(0, 8);
    const OBMediaGroupList years = machine.library()->childGroups();
    REQUIRE(years.size() == 3);
    CHECK(childNames(*years[0]) == "A D");
    CHECK(years[0]->attributes().size() == 1);
    CHECK(childNames(*years[1]) == "B");
    CHECK(years[1]->attributes().empty());
    CHECK(childNames(*years[2]) == "C");
}

TEST_CASE("events of two libraries in one year share its group")
{
    EventMachine machine;
    machine.clip("Trip", "a.mov", noonOf(2011));
    EventMachine::datedClip(machine.bootEvents().event("Walk"), "b.mov", noonOf(2011));
    CHECK(machine.libraryOutline() == "2011: Trip(a) Walk(b)");
}

TEST_CASE("years stand in the order in which they first occur among the sorted events, not in their own")
{
    EventMachine machine;
    machine.clip("A", "a.mov", noonOf(2009));
    machine.undatedClip("B", "b.mov");
    machine.clip("C", "c.mov", noonOf(2011));
    machine.clip("D", "d.mov", noonOf(2009));
    CHECK(machine.libraryOutline() == "2011: C(c) | 2009: A(a) D(d) | 0: B(b)");
}

TEST_CASE("the year of a date is that of the calendar where the user lives")
{
    EventMachine machine;
    for (const platform::Date date : { platform::Date { 1'293'800'000, 0 }, platform::Date { 1'293'930'000, 0 } }) {
        machine.clip("Trip", "a.mov", date);
        CHECK(
            machine.library()->childGroups()[0]->name().string() == std::to_string(machine.calendar.yearOfDate(date)));
    }
}

TEST_CASE("each event takes the choice of order that holds when its own clips have been read")
{
    EventMachine machine;
    for (const char* event : { "A", "B" }) {
        machine.clip(event, "a.mov", noonOf(2010));
        machine.clip(event, "b.mov", noonOf(2012));
    }
    const auto source = machine.makeSource();
    machine.files.whenListing = [&](std::string_view folder) {
        if (folder.ends_with("/B/Original Media")) {
            machine.arrangeNewestFirst(false);
            source->_checkMontaroPreferences();
        }
        return platform::FileProblem::none;
    };
    const OBMediaGroupRef root = machine.load(*source).rootMediaGroup;
    CHECK(EventMachine::outline(root->childGroups()[0]) == "2010: B(a b) | 2012: A(a b)");
}

TEST_CASE("a choice of order that was read again holds from the next scan on, and starts none")
{
    EventMachine machine;
    machine.clip("A", "a.mov", noonOf(2010));
    machine.clip("B", "b.mov", noonOf(2012));
    const auto source = machine.makeSource();
    const OBMediaGroupRef root = machine.load(*source).rootMediaGroup;
    machine.arrangeNewestFirst(false);
    source->_checkMontaroPreferences();
    machine.waitForThreads();
    CHECK(EventMachine::outline(root->childGroups()[0]) == "2012: B(b) | 2010: A(a)");
    CHECK(EventMachine::outline(source->_reloadMontaroEvents()) == "2010: A(a) | 2012: B(b)");
}
