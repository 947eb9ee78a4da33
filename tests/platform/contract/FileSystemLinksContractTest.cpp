// What every file system answers where symbolic links that are on disk are on the way.

#include "tests/platform/contract/Machines.h"
#include "tests/support/ListingText.h"

#include <doctest/doctest.h>

#include <array>

using namespace tests;
using platform::FileProblem;
using platform::ItemKind;
using platform::LinkPolicy;
using Lines = std::vector<std::string>;

TEST_CASE_TEMPLATE("status and listings follow links", Machine, OMBRIX_ALL_FILE_MACHINES)
{
    const Machine machine;
    machine.disk.file("Trip/inner/a.mov", "12345");
    machine.disk.link("absolute", machine.disk.path("Trip"));
    machine.disk.link("relative", "Trip/inner");
    machine.disk.link("chain", "relative/../inner/a.mov");
    CHECK(linesOf(machine.files.itemsInFolder(machine.root + "/absolute", {})) == Lines { "inner folder container" });
    CHECK(linesOf(machine.files.itemsInFolder(machine.root + "/relative", {})) == Lines { "a.mov" });
    CHECK(linesOf(machine.files.itemsInFolder(machine.root + "/absolute/inner", {})) == Lines { "a.mov" });
    REQUIRE(machine.files.status(machine.root + "/chain"));
    CHECK(machine.files.status(machine.root + "/chain")->size == 5);
    CHECK(machine.files.status(machine.root + "/chain")->kind == ItemKind::file);
    CHECK(machine.files.exists(machine.root + "/absolute/inner/a.mov"));
    CHECK(machine.files.openPlainFile(machine.root + "/chain").file);
}

TEST_CASE_TEMPLATE("two dots after a link mean the folder that holds its target", Machine, OMBRIX_ALL_FILE_MACHINES)
{
    const Machine machine;
    machine.disk.file("one/two/here");
    machine.disk.link("link", "one/two");
    CHECK(machine.files.exists(machine.root + "/link/../two/here"));
    CHECK_FALSE(machine.files.exists(machine.root + "/link/../one"));
    CHECK(linesOf(machine.files.itemsInFolder(machine.root + "/link/..", {})) == Lines { "two folder container" });
}

TEST_CASE_TEMPLATE("a link's own status, target and flags are its own", Machine, OMBRIX_ALL_FILE_MACHINES)
{
    const Machine machine;
    machine.disk.folder("Tool.app");
    machine.disk.link("link.app", "Tool.app");
    machine.disk.link("dangling", "nowhere//x/");
    const auto status = machine.files.linkStatus(machine.root + "/link.app");
    REQUIRE(status);
    CHECK(status->kind == ItemKind::symbolicLink);
    CHECK(machine.files.linkTarget(machine.root + "/link.app") == std::string("Tool.app"));
    CHECK(machine.files.linkTarget(machine.root + "/dangling") == std::string("nowhere//x/"));
    CHECK_FALSE(machine.files.linkTarget(machine.root + "/Tool.app"));
    CHECK_FALSE(machine.files.linkTarget(machine.root + "/missing"));
    CHECK_FALSE(machine.files.itemFlags(machine.root + "/link.app").container);
    CHECK_FALSE(machine.files.itemFlags(machine.root + "/link.app").package);
    CHECK(machine.files.itemFlags(machine.root + "/Tool.app").package);
    CHECK(machine.files.linkStatus(machine.root + "/dangling"));
    CHECK_FALSE(machine.files.exists(machine.root + "/dangling"));
}

