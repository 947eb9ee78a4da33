#include "tests/plugin/support/RecordText.h"
#include "tests/plugin/support/SourceMachine.h"

#include <doctest/doctest.h>

#include <atomic>

using namespace tests;
using Lines = std::vector<std::string>;

namespace {

/// The folders that a source which has not loaded would search.
Lines projectPaths(OBMontaroPlugin& source)
{
    return source.inspection()->projectSearchPaths();
}

} // namespace

TEST_CASE("construction looks for the icons first, then reads the editor's preferences, then the host's")
{
    SourceMachine machine;
    const auto source = machine.makeSource();
    CHECK(machine.trace.take()
        == Lines { "application org.ombrix.Montaro", "picture MontaroIcon", "picture MontaroProjectIcon",
            "picture MontaroEventIcon", "picture MontaroCalendarIcon", "preferences org.ombrix.Montaro",
            "preferences org.ombrix.browser" });
}

TEST_CASE("construction registers no watch, no query and no observer, and builds no search path")
{
    SourceMachine machine;
    std::atomic<int> timesListed { 0 };
    machine.volumes.whenListed = [&] { ++timesListed; };
    const auto source = machine.makeSource();
    CHECK(machine.host->pathWatcher().pathsWatchedBy(source.get()).empty());
    CHECK(machine.host->pathWatcher().queriesWatchedBy(source.get()).empty());
    CHECK(machine.workspaceNotifications.added.lines().empty());
    CHECK(timesListed == 0);
}

TEST_CASE("a source that was just made has no tree and no groups")
{
    SourceMachine machine;
    const auto source = machine.makeSource();
    CHECK(source->rootMediaGroup() == nullptr);
    CHECK(source->mediaGroups().empty());
    CHECK(source->movieGroups().empty());
    CHECK(source->firstTimeCallingLoadData());
}

TEST_CASE("a source loads by itself once somebody listens, since it needs a reload and reloads are automatic")
{
    SourceMachine machine;
    const auto source = machine.makeSource();
    Stop published;
    OBManagerCallbacks callbacks;
    callbacks.rootPublished = [&](const OBMediaGroupRef&) { published.stopHere(); };
    const OBObservation observation
        = source->observe([](const std::function<void()>& call) { call(); }, std::move(callbacks));
    CHECK(published.waitUntilReached());
    published.release();
    machine.waitForThreads();
    CHECK(source->rootMediaGroup() != nullptr);
}

TEST_CASE("a second source made while the first lives loads no picture and asks for no icon")
{
    SourceMachine machine;
    const auto first = machine.makeSource();
    machine.trace.take();
    const auto second = machine.makeSource();
    CHECK(machine.trace.take() == Lines { "preferences org.ombrix.Montaro", "preferences org.ombrix.browser" });
}

TEST_CASE("two sources at a time share the icons of their groups and have a root icon each")
{
    SourceMachine machine;
    machine.workspace.iconFile.store("/icons/editor.png");
    machine.projects().project("Trip").movie("a.mov");
    const auto first = machine.makeSource();
    const auto second = machine.makeSource();
    const OBMediaGroupRef firstRoot = machine.load(*first).rootMediaGroup;
    const OBMediaGroupRef secondRoot = machine.load(*second).rootMediaGroup;
    CHECK(firstRoot->icon() == secondRoot->icon());
    CHECK(firstRoot->childGroups()[0]->icon() == secondRoot->childGroups()[0]->icon());
    CHECK(firstRoot->childGroups()[1]->icon() == secondRoot->childGroups()[1]->icon());
    CHECK(first->rootMediaGroupIcon() != second->rootMediaGroupIcon());
}

TEST_CASE("two sources at a time keep their trees and their watches apart")
{
    SourceMachine machine;
    machine.projects().project("Trip");
    const auto first = machine.makeSource();
    const auto second = machine.makeSource();
    machine.load(*first);
    CHECK(second->rootMediaGroup() == nullptr);
    CHECK(second->mediaGroups().empty());
    CHECK(machine.host->pathWatcher().pathsWatchedBy(second.get()).empty());
    machine.projects().project("Walk");
    machine.load(*second);
    CHECK(childNames(*first->rootMediaGroup()) == "Trip Events");
    CHECK(childNames(*second->rootMediaGroup()) == "Trip Walk Events");
}

TEST_CASE("a source made after another was torn down makes the shared icons anew")
{
    SourceMachine machine;
    auto first = machine.makeSource();
    const OBImageRef before = machine.load(*first).rootMediaGroup->childGroups()[0]->icon();
    machine.end(first);
    machine.trace.take();
    const auto second = machine.makeSource();
    CHECK(machine.trace.take()
        == Lines { "application org.ombrix.Montaro", "picture MontaroIcon", "picture MontaroProjectIcon",
            "picture MontaroEventIcon", "picture MontaroCalendarIcon", "preferences org.ombrix.Montaro",
            "preferences org.ombrix.browser" });
    const OBImageRef after = machine.load(*second).rootMediaGroup->childGroups()[0]->icon();
    CHECK(before != nullptr);
    CHECK(after != nullptr);
    CHECK(before != after);
}

