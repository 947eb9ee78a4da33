// What every file system answers about items that no link is on the way to.

#include "platform/PathText.h"
#include "tests/platform/contract/Machines.h"
#include "tests/support/ListingText.h"

#include <doctest/doctest.h>

#include <algorithm>
#include <array>

#include <sys/stat.h>
#include <unistd.h>

using namespace tests;
using platform::FileProblem;
using platform::ItemFlags;
using platform::ItemKind;
using platform::ListingRequest;
using Lines = std::vector<std::string>;

namespace {

std::string readAll(const platform::OpenFile& file)
{
    std::array<char, 256> buffer {};
    const std::size_t count = file.read(0, std::as_writable_bytes(std::span(buffer)));
    return { buffer.data(), count };
}

} // namespace

TEST_CASE_TEMPLATE("a listing tells name, kind and flags of each item", Machine, OMBRIX_ALL_FILE_MACHINES)
{
    const Machine machine;
    machine.disk.folder("Trip");
    machine.disk.folder("Tool.app");
    machine.disk.folder("Loud.APP");
    machine.disk.file("a.mov");
    machine.disk.file("file.app");
    machine.disk.file(".secret");
    machine.disk.folder(".Trash");
    machine.disk.link("to Trip", "Trip");
    machine.disk.pipe("pipe");
    machine.disk.file("odd\xff\nname");
    CHECK(linesOf(machine.files.itemsInFolder(machine.root, {}))
        == Lines { ".Trash folder invisible container", ".secret invisible", "Loud.APP folder container package",
            "Tool.app folder container package", "Trip folder container", "a.mov", "file.app", "odd\xff\nname",
            "pipe other", "to Trip link" });
}

TEST_CASE_TEMPLATE("the names in a folder's list of hidden names are invisible", Machine, OMBRIX_ALL_FILE_MACHINES)
{
    const Machine machine;
    machine.disk.file("shown.mov");
    machine.disk.file("Hidden.mov");
    machine.disk.file("last.mov");
    machine.disk.folder("hidden folder");
    machine.disk.file(".hidden", "Hidden.mov\nhidden folder\nSHOWN.MOV\n\nnobody\nlast.mov");
    CHECK(linesOf(machine.files.itemsInFolder(machine.root, {}))
        == Lines { ".hidden invisible", "Hidden.mov invisible", "hidden folder folder invisible container",
            "last.mov invisible", "shown.mov" });
}

TEST_CASE_TEMPLATE("the flags of one item are those that a listing tells", Machine, OMBRIX_ALL_FILE_MACHINES)
{
    const Machine machine;
    machine.disk.folder("Trip");
    machine.disk.folder("Tool.bundle");
    machine.disk.file("named");
    machine.disk.file(".dot");
    machine.disk.link("link", "Trip");
    machine.disk.file(".hidden", "named\nlink\n");
    const auto listing = machine.files.itemsInFolder(machine.root, {});
    CHECK(listing.size() == 6);
    for (const platform::FolderItem item : listing) {
        CAPTURE(item.name);
        const ItemFlags flags = machine.files.itemFlags(machine.root + "/" + std::string(item.name));
        CHECK(flags.invisible == item.flags.invisible);
        CHECK(flags.container == item.flags.container);
        CHECK(flags.package == item.flags.package);
    }
    const ItemFlags none = machine.files.itemFlags(machine.root + "/.missing.app");
    CHECK_FALSE((none.invisible || none.container || none.package));
}

TEST_CASE_TEMPLATE("where there are no items, a listing says why", Machine, OMBRIX_ALL_FILE_MACHINES)
{
    const Machine machine;
    machine.disk.folder("empty");
    machine.disk.file("file");
    const auto problemOf = [&machine](const std::string& path) {
        const auto listing = machine.files.itemsInFolder(machine.root + path, {});
        CHECK(listing.empty());
        return listing.problem();
    };
    CHECK(problemOf("/empty") == FileProblem::none);
    CHECK(problemOf("/missing") == FileProblem::missing);
    CHECK(problemOf("/missing/below") == FileProblem::missing);
    CHECK(problemOf("/file") == FileProblem::notAFolder);
    CHECK(problemOf("/file/below") == FileProblem::notAFolder);
    CHECK(problemOf("/" + std::string(5000, 'x')) == FileProblem::pathTooLong);
    CHECK(problemOf(std::string("/zero\0byte", 10)) == FileProblem::missing);
    if (geteuid() != 0) {
        chmod(machine.disk.path("empty").c_str(), 0);
        CHECK(problemOf("/empty") == FileProblem::notPermitted);
    }
}

