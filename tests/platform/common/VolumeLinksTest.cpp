// The links by which volumes are reached under the names that a person sees.

#include "tests/platform/common/LinkedFiles.h"
#include "tests/support/ListingText.h"

#include <doctest/doctest.h>

#include <unistd.h>

using namespace tests;
using Lines = std::vector<std::string>;

namespace {

/// Names that no machine has, so that nothing real at /Volumes gets in the way.
const std::string stick = "Ombrix Test Stick";
const std::string stickPath = "/Volumes/" + stick;

} // namespace

TEST_CASE("a volume is reached below /Volumes by its display name")
{
    LinkedFiles machine;
    machine.disk.file("mnt/Trip/mark", "123");
    machine.volumes.local = { { machine.disk.path("mnt"), stick } };
    CHECK(linesOf(machine.files().itemsInFolder(stickPath, { .marker = "mark" }))
        == Lines { "Trip folder container holder" });
    CHECK(linesOf(machine.files().itemsInFolder(stickPath + "/Trip", {})) == Lines { "mark" });
    CHECK(machine.files().status(stickPath + "/Trip/mark")->size == 3);
    CHECK(machine.files().openPlainFile(stickPath + "/Trip/mark").file);
    CHECK(machine.files().resolvedPath(stickPath + "/Trip") == machine.disk.path("mnt/Trip"));
    CHECK(machine.files().linkStatus(stickPath)->kind == platform::ItemKind::symbolicLink);
    CHECK(machine.files().linkTarget(stickPath) == machine.disk.path("mnt"));
    CHECK_FALSE(machine.files().exists("/Volumes/Ombrix Test Other"));
}

TEST_CASE("of two volumes with one name the first wins, local ones before removable media")
{
    LinkedFiles machine;
    machine.disk.file("one/1");
    machine.disk.file("two/2");
    machine.disk.file("three/3");
    machine.volumes.removable = { { machine.disk.path("three"), stick } };
    CHECK(machine.files().exists(stickPath + "/3"));
    machine.volumes.local = { { machine.disk.path("one"), stick }, { machine.disk.path("two"), stick } };
    CHECK(machine.files().exists(stickPath + "/1"));
    CHECK_FALSE(machine.files().exists(stickPath + "/2"));
    CHECK_FALSE(machine.files().exists(stickPath + "/3"));
}

TEST_CASE("a named link wins over a volume, at its path and above it")
{
    LinkedFiles machine;
    machine.disk.file("mnt/volume");
    machine.disk.file("named/link");
    machine.volumes.local = { { machine.disk.path("mnt"), stick } };
    machine.link(stickPath, machine.disk.path("named"));
    CHECK(linesOf(machine.files().itemsInFolder(stickPath, {})) == Lines { "link" });
    LinkedFiles other;
    other.disk.file("volumes/" + stick + "/named above");
    other.volumes.local = { { machine.disk.path("mnt"), stick } };
    other.link("/Volumes", other.disk.path("volumes"));
    CHECK(linesOf(other.files().itemsInFolder(stickPath, {})) == Lines { "named above" });
}

TEST_CASE("a link below a volume's path wins over the volume")
{
    LinkedFiles machine;
    machine.disk.file("mnt/Trip/volume");
    machine.disk.file("named/link");
    machine.volumes.local = { { machine.disk.path("mnt"), stick } };
    machine.link(stickPath + "/Trip", machine.disk.path("named"));
    CHECK(linesOf(machine.files().itemsInFolder(stickPath + "/Trip", {})) == Lines { "link" });
    CHECK(linesOf(machine.files().itemsInFolder(stickPath, {})) == Lines { "Trip link" });
}

TEST_CASE("real links lead into volumes")
{
    LinkedFiles machine;
    machine.disk.file("mnt/Trip/mark");
    machine.volumes.local = { { machine.disk.path("mnt"), stick } };
    machine.disk.link("folder/absolute", stickPath + "/Trip");
    machine.disk.link("folder/holder/mark", stickPath + "/Trip/mark");
    machine.disk.link("folder/dangling", stickPath + "/missing");
    machine.disk.link("home", "folder");
    for (const std::string& folder : { machine.disk.path("folder"), machine.disk.path("home") }) {
        CAPTURE(folder);
        CHECK(linesOf(machine.files().itemsInFolder(folder, { .marker = "mark" }))
            == Lines { "absolute link holder", "dangling link", "holder folder container holder" });
        CHECK(linesOf(machine.files().itemsInFolder(folder + "/absolute", {})) == Lines { "mark" });
        CHECK(machine.files().exists(folder + "/absolute/mark"));
        CHECK(machine.files().resolvedPath(folder + "/absolute/mark") == machine.disk.path("mnt/Trip/mark"));
        CHECK(machine.files().resolvedPath(folder + "/dangling") == machine.disk.path("mnt/missing"));
        CHECK(machine.files().openPlainFile(folder + "/holder/mark").file);
    }
}

