#include "tests/plugin/support/SourceMachine.h"

#include <doctest/doctest.h>

using namespace tests;
using Lines = std::vector<std::string>;

namespace {

Lines preparedPaths(SourceMachine& machine, OBMontaroPlugin& source)
{
    source._prepareMontaroEventsSearchPaths();
    return machine.abbreviated(source.inspection()->eventSearchPaths());
}

} // namespace

TEST_CASE("events are sought in the home, on local volumes by display name and at the boot volume's top")
{
    SourceMachine machine;
    machine.files.home.store("/Users/u");
    machine.volumes.local.store({ { "/", "Boot" }, { "/Network", "Network" }, { "/Volumes/Media", "Media" } });
    const auto source = machine.makeSource();
    CHECK(preparedPaths(machine, *source)
        == Lines { "/Users/u/Movies/Montaro Events", "/Volumes/Media/Montaro Events", "/Montaro Events" });
}

TEST_CASE("events of a local volume are sought below its display name, not its mount point")
{
    SourceMachine machine;
    machine.files.home.store(std::nullopt);
    machine.volumes.local.store({ { "/Volumes/Disk 1", "Disk" } });
    const auto source = machine.makeSource();
    CHECK(preparedPaths(machine, *source) == Lines { "/Volumes/Disk/Montaro Events", "/Montaro Events" });
}

TEST_CASE("events are sought on volumes below the network's path, only that very path is left out")
{
    SourceMachine machine;
    machine.files.home.store(std::nullopt);
    machine.volumes.local.store({ { "/Network/Servers", "Servers" }, { "/network", "network" } });
    machine.volumes.removable.store({ { "/Network", "Network" } });
    const auto source = machine.makeSource();
    CHECK(preparedPaths(machine, *source)
        == Lines { "/Volumes/Servers/Montaro Events", "/Volumes/network/Montaro Events", "/Montaro Events",
            "/Network/Montaro Events" });
}

TEST_CASE("events of a removable medium that is a local volume too are sought twice")
{
    SourceMachine machine;
    machine.volumes.local.store({ { "/Volumes/Stick", "Stick" } });
    machine.volumes.removable.store({ { "/Volumes/Stick", "Stick" } });
    const auto source = machine.makeSource();
    CHECK(preparedPaths(machine, *source)
        == Lines { "DISK/home/Movies/Montaro Events", "/Volumes/Stick/Montaro Events", "/Montaro Events",
            "/Volumes/Stick/Montaro Events" });
}

TEST_CASE("preparing the event search paths twice gives the same list, not a doubled one")
{
    SourceMachine machine;
    machine.volumes.local.store({ { "/Volumes/Data", "Data" } });
    const auto source = machine.makeSource();
    const Lines once = preparedPaths(machine, *source);
    CHECK(once.size() == 3);
    CHECK(preparedPaths(machine, *source) == once);
}

TEST_CASE("the default event folder is worked out once, from the home folder at that time")
{
    SourceMachine machine;
    const auto source = machine.makeSource();
    CHECK(source->_MontaroDefaultEventsFolderPath().string() == machine.disk.path("home/Movies/Montaro Events"));
    machine.files.home.store("/elsewhere");
    CHECK(source->_MontaroDefaultEventsFolderPath().string() == machine.disk.path("home/Movies/Montaro Events"));
}

TEST_CASE("event search paths grow by volumes that are mounted later, and keep those that are gone")
{
    SourceMachine machine;
    machine.volumes.local.store({ { "/Volumes/Gone", "Gone" } });
    const auto source = machine.makeSource();
    machine.load(*source);
    machine.volumes.local.store({ { "/mnt/late", "Late" } });
    machine.tellOfVolume("/mnt/late");
    machine.load(*source);
    CHECK(machine.abbreviated(source->inspection()->eventSearchPaths())
        == Lines { "DISK/home/Movies/Montaro Events", "/Volumes/Gone/Montaro Events", "/Montaro Events",
            "/Volumes/Late/Montaro Events" });
}
