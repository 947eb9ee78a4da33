#include "tests/platform/contract/Machines.h"

#include "platform/PathText.h"
#include "platform/linux/LinuxVolumes.h"

#include <doctest/doctest.h>

#include <algorithm>

using namespace tests;

namespace {

struct RealVolumes {
    platform::LinuxFileSystem files {};
    platform::LinuxVolumes volumes { files };
    TemporaryFolder disk {};
};

struct VolumesOfDescription {
    VolumesOfDescription()
    {
        description.localVolume("/", "Boot")
            .localVolume(disk.folder("mnt/Stick"))
            .removableMedium(disk.path("mnt/Stick"));
    }
    TemporaryFolder disk {};
    DescribedMachine description {};
    platform::LinuxFileSystem files {};
    BareMachine base { files };
    // Bound late, when the description is complete.
    struct Late {
        VolumesOfDescription& owner;
        operator platform::Volumes&() { return platform(); }
        platform::Volumes& platform()
        {
            return owner.description.platform(owner.disk.path("machine.json"), owner.base.platform()).volumes;
        }
    } volumes { *this };
};

} // namespace

TEST_CASE_TEMPLATE(
    "mount points are absolute, and the root is one of them only once", Machine, RealVolumes, VolumesOfDescription)
{
    Machine machine;
    const platform::Volumes& volumes = machine.volumes;
    const auto local = volumes.localVolumes();
    for (const std::string& mountPoint : local)
        CHECK(mountPoint.front() == '/');
    CHECK(std::count(local.begin(), local.end(), "/") <= 1);
}

TEST_CASE_TEMPLATE("removable media are volumes", Machine, RealVolumes, VolumesOfDescription)
{
    Machine machine;
    const platform::Volumes& volumes = machine.volumes;
    const auto local = volumes.localVolumes();
    for (const std::string& mountPoint : volumes.removableMedia())
        CHECK(std::count(local.begin(), local.end(), mountPoint) == 1);
}

TEST_CASE_TEMPLATE(
    "the display name of what is no volume is its last component", Machine, RealVolumes, VolumesOfDescription)
{
    Machine machine;
    const platform::Volumes& volumes = machine.volumes;
    CHECK(volumes.displayName(machine.disk.folder("Some Folder.app")) == "Some Folder.app");
    CHECK(volumes.displayName(machine.disk.path("missing") + "/") == "missing");
}

TEST_CASE_TEMPLATE(
    "what does not exist has no type of file system, and what does has one", Machine, RealVolumes, VolumesOfDescription)
{
    Machine machine;
    const platform::Volumes& volumes = machine.volumes;
    CHECK_FALSE(volumes.fileSystemType(machine.disk.path("missing")));
    const auto type = volumes.fileSystemType(machine.disk.path());
    REQUIRE(type);
    CHECK_FALSE(type->empty());
}

TEST_CASE_TEMPLATE("the generation stays while nothing is mounted", Machine, RealVolumes, VolumesOfDescription)
{
    Machine machine;
    const platform::Volumes& volumes = machine.volumes;
    CHECK(volumes.generation() == volumes.generation());
}