TEST_CASE("the root volume is reached by its name too")
{
    LinkedFiles machine;
    machine.disk.file("a.mov");
    machine.volumes.local = { { "/", stick } };
    CHECK(machine.files().exists(stickPath + machine.disk.path("a.mov")));
    CHECK(machine.files().resolvedPath(stickPath) == "/");
}

TEST_CASE("a name with a slash in it spells a path below /Volumes")
{
    LinkedFiles machine;
    machine.disk.file("mnt/a.mov");
    machine.volumes.local = { { machine.disk.path("mnt"), stick + "/inner" } };
    CHECK(machine.files().exists(stickPath + "/inner/a.mov"));
    CHECK_FALSE(machine.files().exists(stickPath));
}

TEST_CASE("names that no path can spell are linked nowhere")
{
    LinkedFiles machine;
    machine.disk.file("mnt/a.mov");
    for (const char* name : { "", "/", "//", ".", "..", "a/../b" })
        machine.volumes.local.push_back({ machine.disk.path("mnt"), name });
    CHECK_FALSE(machine.files().exists("/Volumes/a.mov"));
    CHECK_FALSE(machine.files().exists("/Volumes/b/a.mov"));
    CHECK(machine.files().resolvedPath("/Volumes/..") != machine.disk.path("mnt"));
}

TEST_CASE("a volume mounted at its own path below /Volumes is no link")
{
    LinkedFiles machine;
    machine.volumes.local = { { stickPath, stick } };
    CHECK_FALSE(machine.files().exists(stickPath));
    CHECK_FALSE(machine.files().linkStatus(stickPath));
    CHECK(machine.files().resolvedPath(stickPath + "/x") == stickPath + "/x");
}

TEST_CASE("a volume that was mounted since is found at once")
{
    LinkedFiles machine;
    machine.disk.file("mnt/a.mov");
    CHECK_FALSE(machine.files().exists(stickPath + "/a.mov"));
    machine.volumes.local = { { machine.disk.path("mnt"), stick } };
    CHECK(machine.files().exists(stickPath + "/a.mov"));
}

TEST_CASE("while the volumes tell that nothing changed they are listed once")
{
    LinkedFiles machine;
    machine.disk.file("mnt/a.mov");
    machine.disk.file("other/b.mov");
    machine.volumes.local = { { machine.disk.path("mnt"), stick } };
    machine.volumes.currentGeneration = 1;
    for (int round = 0; round < 10; ++round)
        CHECK(machine.files().exists(stickPath + "/a.mov"));
    CHECK(machine.volumes.timesListed == 1);
    machine.volumes.local = { { machine.disk.path("other"), stick } };
    machine.volumes.currentGeneration = 2;
    CHECK(machine.files().exists(stickPath + "/b.mov"));
    CHECK(machine.volumes.timesListed == 2);
}

TEST_CASE("a path elsewhere asks for no volume")
{
    LinkedFiles machine;
    machine.disk.file("a.mov");
    CHECK(machine.files().exists(machine.disk.path("a.mov")));
    CHECK_FALSE(machine.files().exists(machine.disk.path("missing")));
    CHECK_FALSE(machine.files().exists("/Volumesque/x"));
    machine.files().resolvedPath(machine.disk.path("a.mov"));
    CHECK(machine.volumes.timesListed == 0);
}

TEST_CASE("a folder that really stands below /Volumes wins over a volume" * doctest::skip(geteuid() != 0))
{
    const bool hadVolumes = access("/Volumes", F_OK) == 0;
    LinkedFiles machine;
    machine.disk.file("mnt/volume");
    machine.volumes.local = { { machine.disk.path("mnt"), stick } };
    writeFile(stickPath, "a plain file does not win");
    CHECK(linesOf(machine.files().itemsInFolder(stickPath, {})) == Lines { "volume" });
    CHECK(machine.files().linkStatus(stickPath)->kind == platform::ItemKind::symbolicLink);
    removeItem(stickPath);
    writeFile(stickPath + "/real", "");
    CHECK(linesOf(machine.files().itemsInFolder(stickPath, {})) == Lines { "real" });
    CHECK(machine.files().resolvedPath(stickPath) == stickPath);
    CHECK(machine.files().linkStatus(stickPath)->kind == platform::ItemKind::folder);
    removeItem(stickPath);
    if (!hadVolumes)
        removeItem("/Volumes");
}
