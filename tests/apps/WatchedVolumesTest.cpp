#include "apps/ombrix/WatchedVolumes.h"

#include "platform/linux/LinuxFileSystem.h"
#include "tests/support/BareMachine.h"
#include "tests/support/DescribedMachine.h"
#include "tests/support/TemporaryFolder.h"

#include <doctest/doctest.h>

#include <string>
#include <vector>

using namespace tests;
using Texts = std::vector<std::string>;

namespace {

Texts namesOf(const std::vector<ombrix::WatchedVolume>& volumes)
{
    Texts names;
    for (const ombrix::WatchedVolume& volume : volumes)
        names.push_back(volume.path + " " + volume.name);
    return names;
}

} // namespace

TEST_CASE("volumes that came or went since the last look are known by name, also when they are gone")
{
    platform::LinuxFileSystem files;
    BareMachine machine(files);
    machine.volumes.local = { { "/", "Boot" }, { "/m/1", "Stick" } };
    const platform::Platform platform = machine.platform();
    ombrix::WatchedVolumes volumes(platform);
    CHECK(volumes.look().came.empty());
    machine.volumes.local = { { "/", "Boot" }, { "/m/2", "Card" } };
    const ombrix::VolumeChanges changes = volumes.look();
    CHECK(namesOf(changes.came) == Texts { "/m/2 Card" });
    CHECK(namesOf(changes.went) == Texts { "/m/1 Stick" });
    CHECK(volumes.look().went.empty());
}

TEST_CASE("folders of a volume that are called like a search folder and are none are found where they exist")
{
    const TemporaryFolder folder;
    folder.folder("stick/Projects");
    folder.folder("card/Other");
    platform::LinuxFileSystem files;
    BareMachine machine(files);
    DescribedMachine description;
    description.link("/Volumes/Stick", folder.path("stick")).link("/Volumes/Card", folder.path("card"));
    const platform::Platform platform = description.platform(folder.path("machine.json"), machine.platform());
    const auto unsearched = [&](const std::string& name, const Texts& searched) {
        return ombrix::unsearchedFoldersOn({ "/m/1", name }, searched, platform.fileSystem);
    };
    CHECK(unsearched("Stick", { "/home/Projects", "/Projects" }) == Texts { "/Volumes/Stick/Projects" });
    CHECK(unsearched("Stick", { "/home/Projects", "/Volumes/Stick/Projects" }).empty());
    CHECK(unsearched("Card", { "/home/Projects" }).empty());
}