TEST_CASE_TEMPLATE("a listing tells the folder's own facts", Machine, OMBRIX_ALL_FILE_MACHINES)
{
    const Machine machine;
    machine.disk.folder("Trip");
    setModificationDate(machine.disk.path("Trip"), { 1'300'000'000, 123'456'789 });
    platform::ListingRequest request;
    request.folderStatus = true;
    const auto listing = machine.files.itemsInFolder(machine.root + "/Trip", request);
    REQUIRE(listing.folderStatus());
    CHECK(listing.folderStatus()->kind == ItemKind::folder);
    CHECK(listing.folderStatus()->modificationDate == platform::Date { 1'300'000'000, 123'456'789 });
    CHECK_FALSE(machine.files.itemsInFolder(machine.root + "/missing", request).folderStatus());
}

TEST_CASE_TEMPLATE("a listing tells which items hold a marker, and their dates", Machine, OMBRIX_ALL_FILE_MACHINES)
{
    const Machine machine;
    for (const char* path : { "project/mark", "folder as mark/mark/x", "plain/other" }) {
        machine.disk.file(path);
        setModificationDate(machine.disk.path(platform::pathByRemovingLastComponent(path)), { 1'300'000'000, 0 });
    }
    setModificationDate(machine.disk.path("folder as mark"), { 1'300'000'001, 0 });
    machine.disk.file("file");
    CHECK(linesOf(machine.files.itemsInFolder(machine.root, { .marker = "mark", .datesOfHolders = true }))
        == Lines { "file", "folder as mark folder container holder @1300000001", "plain folder container",
            "project folder container holder @1300000000" });
    CHECK(linesOf(machine.files.itemsInFolder(machine.root, { .marker = "mark" }))
        == Lines { "file", "folder as mark folder container holder", "plain folder container",
            "project folder container holder" });
}

TEST_CASE_TEMPLATE("status tells kind, size and dates", Machine, OMBRIX_ALL_FILE_MACHINES)
{
    const Machine machine;
    machine.disk.file("a.mov", "12345");
    setModificationDate(machine.disk.path("a.mov"), { 1'000'000'000, 5 });
    const auto status = machine.files.status(machine.root + "/a.mov");
    REQUIRE(status);
    CHECK(status->kind == ItemKind::file);
    CHECK(status->size == 5);
    CHECK(status->modificationDate == platform::Date { 1'000'000'000, 5 });
    CHECK(status->creationDate == platform::Date { 1'000'000'000, 5 });
    CHECK(machine.files.exists(machine.root));
    CHECK_FALSE(machine.files.exists(machine.root + "/missing"));
    CHECK_FALSE(machine.files.exists(machine.root + "/a.mov/below"));
    CHECK_FALSE(machine.files.exists(machine.root + "/" + std::string(5000, 'x')));
    CHECK_FALSE(machine.files.linkStatus(machine.root + "/missing"));
}

TEST_CASE_TEMPLATE(
    "a file that was modified after it was made was created when it was made", Machine, OMBRIX_ALL_FILE_MACHINES)
{
    const Machine machine;
    machine.disk.file("a.mov");
    setModificationDate(machine.disk.path("a.mov"), { 4'000'000'000, 0 });
    const auto status = machine.files.status(machine.root + "/a.mov");
    REQUIRE(status);
    CHECK(status->creationDate <= status->modificationDate);
}

TEST_CASE_TEMPLATE("only plain files are opened", Machine, OMBRIX_ALL_FILE_MACHINES)
{
    const Machine machine;
    machine.disk.file("file", "some bytes");
    machine.disk.folder("folder");
    machine.disk.pipe("pipe");
    const auto problemOf
        = [&machine](const std::string& path) { return machine.files.openPlainFile(machine.root + path).problem; };
    CHECK(problemOf("/folder") == FileProblem::notAPlainFile);
    CHECK(problemOf("/pipe") == FileProblem::notAPlainFile);
    CHECK(problemOf("/missing") == FileProblem::missing);
    CHECK(problemOf("/file/below") == FileProblem::notAFolder);
    CHECK(problemOf("/" + std::string(5000, 'x')) == FileProblem::pathTooLong);
    const auto opened = machine.files.openPlainFile(machine.root + "/file");
    REQUIRE(opened.file);
    CHECK(opened.problem == FileProblem::none);
    CHECK(readAll(*opened.file) == "some bytes");
    CHECK(opened.file->status().size == 10);
}

TEST_CASE_TEMPLATE("an open file is read from any place up to its end", Machine, OMBRIX_ALL_FILE_MACHINES)
{
    const Machine machine;
    machine.disk.file("file", "0123456789");
    const auto opened = machine.files.openPlainFile(machine.root + "/file");
    REQUIRE(opened.file);
    std::array<char, 4> buffer {};
    CHECK(opened.file->read(3, std::as_writable_bytes(std::span(buffer))) == 4);
    CHECK(std::string(buffer.data(), 4) == "3456");
    CHECK(opened.file->read(8, std::as_writable_bytes(std::span(buffer))) == 2);
    CHECK(opened.file->read(10, std::as_writable_bytes(std::span(buffer))) == 0);
    CHECK(opened.file->read(UINT64_MAX, std::as_writable_bytes(std::span(buffer))) == 0);
}

TEST_CASE_TEMPLATE("slashes more than needed and single dots change nothing", Machine, OMBRIX_ALL_FILE_MACHINES)
{
    const Machine machine;
    machine.disk.file("Trip/a.mov", "x");
    for (const char* path : { "/Trip/", "//Trip", "/./Trip", "/Trip/.", "/Trip/../Trip" }) {
        CAPTURE(path);
        CHECK(linesOf(machine.files.itemsInFolder(machine.root + path, {})) == Lines { "a.mov" });
        CHECK(machine.files.exists(machine.root + path));
        CHECK(machine.files.resolvedPath(machine.root + path) == machine.disk.path("Trip"));
    }
    CHECK_FALSE(machine.files.exists(machine.root + "/missing/../Trip"));
    CHECK(linesOf(machine.files.itemsInFolder("/" + machine.root + "/Trip", {})) == Lines { "a.mov" });
}

TEST_CASE_TEMPLATE(
    "the empty path names nothing, and resolves to some path all the same", Machine, OMBRIX_ALL_FILE_MACHINES)
{
    const Machine machine;
    CHECK_FALSE(machine.files.exists(""));
    CHECK(machine.files.itemsInFolder("", {}).problem() == FileProblem::missing);
    CHECK(machine.files.openPlainFile("").problem == FileProblem::missing);
    CHECK_FALSE(machine.files.resolvedPath("").empty());
}

TEST_CASE_TEMPLATE("a folder of a great many items is listed whole", Machine, OMBRIX_ALL_FILE_MACHINES)
{
    const Machine machine;
    for (int number = 0; number < 3000; ++number)
        machine.disk.file("many/a name that fills the buffer sooner " + std::to_string(number));
    const auto listing = machine.files.itemsInFolder(machine.root + "/many", {});
    Lines names = linesOf(listing);
    CHECK(names.size() == 3000);
    CHECK(std::unique(names.begin(), names.end()) == names.end());
}

TEST_CASE_TEMPLATE("items deeper than a path can name are missing, not harmful", Machine, OMBRIX_ALL_FILE_MACHINES)
{
    const Machine machine;
    const std::string deepest = makeNestedFolders(machine.disk.path("deep"), "a folder name", 2000);
    const std::string path = machine.root + "/deep" + deepest.substr(machine.disk.path("deep").size());
    CHECK(machine.files.itemsInFolder(path, {}).problem() == FileProblem::pathTooLong);
    CHECK_FALSE(machine.files.exists(path));
    CHECK(machine.files.itemsInFolder(path.substr(0, machine.root.size() + 5 + 14 * 100), {}).size() == 1);
}
