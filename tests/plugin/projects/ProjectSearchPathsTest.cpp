#include "tests/plugin/support/SourceMachine.h"

#include <doctest/doctest.h>

using namespace tests;
using Lines = std::vector<std::string>;

namespace {

Lines preparedPaths(SourceMachine& machine, OBMontaroPlugin& source)
{
    source._prepareMontaroProjectsSearchPaths();
    return machine.abbreviated(source.inspection()->projectSearchPaths());
}

} // namespace

TEST_CASE(
    "projects are sought in the home, on local volumes by display name, at the boot volume's top, on media by path")
{
    SourceMachine machine;
    machine.files.home.store("/Users/ann");
    machine.volumes.local.store(
        { { "/", "Boot" }, { "/Volumes/Data", "Data" }, { "/Network", "Network" }, { "/Volumes/Stick", "Stick" } });
    machine.volumes.removable.store({ { "/Volumes/Stick", "Stick" } });
    const auto source = machine.makeSource();
    CHECK(preparedPaths(machine, *source)
        == Lines { "/Users/ann/Movies/Montaro Projects", "/Volumes/Data/Montaro Projects",
            "/Volumes/Stick/Montaro Projects", "/Montaro Projects", "/Volumes/Stick/Montaro Projects" });
}

TEST_CASE("a local volume is searched by its display name, a removable medium by its path, whatever the other is")
{
    SourceMachine machine;
    machine.files.home.store(std::nullopt);
    machine.volumes.local.store({ { "/media/u/Disk 1", "Disk" } });
    machine.volumes.removable.store({ { "/media/u/Stick 1", "Stick" } });
    const auto source = machine.makeSource();
    CHECK(preparedPaths(machine, *source)
        == Lines { "/Volumes/Disk/Montaro Projects", "/Montaro Projects", "/media/u/Stick 1/Montaro Projects" });
}

TEST_CASE("only the very paths of the boot volume and the network are left out")
{
    SourceMachine machine;
    machine.files.home.store(std::nullopt);
    machine.volumes.local.store({ { "/", "Boot" }, { "/Network", "Network" }, { "/network", "network" },
        { "/Network/Servers", "Servers" }, { "/private/Network", "Network" }, { "//", "Twice" } });
    machine.volumes.removable.store({ { "/", "Boot" }, { "/Network", "Network" } });
    const auto source = machine.makeSource();
    CHECK(preparedPaths(machine, *source)
        == Lines { "/Volumes/network/Montaro Projects", "/Volumes/Servers/Montaro Projects",
            "/Volumes/Network/Montaro Projects", "/Volumes/Twice/Montaro Projects", "/Montaro Projects",
            "/Montaro Projects", "/Network/Montaro Projects" });
}

TEST_CASE("preparing the project search paths twice gives the same list, not a doubled one")
{
    SourceMachine machine;
    machine.volumes.local.store({ { "/Volumes/Data", "Data" } });
    const auto source = machine.makeSource();
    const Lines once = preparedPaths(machine, *source);
    CHECK(once.size() == 3);
    CHECK(preparedPaths(machine, *source) == once);
}

TEST_CASE("preparing the project search paths drops those of volumes that are gone")
{
    SourceMachine machine;
    machine.volumes.local.store({ { "/Volumes/Data", "Data" } });
    const auto source = machine.makeSource();
    CHECK(preparedPaths(machine, *source).size() == 3);
    machine.volumes.local.store({});
    CHECK(preparedPaths(machine, *source) == Lines { "PROJECTS", "/Montaro Projects" });
}

TEST_CASE("a default project folder that is missing is searched all the same")
{
    SourceMachine machine;
    const auto source = machine.makeSource();
    CHECK(preparedPaths(machine, *source) == Lines { "PROJECTS", "/Montaro Projects" });
}

TEST_CASE("the default project folder is worked out once, from the home folder at that time")
{
    SourceMachine machine;
    const auto source = machine.makeSource();
    CHECK(source->_MontaroDefaultPath().string() == machine.disk.path("home/Movies/Montaro Projects"));
    machine.files.home.store("/elsewhere");
    CHECK(source->_MontaroDefaultPath().string() == machine.disk.path("home/Movies/Montaro Projects"));
}

TEST_CASE("whoever asks for the search paths before a load is told those that a load would search")
{
    SourceMachine machine;
    machine.volumes.local.store({ { "/Volumes/Data", "Data" } });
    const auto source = machine.makeSource();
    const Lines before = machine.abbreviated(source->inspection()->projectSearchPaths());
    machine.load(*source);
    CHECK(before == Lines { "PROJECTS", "/Volumes/Data/Montaro Projects", "/Montaro Projects" });
    CHECK(machine.abbreviated(source->inspection()->projectSearchPaths()) == before);
}