TEST_CASE_TEMPLATE(
    "markers are found through links, with the date at the end of the link", Machine, OMBRIX_ALL_FILE_MACHINES)
{
    const Machine machine;
    machine.disk.file("elsewhere/project/mark");
    setModificationDate(machine.disk.path("elsewhere/project"), { 1'300'000'000, 0 });
    machine.disk.link("scan/to project", "../elsewhere/project");
    machine.disk.link("scan/to nothing", "../missing");
    machine.disk.link("scan/linked mark/mark", "../../elsewhere/project/mark");
    setModificationDate(machine.disk.path("scan/linked mark"), { 1'300'000'001, 0 });
    machine.disk.link("scan/dangling mark/mark", "nowhere");
    const platform::ListingRequest request { .marker = "mark", .datesOfHolders = true };
    CHECK(linesOf(machine.files.itemsInFolder(machine.root + "/scan", request))
        == Lines { "dangling mark folder container", "linked mark folder container holder @1300000001",
            "to nothing link", "to project link holder @1300000000" });
}

TEST_CASE_TEMPLATE("a list of hidden names is read through a link", Machine, OMBRIX_ALL_FILE_MACHINES)
{
    const Machine machine;
    machine.disk.file("list", "a.mov\n");
    machine.disk.file("scan/a.mov");
    machine.disk.file("scan/b.mov");
    machine.disk.link("scan/.hidden", "../list");
    CHECK(linesOf(machine.files.itemsInFolder(machine.root + "/scan", {}))
        == Lines { ".hidden link invisible", "a.mov invisible", "b.mov" });
    CHECK(machine.files.itemFlags(machine.root + "/scan/a.mov").invisible);
    CHECK_FALSE(machine.files.itemFlags(machine.root + "/scan/b.mov").invisible);
}

TEST_CASE_TEMPLATE("the real path has every link resolved", Machine, OMBRIX_ALL_FILE_MACHINES)
{
    const Machine machine;
    machine.disk.file("one/two/a.mov");
    machine.disk.link("absolute", machine.disk.path("one"));
    machine.disk.link("one/relative", "two");
    CHECK(machine.files.resolvedPath(machine.root) == machine.disk.path());
    CHECK(machine.files.resolvedPath(machine.root + "/absolute/relative/a.mov") == machine.disk.path("one/two/a.mov"));
    CHECK(machine.files.resolvedPath(machine.root + "/absolute/relative/..") == machine.disk.path("one"));
    CHECK(machine.files.resolvedPath(machine.root + "/absolute/missing/x") == machine.disk.path("one/missing/x"));
    CHECK(machine.files.resolvedPath("/") == "/");
}

TEST_CASE_TEMPLATE("a link that leads nowhere resolves to the place it names", Machine, OMBRIX_ALL_FILE_MACHINES)
{
    const Machine machine;
    machine.disk.link("folder/link", "../missing/place");
    machine.disk.link("way", "folder");
    CHECK(machine.files.resolvedPath(machine.root + "/way/link") == machine.disk.path("missing/place"));
    CHECK(machine.files.resolvedPath(machine.root + "/way/link/below") == machine.disk.path("missing/place/below"));
}

TEST_CASE_TEMPLATE("links in circles resolve to the link itself in its real folder", Machine, OMBRIX_ALL_FILE_MACHINES)
{
    const Machine machine;
    machine.disk.link("folder/itself", "itself");
    machine.disk.link("folder/one", "two");
    machine.disk.link("folder/two", "one");
    machine.disk.link("folder/into", "one");
    machine.disk.link("way", "folder");
    CHECK(machine.files.resolvedPath(machine.root + "/folder/itself") == machine.disk.path("folder/itself"));
    CHECK(machine.files.resolvedPath(machine.root + "/way/one") == machine.disk.path("folder/one"));
    CHECK(machine.files.resolvedPath(machine.root + "/way/two") == machine.disk.path("folder/two"));
    CHECK(machine.files.resolvedPath(machine.root + "/way/into") == machine.disk.path("folder/into"));
    CHECK(machine.files.resolvedPath(machine.root + "/way/one/x") == machine.disk.path("folder/one/x"));
    CHECK_FALSE(machine.files.status(machine.root + "/way/one"));
    CHECK(machine.files.linkStatus(machine.root + "/way/one"));
    CHECK(machine.files.itemsInFolder(machine.root + "/way/one", {}).problem() == FileProblem::linksInCircles);
    CHECK(machine.files.openPlainFile(machine.root + "/way/one").problem == FileProblem::linksInCircles);
}

TEST_CASE_TEMPLATE("a long chain of links is followed, and an endless one is not", Machine, OMBRIX_ALL_FILE_MACHINES)
{
    const Machine machine;
    machine.disk.file("0", "end");
    for (int number = 1; number <= 60; ++number)
        machine.disk.link(std::to_string(number), std::to_string(number - 1));
    CHECK(machine.files.exists(machine.root + "/35"));
    CHECK(machine.files.resolvedPath(machine.root + "/35") == machine.disk.path("0"));
    CHECK_FALSE(machine.files.exists(machine.root + "/60"));
    CHECK(machine.files.openPlainFile(machine.root + "/60").problem == FileProblem::linksInCircles);
}

TEST_CASE_TEMPLATE("a listing that is to stop at links follows none", Machine, OMBRIX_ALL_FILE_MACHINES)
{
    const Machine machine;
    machine.disk.file("real/project/mark");
    machine.disk.link("real/linked/mark", "../project/mark");
    machine.disk.link("way", "real");
    const platform::ListingRequest request { .marker = "mark", .links = LinkPolicy::stop };
    CHECK(machine.files.itemsInFolder(machine.root + "/way", request).problem() == FileProblem::linkOnTheWay);
    CHECK(machine.files.itemsInFolder(machine.root + "/way/project", request).problem() == FileProblem::linkOnTheWay);
    CHECK(linesOf(machine.files.itemsInFolder(machine.disk.path("real"), request))
        == Lines { "linked folder container holder-of-link", "project folder container holder" });
}

TEST_CASE_TEMPLATE("what is known of a path saves calls and changes no answer", Machine, OMBRIX_ALL_FILE_MACHINES)
{
    const Machine machine;
    machine.disk.file("folder/a.mov", "12345");
    machine.disk.link("way", "folder");
    const auto known = platform::PathKnowledge::realPlainFile;
    const auto opened = machine.files.openPlainFile(machine.root + "/folder/a.mov", known);
    REQUIRE(opened.file);
    CHECK(opened.file->status().size == 5);
    CHECK(machine.files.openPlainFile(machine.root + "/missing", known).problem == FileProblem::missing);
    CHECK(machine.files.openPlainFile(machine.root + "/folder", known).problem == FileProblem::notAPlainFile);
}
