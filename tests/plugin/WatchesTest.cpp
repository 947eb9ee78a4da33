#include "tests/plugin/support/SourceMachine.h"

#include <doctest/doctest.h>

using namespace tests;
using Lines = std::vector<std::string>;

namespace {

Lines watchedPaths(SourceMachine& machine, const OBMontaroPlugin& source)
{
    return machine.abbreviated(machine.host->pathWatcher().pathsWatchedBy(&source));
}

std::string textOfQueries(SourceMachine& machine, const OBMontaroPlugin& source)
{
    std::string text = "\n";
    for (const OBPathWatcher::Query& query : machine.host->pathWatcher().queriesWatchedBy(&source)) {
        text += query.text + " mode " + std::to_string(query.runMode) + "\n";
        for (const std::string& folder : query.scope)
            text += "  " + machine.abbreviated(folder) + "\n";
    }
    return text;
}

/// A stick that is listed both as a local volume and as a removable medium.
void mountStick(SourceMachine& machine)
{
    machine.volumes.local.store({ { "/", "Boot" }, { "/Volumes/Stick", "Stick" } });
    machine.volumes.removable.store({ { "/Volumes/Stick", "Stick" } });
}

} // namespace

TEST_CASE("the first load watches the editor's preferences file, the default folder and each search path, once each")
{
    SourceMachine machine;
    machine.disk.file("home/Library/Preferences/org.ombrix.Montaro.plist");
    mountStick(machine);
    const auto source = machine.makeSource();
    machine.load(*source);
    CHECK(watchedPaths(machine, *source)
        == Lines { "DISK/home/Library/Preferences/org.ombrix.Montaro.plist", "PROJECTS",
            "/Volumes/Stick/Montaro Projects", "/Montaro Projects", "DISK/home/Movies/Montaro Events",
            "/Volumes/Stick/Montaro Events", "/Montaro Events" });
}

TEST_CASE("the editor's preferences file is not watched where it does not exist at the first load")
{
    SourceMachine machine;
    const auto source = machine.makeSource();
    machine.load(*source);
    const Lines expected { "PROJECTS", "/Montaro Projects", "DISK/home/Movies/Montaro Events", "/Montaro Events" };
    CHECK(watchedPaths(machine, *source) == expected);
    machine.disk.file("home/Library/Preferences/org.ombrix.Montaro.plist");
    machine.load(*source);
    CHECK(watchedPaths(machine, *source) == expected);
}

TEST_CASE("without a home folder neither preferences nor a default folder is watched")
{
    SourceMachine machine;
    machine.files.home.store(std::nullopt);
    const auto source = machine.makeSource();
    machine.load(*source);
    CHECK(watchedPaths(machine, *source) == Lines { "/Montaro Projects", "/Montaro Events" });
}

TEST_CASE("an event folder is not watched while the folder that holds it is")
{
    SourceMachine machine;
    mountStick(machine);
    const auto source = machine.makeSource();
    source->_watchPath("/Volumes/Stick");
    source->_watchPath(machine.disk.path("home"));
    machine.load(*source);
    CHECK(watchedPaths(machine, *source)
        == Lines { "/Volumes/Stick", "DISK/home", "PROJECTS", "/Volumes/Stick/Montaro Projects", "/Montaro Projects",
            "DISK/home/Movies/Montaro Events", "/Montaro Events" });
}

TEST_CASE("a project folder is watched though the folder that holds it is watched too")
{
    SourceMachine machine;
    const auto source = machine.makeSource();
    source->_watchPath(machine.disk.path("home/Movies"));
    machine.load(*source);
    CHECK(watchedPaths(machine, *source)
        == Lines { "DISK/home/Movies", "PROJECTS", "/Montaro Projects", "/Montaro Events" });
}

TEST_CASE("watching a path again, or no path, changes nothing")
{
    SourceMachine machine;
    const auto source = machine.makeSource();
    source->_watchPath("/a");
    source->_watchPath("/b");
    source->_watchPath("/a");
    source->_watchPath({});
    CHECK(watchedPaths(machine, *source) == Lines { "/a", "/b" });
}

TEST_CASE("each load registers the project query over the default folder and the movie query over the event folders")
{
    SourceMachine machine;
    mountStick(machine);
    const auto source = machine.makeSource();
    machine.load(*source);
    const std::string expected = R"(
(kMDItemFSName = '*.mtrproject'c) mode 4
  PROJECTS
(kMDItemContentType = 'org.ombrix.movie') mode 4
  DISK/home/Movies/Montaro Events
  /Volumes/Stick/Montaro Events
  /Montaro Events
  /Volumes/Stick/Montaro Events
)";
    CHECK(textOfQueries(machine, *source) == expected);
    machine.host->pathWatcher().removeObserver(source.get());
    machine.load(*source);
    CHECK(textOfQueries(machine, *source) == expected);
}

TEST_CASE("without a home folder the project query has an empty scope")
{
    SourceMachine machine;
    machine.files.home.store(std::nullopt);
    const auto source = machine.makeSource();
    machine.load(*source);
    CHECK(textOfQueries(machine, *source) == R"(
(kMDItemFSName = '*.mtrproject'c) mode 4
(kMDItemContentType = 'org.ombrix.movie') mode 4
  /Montaro Events
)");
}

TEST_CASE("the mount observer is registered for any sender by the first load alone")
{
    SourceMachine machine;
    const auto source = machine.makeSource();
    machine.load(*source);
    machine.load(*source);
    CHECK(machine.workspaceNotifications.added.lines() == Lines { "VolumeMounted of any sender" });
}

TEST_CASE("a later load registers no watch again of the default folder or the preferences")
{
    SourceMachine machine;
    machine.disk.file("home/Library/Preferences/org.ombrix.Montaro.plist");
    const auto source = machine.makeSource();
    machine.load(*source);
    machine.host->pathWatcher().removeObserver(source.get());
    machine.load(*source);
    CHECK(watchedPaths(machine, *source)
        == Lines { "PROJECTS", "/Montaro Projects", "DISK/home/Movies/Montaro Events", "/Montaro Events" });
}

TEST_CASE(
    "a volume that is mounted later joins the scope of the movie query at the next load, once, and no project path")
{
    SourceMachine machine;
    const auto source = machine.makeSource();
    machine.load(*source);
    machine.volumes.local.store({ { "/mnt/late", "Late" } });
    machine.tellOfVolume("/mnt/late");
    machine.tellOfVolume("/mnt/late");
    machine.load(*source);
    CHECK(textOfQueries(machine, *source) == R"(
(kMDItemFSName = '*.mtrproject'c) mode 4
  PROJECTS
(kMDItemContentType = 'org.ombrix.movie') mode 4
  DISK/home/Movies/Montaro Events
  /Montaro Events
  /Volumes/Late/Montaro Events
)");
    CHECK(machine.abbreviated(source->inspection()->projectSearchPaths()) == Lines { "PROJECTS", "/Montaro Projects" });
}
