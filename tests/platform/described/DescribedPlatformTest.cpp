#include "platform/described/DescribedPlatform.h"

#include "platform/MetadataIndex.h"
#include "platform/Movies.h"
#include "platform/Preferences.h"
#include "platform/common/LinkedFileSystem.h"
#include "platform/linux/LinuxFileSystem.h"
#include "tests/support/BareMachine.h"
#include "tests/support/DescribedMachine.h"
#include "tests/support/LibraryBuilder.h"
#include "tests/support/ListingText.h"
#include "tests/support/TemporaryFolder.h"

#include <doctest/doctest.h>

#include <filesystem>

using namespace tests;
using Lines = std::vector<std::string>;

namespace {

struct Studio {
    TemporaryFolder disk {};
    platform::LinuxFileSystem kernel {};
    BareMachine base { kernel };
    DescribedMachine description {};

    platform::Platform platform() { return description.platform(disk.path("machine.json"), base.platform()); }
};

} // namespace

TEST_CASE("home, preferences and editor are the description's")
{
    Studio studio;
    studio.disk.file("home/Library/Preferences/org.ombrix.Test.plist",
        "<plist version=\"1.0\"><dict><key>a</key><string>b</string></dict></plist>");
    studio.base.workspace.applications = { { "org.ombrix.Montaro", "/base/editor" }, { "org.other", "/base/other" } };
    studio.description.home("home").editor("opt/montaro");
    const platform::Platform machine = studio.platform();
    CHECK(machine.fileSystem.homeFolder() == studio.disk.path("home"));
    CHECK(machine.preferences.valuesOfDomain("org.ombrix.Test").values.valueForKey("a") == platform::Value("b"));
    CHECK(machine.workspace.applicationPath("org.ombrix.Montaro") == studio.disk.path("opt/montaro"));
    CHECK_FALSE(machine.workspace.applicationPath("org.other"));
    CHECK_FALSE(machine.workspace.applicationPath("org.ombrix.montaro"));
    CHECK_FALSE(machine.workspace.applicationIconFile(studio.disk.path("opt/montaro")));
}

TEST_CASE("a description without home and editor has none, whatever the machine below has")
{
    Studio studio;
    studio.base.workspace.applications = { { "org.ombrix.Montaro", "/base/editor" } };
    const platform::Platform machine = studio.platform();
    CHECK_FALSE(machine.fileSystem.homeFolder());
    CHECK_FALSE(machine.workspace.applicationPath("org.ombrix.Montaro"));
    const auto preferences = machine.preferences.valuesOfDomain("org.ombrix.Test");
    CHECK(preferences.values.isNull());
    CHECK(preferences.problem.empty());
}

TEST_CASE("volumes are listed in the order given, under the names given")
{
    Studio studio;
    studio.base.volumes.local = { { "/base", "Base" } };
    studio.description.localVolume("/z", "Zed")
        .localVolume("/")
        .localVolume("/a b")
        .removableMedium("/z")
        .removableMedium("/r", "Red");
    const platform::Platform machine = studio.platform();
    CHECK(machine.volumes.localVolumes() == Lines { "/z", "/", "/a b" });
    CHECK(machine.volumes.removableMedia() == Lines { "/z", "/r" });
    CHECK(machine.volumes.displayName("/z") == "Zed");
    CHECK(machine.volumes.displayName("/z/") == "Zed");
    CHECK(machine.volumes.displayName("/r") == "Red");
    CHECK(machine.volumes.displayName("/a b") == "a b");
    CHECK(machine.volumes.displayName("/z/below") == "below");
    CHECK(machine.volumes.displayName("/base") == "base");
}

TEST_CASE("described volumes are reached below /Volumes, and those of the machine below are not")
{
    Studio studio;
    studio.disk.file("stick/a.mov");
    studio.disk.file("base/b.mov");
    studio.base.volumes.local = { { studio.disk.path("base"), "Ombrix Base" } };
    studio.description.localVolume("stick", "Ombrix Stick");
    const platform::Platform machine = studio.platform();
    CHECK(machine.fileSystem.exists("/Volumes/Ombrix Stick/a.mov"));
    CHECK_FALSE(machine.fileSystem.exists("/Volumes/Ombrix Base/b.mov"));
}

TEST_CASE("links that the machine below adds are not there")
{
    Studio studio;
    studio.disk.file("stick/a.mov");
    studio.base.volumes.local = { { studio.disk.path("stick"), "Ombrix Stick" } };
    const platform::LinkTable table({}, studio.base.volumes, studio.kernel);
    platform::LinkedFileSystem linked(studio.kernel, table);
    BareMachine below(linked);
    CHECK(linked.exists("/Volumes/Ombrix Stick/a.mov"));
    const platform::Platform machine = studio.description.platform(studio.disk.path("machine.json"), below.platform());
    CHECK_FALSE(machine.fileSystem.exists("/Volumes/Ombrix Stick/a.mov"));
}

