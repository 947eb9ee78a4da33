#include "tests/plugin/support/EventMachine.h"
#include "tests/plugin/support/RecordText.h"

#include <doctest/doctest.h>

#include <algorithm>
#include <memory>
#include <set>
#include <thread>

using namespace tests;
using Lines = std::vector<std::string>;

namespace {

constexpr int manyEvents = 20;

std::string nameOfEvent(int number)
{
    return std::string(1, static_cast<char>('A' + number));
}

/// Stops whoever lists the folder whose path ends so, and notes what is listed.
void stopWhenListing(EventMachine& machine, const std::string& end, Stop& stop, Trace& listed)
{
    machine.files.whenListing = [&stop, &listed, end](std::string_view folder) {
        listed.add(std::string(folder));
        if (folder.ends_with(end))
            stop.stopHere();
        return platform::FileProblem::none;
    };
}

} // namespace

TEST_CASE("the search paths of events can be changed and scanned again only when the whole walk has ended")
{
    EventMachine machine;
    for (const char* name : { "A", "B" })
        machine.clip(name, "a.mov", noonOf(2011));
    const auto source = machine.makeSource();
    machine.load(*source);
    for (const char* end :
        { "/home/Movies/Montaro Events", "/A/Original Media", "/B/Original Media", "/Montaro Events" }) {
        CAPTURE(end);
        Stop stop;
        Trace listed;
        Trace prepared;
        stopWhenListing(machine, end, stop, listed);
        machine.volumes.whenListed = [&] { prepared.add("prepared"); };
        std::thread scan([&] { source->_reloadMontaroEvents_updateRootMediaGroup("Montaro", false); });
        REQUIRE(stop.waitUntilReached());
        std::thread preparation([&] { source->_prepareMontaroEventsSearchPaths(); });
        giveOthersTheirTurn();
        CHECK(prepared.take().empty());
        stop.release();
        scan.join();
        preparation.join();
        CHECK(prepared.take().size() == 1);
    }
}

TEST_CASE("while the event search paths are being built a scan waits")
{
    EventMachine machine;
    machine.clip("A", "a.mov", noonOf(2011));
    const auto source = machine.makeSource();
    machine.load(*source);
    Stop preparing;
    Stop nowhere;
    Trace listed;
    stopWhenListing(machine, "no such folder", nowhere, listed);
    machine.volumes.whenListed = [&] { preparing.stopHere(); };
    std::thread preparation([&] { source->_prepareMontaroEventsSearchPaths(); });
    REQUIRE(preparing.waitUntilReached());
    std::thread scan([&] { source->_reloadMontaroEvents_updateRootMediaGroup("Montaro", false); });
    CHECK(waitUntil([&] { return EventMachine::flatNames(*source).empty(); }));
    giveOthersTheirTurn();
    CHECK(listed.take().empty());
    preparing.release();
    preparation.join();
    scan.join();
    CHECK(listed.take().size() == 3);
}

TEST_CASE("during an events scan projects, preferences and the root icon can be had, with several threads at work too")
{
    EventMachine machine;
    for (int number = 0; number < manyEvents; ++number)
        machine.clip(nameOfEvent(number), "a.mov", noonOf(2011));
    machine.projects().project("Project");
    const auto source = machine.makeSource();
    machine.load(*source);
    for (const char* end : { "/home/Movies/Montaro Events", "/D/Original Media" }) {
        CAPTURE(end);
        Stop stop;
        Trace listed;
        stopWhenListing(machine, end, stop, listed);
        std::thread scan([&] { source->_reloadMontaroEvents(); });
        REQUIRE(stop.waitUntilReached());
        source->_prepareMontaroProjectsSearchPaths();
        CHECK(source->_reloadMontaroProjects(false).size() == 1);
        source->_checkMontaroPreferences();
        CHECK(source->rootMediaGroupIcon() != nullptr);
        stop.release();
        scan.join();
    }
}