TEST_CASE("tearing down one of two sources empties what they share, so the other's next tree has no icons")
{
    SourceMachine machine;
    machine.projects().project("Trip").movie("a.mov");
    machine.dateEverything();
    auto first = machine.makeSource();
    const auto second = machine.makeSource();
    machine.end(first);
    CHECK(machine.text(machine.load(*second).rootMediaGroup) == R"(
Root Montaro ID=Montaro parent=- icon=- path=- undated {}
  * Trip 3/4 org.ombrix.OBMontaroPlugin path=PROJECTS/Trip/Shared Items/a.mov icon=thumbnail {Project Path=PROJECTS/Trip, OBMediaObjectResolutionKey=1920x1080, Project Format Version=6, Project Representative=true}
  Project Trip ID=PROJECTS/Trip parent=PROJECTS icon=- path=PROJECTS/Trip dated {}
    * a 3/4 org.ombrix.OBMontaroPlugin path=PROJECTS/Trip/Shared Items/a.mov icon=- {Project Path=PROJECTS/Trip/Shared Items/a.mov, OBMediaObjectResolutionKey=1920x1080, OBMediaObjectDurationKey=2r}
  EventLibrary Events ID=Events parent=Montaro icon=- path=- undated {}
)");
    CHECK(second->rootMediaGroupIcon() != nullptr);
}

TEST_CASE("a source made while another lives fills only the icons that a teardown has emptied")
{
    SourceMachine machine;
    auto first = machine.makeSource();
    auto second = machine.makeSource();
    machine.end(first);
    const auto third = machine.makeSource();
    const OBMediaGroupRef withThird = machine.load(*second).rootMediaGroup;
    CHECK(withThird->icon() != nullptr);
    CHECK(withThird->icon() == machine.load(*third).rootMediaGroup->icon());
}

TEST_CASE("groups keep their icons when their source is torn down")
{
    SourceMachine machine;
    machine.projects().project("Trip");
    auto source = machine.makeSource();
    const OBMediaGroupRef root = machine.load(*source).rootMediaGroup;
    machine.end(source);
    REQUIRE(root->icon());
    CHECK(root->icon()->name() == "smallAppIcon");
    CHECK(root->childGroups()[0]->icon()->name() == "projectIcon");
}

TEST_CASE("a changed home folder is seen only after a source has been torn down")
{
    SourceMachine machine;
    auto first = machine.makeSource();
    CHECK(machine.abbreviated(projectPaths(*first)) == Lines { "PROJECTS", "/Montaro Projects" });
    machine.files.home.store(machine.disk.path("other"));
    CHECK(machine.abbreviated(projectPaths(*first)) == Lines { "PROJECTS", "/Montaro Projects" });
    {
        auto second = machine.makeSource();
        CHECK(machine.abbreviated(projectPaths(*second)) == Lines { "PROJECTS", "/Montaro Projects" });
    }
    machine.waitForThreads();
    CHECK(machine.abbreviated(projectPaths(*first))
        == Lines { "DISK/other/Movies/Montaro Projects", "/Montaro Projects" });
    CHECK(machine.abbreviated(first->inspection()->eventSearchPaths())
        == Lines { "DISK/other/Movies/Montaro Events", "/Montaro Events" });
}

TEST_CASE("a home folder that becomes known is seen at once")
{
    SourceMachine machine;
    machine.files.home.store(std::nullopt);
    const auto source = machine.makeSource();
    CHECK(source->_MontaroDefaultPath().isAbsent());
    CHECK(source->_MontaroDefaultEventsFolderPath().isAbsent());
    machine.files.home.store(machine.disk.path("home"));
    CHECK(source->_MontaroDefaultPath().string() == machine.disk.path("home/Movies/Montaro Projects"));
    CHECK(source->_MontaroDefaultEventsFolderPath().string() == machine.disk.path("home/Movies/Montaro Events"));
}

TEST_CASE("nothing reaches a source that was torn down")
{
    SourceMachine machine;
    auto source = machine.makeSource();
    machine.load(*source);
    const OBPathWatcherObserver* const observer = source.get();
    machine.end(source);
    CHECK(machine.host->pathWatcher().pathsWatchedBy(observer).empty());
    CHECK(machine.host->pathWatcher().queriesWatchedBy(observer).empty());
    machine.tellOfVolume("/Volumes/Stick");
    CHECK(machine.host->threadCount() == 0);
}

TEST_CASE("a source may be made and torn down in the middle of a load")
{
    SourceMachine machine;
    for (const char* name : { "A", "B", "C" })
        machine.projects().project(name).movie("a.mov");
    Stop stop;
    machine.movies.whenRead = [&](std::string_view) { stop.stopHere(); };
    auto source = machine.makeSource();
    source->requestRootMediaGroup([](const std::function<void()>& call) { call(); }, [](const OBLoadResult&) {});
    REQUIRE(stop.waitUntilReached());
    source = nullptr;
    stop.release();
    machine.waitForThreads();
    machine.movies.whenRead = nullptr;
    CHECK(machine.movies.pathsRead.take().size() == 1);
    CHECK(childNames(*machine.load(*machine.makeSource()).rootMediaGroup) == "A B C Events");
}