TEST_CASE("the type of a file system is that of the volume with the longest mount point above the real path")
{
    Studio studio;
    studio.disk.file("stick/inner/a.mov");
    studio.disk.file("plain/b.mov");
    studio.disk.link("way", "stick/inner");
    studio.description.localVolume("/", "Boot", "btrfs")
        .localVolume("/Ombrix Stick", "Stick", "vfat")
        .localVolume("stick/inner", "Inner", "fuse.ntfs-3g")
        .link("/Ombrix Stick", "stick");
    const platform::Platform machine = studio.platform();
    const auto typeOf = [&](const std::string& path) { return machine.volumes.fileSystemType(path).value_or("none"); };
    CHECK(typeOf(studio.disk.path("plain/b.mov")) == "btrfs");
    CHECK(typeOf("/Ombrix Stick") == "msdos");
    CHECK(typeOf(studio.disk.path("stick")) == "msdos");
    CHECK(typeOf("/Ombrix Stick/inner/a.mov") == "ntfs");
    CHECK(typeOf(studio.disk.path("way/a.mov")) == "ntfs");
    CHECK(typeOf("/") == "btrfs");
    CHECK(typeOf(studio.disk.path("missing")) == "none");
    CHECK(typeOf("/Ombrix Stick/missing") == "none");
}

TEST_CASE("a volume without a type has the one that its files really have")
{
    Studio studio;
    studio.disk.file("stick/a.mov");
    studio.base.volumes.local = { { studio.disk.path("stick"), "x", "zfs" } };
    studio.description.localVolume("/", "Boot", "ext4").localVolume("/Ombrix Stick").link("/Ombrix Stick", "stick");
    const platform::Platform machine = studio.platform();
    CHECK(machine.volumes.fileSystemType("/Ombrix Stick/a.mov") == std::string("zfs"));
    CHECK(machine.volumes.fileSystemType(studio.disk.path("machine.json")) == std::string("ext4"));
}

TEST_CASE("a volume that is listed twice has the type that either tells")
{
    Studio studio;
    studio.disk.file("stick/a.mov");
    studio.description.localVolume("stick", "Stick").removableMedium("stick", "Stick", "exfat");
    CHECK(studio.platform().volumes.fileSystemType(studio.disk.path("stick/a.mov")) == std::string("exfat"));
}

TEST_CASE("movies and attributes are read through links")
{
    Studio studio;
    LibraryBuilder library(studio.disk.path("library"));
    library.project("Trip").movie("a.mov", 640, 480);
    studio.description.link("/Ombrix Projects", "library");
    const platform::Platform machine = studio.platform();
    const std::string path = "/Ombrix Projects/Trip/Shared Items/a.mov";
    REQUIRE(machine.movies.headerOfMovie(path));
    CHECK(machine.movies.headerOfMovie(path)->resolution == platform::Size { 640, 480 });
    CHECK(machine.metadataIndex.attributesOfFile(path).valueForKey("kMDItemPath") == platform::Value(path.c_str()));
    CHECK(linesOf(machine.fileSystem.itemsInFolder("/Ombrix Projects", { .marker = "CurrentVersion.mtrproject" }))
        == Lines { "Trip folder container holder" });
}

TEST_CASE("what a description does not tell is the machine's below")
{
    Studio studio;
    const platform::Platform machine = studio.platform();
    CHECK(&machine.clock == &studio.base.clock);
    CHECK(&machine.console == &studio.base.console);
    CHECK(&machine.workspaceNotifications == &studio.base.workspaceNotifications);
}

TEST_CASE("a description that cannot be read is named as it was given")
{
    Studio studio;
    const platform::Platform base = studio.base.platform();
    const auto problemOf = [&base](const std::string& file) { return platform::describedPlatform(file, base).problem; };
    const std::string missing = studio.disk.path("missing.json");
    CHECK(problemOf(missing) == missing + ": cannot be read: it does not exist");
    const std::string folder = studio.disk.folder("folder.json");
    CHECK(problemOf(folder) == folder + ": cannot be read: it is no plain file");
    const std::string faulty = studio.disk.file("faulty.json", "{\n\"volumes\": []}");
    CHECK(problemOf(faulty) == faulty + ":2: unknown key \"volumes\" (did you mean \"localVolumes\"?)");
    CHECK(problemOf("") == ": cannot be read: it is no plain file");
}

TEST_CASE("a description's name may be relative to the current folder")
{
    Studio studio;
    studio.disk.file("machine.json", "{\"home\": \"home\"}");
    const std::string relative = std::filesystem::relative(studio.disk.path("machine.json")).string();
    const auto result = platform::describedPlatform(relative, studio.base.platform());
    REQUIRE(result.machine);
    CHECK(result.machine->platform().fileSystem.homeFolder() == studio.disk.path("home"));
    CHECK(platform::describedPlatform("./missing.json", studio.base.platform()).problem
        == "./missing.json: cannot be read: it does not exist");
}
