#include "tests/plugin/support/EventMachine.h"
#include "tests/plugin/support/RecordText.h"

#include <doctest/doctest.h>

#include <chrono>
#include <thread>

using namespace tests;
using Lines = std::vector<std::string>;

namespace {

/// Events A, B and C in the home's library and D in that of the boot volume, all of 2011; loaded once, with a further
/// load that is held, so that a cancel stands once it is asked for.
struct CancelledMachine : EventMachine {
    CancelledMachine()
    {
        for (const char* name : { "A", "B", "C" })
            clip(name, "a.mov", noonOf(2011));
        datedClip(bootEvents().event("D"), "a.mov", noonOf(2011));
        load(*source);
        held = std::make_unique<HeldLoad>(*this, *source);
    }
    ~CancelledMachine()
    {
        files.whenListing = nullptr;
        held = nullptr;
        source = nullptr;
        waitForThreads();
    }

    /// Asks for a cancel when the folder whose path ends so is listed, and notes what is listed.
    void cancelWhenListing(const std::string& end)
    {
        files.whenListing = [this, end](std::string_view folder) {
            listed.add(abbreviated(std::string(folder)));
            if (folder.ends_with(end))
                source->cancelLoad();
            return platform::FileProblem::none;
        };
    }

    std::shared_ptr<OBMontaroPlugin> source = makeSource();
    std::unique_ptr<HeldLoad> held {};
    Trace listed {};
};

/// What is below an events library, years or not.
std::size_t eventsBelow(const OBMediaGroupRef& library)
{
    std::size_t count = 0;
    for (const OBMediaGroupRef& year : library->childGroups())
        count += year->childGroups().size();
    return count;
}

/// What a reload answers that another thread cancels a few turns after it got the lock of the walk.
OBMediaGroupRef reloadCancelledAfterItsWalk(EventMachine& machine, OBMontaroPlugin& source, int turns)
{
    Stop walk;
    machine.files.whenListing = [&](std::string_view) {
        walk.stopHere();
        return platform::FileProblem::none;
    };
    machine.volumes.whenListed = [&] {
        for (int turn = 0; turn < turns; ++turn)
            std::this_thread::yield();
        source.cancelLoad();
    };
    std::thread canceller([&] {
        walk.waitUntilReached();
        walk.release();
        source._prepareMontaroEventsSearchPaths();
    });
    OBMediaGroupRef library = source._reloadMontaroEvents();
    canceller.join();
    machine.files.whenListing = nullptr;
    machine.volumes.whenListed = nullptr;
    return library;
}

} // namespace

TEST_CASE("a cancel lets the library at work be read to its end, reads no further one and answers nothing")
{
    CancelledMachine machine;
    machine.host->pathWatcher().removeObserver(machine.source.get());
    machine.cancelWhenListing("/A/Original Media");
    const OBMediaGroupRef root = machine.source->rootMediaGroup();
    const OBMediaGroupRef before = root->childGroups()[0];
    CHECK(machine.source->_reloadMontaroEvents() == nullptr);
    const std::string library = "DISK/home/Movies/Montaro Events";
    CHECK(machine.listed.take()
        == Lines {
            library, library + "/A/Original Media", library + "/B/Original Media", library + "/C/Original Media" });
    CHECK(EventMachine::flatNames(*machine.source) == "A B C");
    CHECK(root->childGroups().elements() == std::vector<OBMediaGroupRef> { before });
    CHECK(objectNames(root->ownMediaObjects()) == "a a a a");
    CHECK(machine.abbreviated(machine.host->pathWatcher().pathsWatchedBy(machine.source.get())) == Lines { library });
}

TEST_CASE("a cancel during the last library answers nothing too, and the flat list keeps what was found")
{
    CancelledMachine machine;
    machine.cancelWhenListing("/D/Original Media");
    CHECK(machine.source->_reloadMontaroEvents() == nullptr);
    CHECK(EventMachine::flatNames(*machine.source) == "A B C D");
    CHECK(childNames(*machine.source->rootMediaGroup()) == "Events");
}

TEST_CASE("with a cancel pending a scan reads nothing and empties the flat list")
{
    CancelledMachine machine;
    machine.cancelWhenListing("nothing");
    machine.source->cancelLoad();
    CHECK(machine.source->_reloadMontaroEvents() == nullptr);
    CHECK(machine.listed.take().empty());
    CHECK(EventMachine::flatNames(*machine.source) == "");
}

TEST_CASE("a load that is cancelled while it reads events has a root without them")
{
    EventMachine machine;
    machine.clip("A", "a.mov", noonOf(2011));
    machine.projects().project("Project");
    const auto source = machine.makeSource();
    machine.files.whenListing = [&](std::string_view folder) {
        if (folder.ends_with("/A/Original Media"))
            source->cancelLoad();
        return platform::FileProblem::none;
    };
    const OBLoadResult result = machine.load(*source);
    CHECK(result.outcome == OBLoadOutcome::cancelled);
    CHECK(childNames(*result.rootMediaGroup) == "Project");
    CHECK(EventMachine::flatNames(*source) == "A");
}

// Nothing is asked of the machine while events are grouped, so the cancel comes from a thread that waits for the lock
// of the walk. It may come too early or too late, and is then tried again. Long names that differ at their ends make
// sorting slow enough to be met.
TEST_CASE("a cancel while events are grouped answers what was grouped, and leaves the root alone")
{
    constexpr std::size_t timesListed = 100;
    EventMachine machine;
    for (const char* name : { "A", "B", "C", "D", "E", "F" }) {
        const std::string longName = std::string(200, 'x') + name;
        EventMachine::datedClip(machine.volumeEvents("Stick").event(longName), "a.mov", noonOf(2011));
    }
    machine.volumes.local.store(std::vector<ScriptedVolumes::Volume>(timesListed, { "/Volumes/Stick", "Stick" }));
    const auto source = machine.makeSource();
    const OBMediaGroupRef before = machine.load(*source).rootMediaGroup->childGroups()[0];
    const std::size_t all = eventsBelow(before);
    REQUIRE(all == timesListed * 6);

    bool isMet = false;
    const auto end = std::chrono::steady_clock::now() + longestWait;
    for (int attempt = 0; !isMet && std::chrono::steady_clock::now() < end; ++attempt) {
        const HeldLoad held(machine, *source);
        const OBMediaGroupRef root = source->rootMediaGroup();
        root->setChildGroups(OBMediaGroupList({ before }));
        root->setMediaObjects({});
        const OBMediaGroupRef library = reloadCancelledAfterItsWalk(machine, *source, attempt * 8 % 256);
        isMet = library && eventsBelow(library) < all;
        if (isMet) {
            CHECK(root->childGroups().elements() == std::vector<OBMediaGroupRef> { before });
            CHECK(root->ownMediaObjects().empty());
            CHECK(source->mediaGroups().size() >= all);
        }
    }
    CHECK(isMet);
}
