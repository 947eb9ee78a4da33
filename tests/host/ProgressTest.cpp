#include "tests/host/TestHost.h"

#include <doctest/doctest.h>

#include <chrono>
#include <cstdint>
#include <mutex>
#include <string>
#include <vector>

using namespace tests;
using namespace std::chrono_literals;

namespace {

/// The reports of progress that came.
class Reports {
public:
    OBManagerCallbacks callbacks()
    {
        OBManagerCallbacks result;
        result.progressed = [this](const OBLoadProgress& progress) {
            std::lock_guard guard(_lock);
            _reports.push_back(progress);
        };
        return result;
    }
    std::vector<OBLoadProgress> all() const
    {
        std::lock_guard guard(_lock);
        return _reports;
    }

private:
    mutable std::mutex _lock;
    std::vector<OBLoadProgress> _reports; // under _lock
};

} // namespace

TEST_CASE("before the first load there is no progress")
{
    TestHost test;
    const auto manager = test.manager();
    const OBLoadProgress progress = manager->loadProgress();
    CHECK_FALSE(progress.isLoading);
    CHECK(progress.foldersDone == 0);
    CHECK(progress.pathAtWork.isAbsent());
}

TEST_CASE("progress counts what a scan notes, and names the path at work since when")
{
    TestHost test;
    test.machine.bare.clock.advance(5s);
    const std::string folder = test.machine.folder.folder("library");
    test.script->gate.close();
    test.script->whenPerforming = [&](ScriptedManager& manager) {
        manager.listFolder(platform::Text(folder), {});
        manager.listFolder("/nothing at all", {});
        manager.noteFoldersDone(3);
        manager.noteItemsFound(7);
        manager.noteItemsSkipped(4);
        test.machine.bare.clock.advance(1s);
        manager.notePathAtWork("/at/work");
        test.machine.bare.clock.advance(1s);
    };
    const auto manager = test.manager();
    const Request request(*manager);
    CHECK(test.script->gate.waitForArrivals(1));
    const OBLoadProgress progress = manager->loadProgress();
    CHECK(progress.isLoading);
    CHECK(progress.foldersDone == 5);
    CHECK(progress.itemsFound == 7);
    CHECK(progress.itemsSkipped == 4);
    CHECK(progress.pathAtWork == "/at/work");
    CHECK(progress.pathAtWorkSince == 6s);
    test.script->gate.open();
    request.answer();
    const OBLoadProgress after = manager->loadProgress();
    CHECK_FALSE(after.isLoading);
    CHECK(after.pathAtWork.isAbsent());
    CHECK(after.foldersDone == 5);
    CHECK(after.itemsFound == 7);
}

TEST_CASE("each load counts from nothing")
{
    TestHost test;
    test.script->whenPerforming = [](ScriptedManager& manager) {
        manager.noteItemsFound(1);
        manager.noteItemsSkipped(2);
        manager.listFolder("/nothing at all", {});
    };
    const auto manager = test.manager();
    for (int load = 0; load < 2; ++load) {
        manager->setNeedsReload(true);
        Request(*manager).answer();
        CHECK(manager->loadProgress().foldersDone == 1);
        CHECK(manager->loadProgress().itemsFound == 1);
        CHECK(manager->loadProgress().itemsSkipped == 2);
    }
}

TEST_CASE("the path at work is named while its folder is being listed")
{
    TestHost test;
    Gate listing;
    listing.close();
    test.machine.files.whenListing = [&listing](std::string_view folder) {
        if (folder == "/slow")
            listing.pass();
        return platform::FileProblem::none;
    };
    test.script->whenPerforming = [](ScriptedManager& manager) { manager.listFolder("/slow", {}); };
    const auto manager = test.manager();
    const Request request(*manager);
    CHECK(listing.waitForArrivals(1));
    CHECK(manager->loadProgress().pathAtWork == "/slow");
    CHECK(manager->loadProgress().foldersDone == 0);
    listing.open();
    request.answer();
}

TEST_CASE("progress is told at most ten times a second")
{
    TestHost test;
    test.machine.bare.clock.advance(1h);
    test.script->whenPerforming = [&](ScriptedManager& manager) {
        for (int folder = 0; folder < 1000; ++folder) {
            manager.listFolder("/nothing at all", {});
            test.machine.bare.clock.advance(1ms);
        }
    };
    const auto manager = test.manager();
    Reports reports;
    const OBObservation listening = manager->observe(inPlace(), reports.callbacks());
    Request(*manager).answer();
    CHECK(test.host().waitForThreads(longestWait));
    const std::vector<OBLoadProgress> all = reports.all();
    REQUIRE(all.size() == 10);
    for (std::size_t index = 0; index < all.size(); ++index) {
        CHECK(all[index].isLoading);
        CHECK(all[index].foldersDone == 100 * index);
        CHECK(all[index].pathAtWork == "/nothing at all");
    }
}

TEST_CASE("progress is not told while no time passes")
{
    TestHost test;
    test.machine.bare.clock.advance(1h);
    test.script->whenPerforming = [&](ScriptedManager& manager) {
        for (int folder = 0; folder < 100; ++folder)
            manager.listFolder("/nothing at all", {});
    };
    const auto manager = test.manager();
    Reports reports;
    const OBObservation listening = manager->observe(inPlace(), reports.callbacks());
    Request(*manager).answer();
    manager->setNeedsReload(true);
    Request(*manager).answer();
    CHECK(test.host().waitForThreads(longestWait));
    CHECK(reports.all().size() == 1);
}

TEST_CASE("progress may be asked for on any thread while a load keeps it")
{
    TestHost test;
    test.script->whenPerforming = [&](ScriptedManager& manager) {
        for (int folder = 0; folder < 500; ++folder)
            manager.listFolder(platform::Text("/nothing/" + std::to_string(folder)), {});
    };
    const auto manager = test.manager();
    const Request request(*manager);
    std::uint64_t last = 0;
    bool wentBack = false;
    while (!request.isAnswered()) {
        const OBLoadProgress progress = manager->loadProgress();
        wentBack = wentBack || progress.foldersDone < last;
        last = progress.foldersDone;
    }
    CHECK_FALSE(wentBack);
    CHECK(manager->loadProgress().foldersDone == 500);
}
