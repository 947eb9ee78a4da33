#include "tests/platform/contract/Machines.h"

#include <doctest/doctest.h>

#include <algorithm>
#include <string>

using platform::FileProblem;
using platform::FolderItem;
using platform::FolderListing;
using platform::ListingRequest;
using platform::PathKnowledge;
using namespace tests;

namespace {

constexpr ListingRequest sharedListing { .marker = "mark", .subfolder = "Shared" };

/// What the listing tells of the subfolder of the item called `name`: its items sorted, folders with a slash; "?" where
/// it has to be asked for alone.
std::string subfolderOf(const FolderListing& listing, std::string_view name)
{
    for (const FolderItem item : listing) {
        if (item.name != name)
            continue;
        if (!item.subfolder)
            return "?";
        std::vector<std::string> names;
        for (std::size_t index = 0; index < item.subfolder->size(); ++index) {
            const FolderItem inside = (*item.subfolder)[index];
            names.push_back(std::string(inside.name) + (inside.kind == platform::ItemKind::folder ? "/" : ""));
        }
        std::sort(names.begin(), names.end());
        std::string text;
        for (const std::string& each : names)
            text += (text.empty() ? "" : " ") + each;
        return text;
    }
    return "not listed";
}

} // namespace

TEST_CASE_TEMPLATE("a listing tells what is in a named folder of every item that holds the marker", Machine,
    KernelMachine, MachineWithVolumes, MachineBelowVolume, DescribedMachineWithLinks)
{
    const Machine machine;
    for (const char* path : { "full/mark", "full/Shared/b.mov", "full/Shared/a.mov", "full/Shared/folder.mov/x",
             "none/mark", "file/mark", "file/Shared", "plain/Shared/a.mov", "linked/mark", "elsewhere/c.mov" })
        machine.disk.file(path);
    machine.disk.link("linked/Shared", machine.disk.path("elsewhere"));
    const FolderListing listing = machine.files.itemsInFolder(machine.root, sharedListing);
    CHECK(subfolderOf(listing, "full") == "a.mov b.mov folder.mov/");
    CHECK(subfolderOf(listing, "none") == "");
    CHECK(subfolderOf(listing, "file") == "");
    CHECK(subfolderOf(listing, "plain") == "?");
    CHECK(subfolderOf(listing, "linked") == "?");
}

TEST_CASE("a listing does not tell what is in a folder that a named link on the way may serve from elsewhere")
{
    TemporaryFolder disk;
    disk.file("library/P/mark");
    disk.file("library/P/Shared/on disk.mov");
    disk.file("other/served.mov");
    const ListedVolumes volumes;
    const platform::LinuxFileSystem kernel;
    const platform::LinkTable table { { { "/Ombrix Added", "/Ombrix Middle" },
                                          { "/Ombrix Middle", disk.path("library") },
                                          { "/Ombrix Middle/P/Shared", disk.path("other") } },
        volumes, kernel };
    const platform::LinkedFileSystem files { kernel, table };
    for (const char* folder : { "/Ombrix Added", "/Ombrix Middle" }) {
        CAPTURE(folder);
        CHECK(subfolderOf(files.itemsInFolder(folder, sharedListing), "P") == "?");
    }
    CHECK(files.exists("/Ombrix Middle/P/Shared/served.mov"));
}

TEST_CASE("a subfolder is kept when its item is put into another listing")
{
    TemporaryFolder disk;
    disk.file("P/mark");
    disk.file("P/Shared/a.mov");
    const FolderListing listing = platform::LinuxFileSystem().itemsInFolder(disk.path(), sharedListing);
    FolderListing appended;
    appended.append(listing[0]);
    appended.append(listing[0]);
    FolderListing replaced;
    FolderItem bare;
    bare.name = "P";
    replaced.append(bare);
    replaced.setItem(0, listing[0]);
    CHECK(subfolderOf(appended, "P") == "a.mov");
    CHECK(subfolderOf(replaced, "P") == "a.mov");
}

TEST_CASE_TEMPLATE("what was seen to be a plain file is opened, and nothing else that has taken its place", Machine,
    MachineWithVolumes, DescribedMachineWithLinks)
{
    const Machine machine;
    machine.disk.file("a.mov", "12345");
    machine.disk.folder("folder.mov");
    machine.disk.pipe("pipe.mov");
    machine.disk.link("link.mov", "a.mov");
    const auto opened = machine.files.openPlainFile(machine.root + "/a.mov", PathKnowledge::realPlainFile);
    REQUIRE(opened.file);
    CHECK(opened.file->status().size == 5);
    const auto problemOf = [&machine](const char* name) {
        return machine.files.openPlainFile(machine.root + name, PathKnowledge::realPlainFile).problem;
    };
    CHECK(problemOf("/folder.mov") == FileProblem::notAPlainFile);
    CHECK(problemOf("/pipe.mov") == FileProblem::notAPlainFile);
    CHECK(problemOf("/missing.mov") == FileProblem::missing);
    CHECK(machine.files.openPlainFile(machine.root + "/link.mov", PathKnowledge::realPlainFile).file);
}