TEST_CASE("during a scan the flat list holds the events found so far, and not yet the one that is being read")
{
    EventMachine machine;
    for (const char* name : { "A", "B", "C" })
        machine.clip(name, "a.mov", noonOf(2011));
    const auto source = machine.makeSource();
    machine.load(*source);
    Stop stop;
    Trace listed;
    stopWhenListing(machine, "/C/Original Media", stop, listed);
    std::thread scan([&] { source->_reloadMontaroEvents_updateRootMediaGroup("Montaro", false); });
    REQUIRE(stop.waitUntilReached());
    CHECK(EventMachine::flatNames(*source) == "A B");
    stop.release();
    scan.join();
    CHECK(EventMachine::flatNames(*source) == "A B C");
}

TEST_CASE("an event is in the flat list before its clips are read, and not before all clips of those ahead of it are")
{
    for (const int count : { 3, manyEvents }) {
        CAPTURE(count);
        EventMachine machine;
        for (int number = 0; number < count; ++number)
            machine.clip(nameOfEvent(number), "a.mov", noonOf(2011));
        const auto source = machine.makeSource();
        machine.load(*source);
        Stop stop;
        EventMachine::whenDateIsAsked() = [&stop](std::string_view clip) {
            if (clip.ends_with("/C/Original Media/a.mov"))
                stop.stopHere();
        };
        std::thread scan([&] { source->_reloadMontaroEvents_updateRootMediaGroup("Montaro", false); });
        REQUIRE(stop.waitUntilReached());
        CHECK(waitUntil([&] { return EventMachine::flatNames(*source) == "A B C"; }));
        giveOthersTheirTurn();
        CHECK(EventMachine::flatNames(*source) == "A B C");
        stop.release();
        scan.join();
        EventMachine::whenDateIsAsked() = nullptr;
        CHECK(EventMachine::flatNames(*source).size() == static_cast<std::size_t>(2 * count - 1));
    }
}

TEST_CASE("several threads read the clips of events, which show one after the other in listing order all the same")
{
    EventMachine machine;
    for (int number = 0; number < manyEvents; ++number)
        machine.clip(nameOfEvent(number), "a.mov", noonOf(2011));
    const auto source = machine.makeSource();
    const OBMediaGroupRef root = machine.load(*source).rootMediaGroup;
    const std::string all = "A B C D E F G H I J K L M N O P Q R S T";
    CHECK(childNames(*root->childGroups()[0]->childGroups()[0]) == all);

    Stop stop;
    Trace listed;
    stopWhenListing(machine, "/D/Original Media", stop, listed);
    std::thread scan([&] { source->_reloadMontaroEvents_updateRootMediaGroup("Montaro", false); });
    REQUIRE(stop.waitUntilReached());
    CHECK(waitUntil([&] { return listed.lines().size() == manyEvents + 1; }));
    giveOthersTheirTurn();
    const std::string shown = EventMachine::flatNames(*source);
    CHECK(shown.size() <= std::string_view("A B C").size());
    CHECK(all.starts_with(shown));
    stop.release();
    scan.join();
    CHECK(EventMachine::flatNames(*source) == all);
}

TEST_CASE("whoever is told of a scan's decisions is told of them event by event, in listing order")
{
    class Decisions : public OBScanObserver {
    public:
        Trace decided {};
        void scanDecided(const OBScanDecision& decision) override
        {
            if (decision.path.ends_with(".mov"))
                decided.add(decision.path);
        }
    };
    EventMachine machine;
    for (int number = 0; number < manyEvents; ++number)
        machine.clip(nameOfEvent(number), "a.mov", noonOf(2011));
    const auto source = machine.makeSource();
    machine.load(*source);
    const auto decisions = std::make_shared<Decisions>();
    source->setScanObserver(decisions);
    source->_reloadMontaroEvents_updateRootMediaGroup("Montaro", false);
    source->setScanObserver(nullptr);
    Lines paths = decisions->decided.take();
    CHECK(std::is_sorted(paths.begin(), paths.end()));
    CHECK(std::set<std::string>(paths.begin(), paths.end()).size() == manyEvents);
}
