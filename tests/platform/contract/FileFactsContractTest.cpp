// What a listing tells of files beside their names, and of where its folder really lies.

#include "tests/platform/contract/Machines.h"
#include "tests/support/ListingText.h"

#include <doctest/doctest.h>

#include <algorithm>
#include <ctime>
#include <string>
#include <type_traits>

using namespace tests;
using platform::Date;
using platform::FolderItem;
using platform::FolderListing;
using platform::ListingRequest;
using Lines = std::vector<std::string>;

namespace {

constexpr ListingRequest withFacts { .fileFacts = true };
constexpr Date longAgo { 1'200'000'000, 123'456'789 };

/// Each item with the seconds of its creation and its size, or a dash, in order of names.
Lines factsOf(const FolderListing& listing)
{
    Lines lines;
    for (const FolderItem item : listing) {
        const std::string facts = item.facts
            ? "@" + std::to_string(item.facts->creationDate.seconds) + " " + std::to_string(item.facts->size)
            : "-";
        lines.push_back(std::string(item.name) + " " + facts);
    }
    std::sort(lines.begin(), lines.end());
    return lines;
}

/// Fills a folder with one item of each kind.
template <class Machine> void makeOneOfEachKind(const Machine& machine, const std::string& folder)
{
    setModificationDate(machine.disk.file(folder + "/a.mov", "12345"), longAgo);
    setModificationDate(machine.disk.file(folder + "/listed.mov", "1"), longAgo);
    setModificationDate(machine.disk.pipe(folder + "/pipe"), longAgo);
    machine.disk.file(folder + "/.dotted.mov", "12345");
    machine.disk.file(folder + "/.hidden", "listed.mov\n");
    machine.disk.file(folder + "/folder/mark");
    machine.disk.link(folder + "/link.mov", "a.mov");
    machine.disk.link(folder + "/nowhere.mov", "missing");
}

const Lines factsOfOneOfEachKind { ".dotted.mov -", ".hidden -", "a.mov @1200000000 5", "folder -", "link.mov -",
    "listed.mov @1200000000 1", "nowhere.mov -", "pipe @1200000000 0" };

/// Checks what a listing tells of the real path of `folder` against what resolving it answers.
template <class Machine> std::string realPathFrom(const Machine& machine, const std::string& folder)
{
    const FolderListing listing = machine.files.itemsInFolder(folder, {});
    const std::string resolved = machine.files.resolvedPath(folder);
    if (listing.pathIsReal())
        return resolved == folder && listing.otherRealPath().empty() ? "its own" : "wrongly its own";
    if (listing.otherRealPath().empty())
        return "not told";
    return listing.otherRealPath() == resolved ? "told" : "wrong: " + listing.otherRealPath();
}

} // namespace

TEST_CASE_TEMPLATE(
    "a listing tells creation and size of files and pipes, not of folders, links and names that hide them", Machine,
    OMBRIX_ALL_FILE_MACHINES)
{
    const Machine machine;
    makeOneOfEachKind(machine, "scan");
    CHECK(factsOf(machine.files.itemsInFolder(machine.root + "/scan", withFacts)) == factsOfOneOfEachKind);
    machine.disk.link("way", "scan");
    CHECK(factsOf(machine.files.itemsInFolder(machine.root + "/way", withFacts)) == factsOfOneOfEachKind);
}

TEST_CASE_TEMPLATE(
    "facts are told where they are asked for, and change nothing else", Machine, OMBRIX_ALL_FILE_MACHINES)
{
    const Machine machine;
    makeOneOfEachKind(machine, "scan");
    const ListingRequest marked { .marker = "mark", .datesOfHolders = true };
    ListingRequest both = marked;
    both.fileFacts = true;
    const FolderListing without = machine.files.itemsInFolder(machine.root + "/scan", marked);
    const FolderListing with = machine.files.itemsInFolder(machine.root + "/scan", both);
    for (const FolderItem item : without)
        CHECK_FALSE(item.facts);
    CHECK(linesOf(with) == linesOf(without));
    CHECK(factsOf(with) == factsOfOneOfEachKind);
}

TEST_CASE_TEMPLATE(
    "facts are those that the file's status tells, with their fractions", Machine, OMBRIX_ALL_FILE_MACHINES)
{
    const Machine machine;
    setModificationDate(machine.disk.file("scan/a.mov", "123"), longAgo);
    const FolderListing listing = machine.files.itemsInFolder(machine.root + "/scan", withFacts);
    REQUIRE(listing.size() == 1);
    REQUIRE(listing[0].facts);
    const auto status = machine.files.status(machine.root + "/scan/a.mov");
    REQUIRE(status);
    CHECK(listing[0].facts == platform::FileFacts { longAgo, 3 });
    CHECK(status->creationDate == longAgo);
    CHECK(status->size == 3);
}

TEST_CASE_TEMPLATE(
    "a file was created when it was born or last changed, whichever was earlier", Machine, OMBRIX_ALL_FILE_MACHINES)
{
    const Machine machine;
    const std::time_t before = std::time(nullptr);
    setModificationDate(machine.disk.file("scan/earlier.mov"), longAgo);
    setModificationDate(machine.disk.file("scan/later.mov"), { before + 86'400, 0 });
    for (const FolderItem item : machine.files.itemsInFolder(machine.root + "/scan", withFacts)) {
        CAPTURE(item.name);
        const auto status = machine.files.status(machine.root + "/scan/" + std::string(item.name));
        REQUIRE(item.facts);
        REQUIRE(status);
        CHECK(item.facts->creationDate == status->creationDate);
        if (item.name == "earlier.mov")
            CHECK(item.facts->creationDate == longAgo);
        else if (item.facts->creationDate != status->modificationDate) // birth times are kept here
            CHECK(item.facts->creationDate.seconds <= std::time(nullptr));
    }
}

TEST_CASE("an added link has no facts, whatever stands in its place on disk")
{
    const TemporaryFolder disk;
    disk.file("scan/a.mov", "12345");
    disk.file("scan/b.mov", "123");
    disk.file("elsewhere/a.mov", "1");
    disk.link("way", "scan");
    const ListedVolumes volumes;
    const platform::LinuxFileSystem kernel;
    const platform::LinkTable table { { { disk.path("scan/a.mov"), disk.path("elsewhere/a.mov") } }, volumes, kernel };
    const platform::LinkedFileSystem files { kernel, table };
    for (const char* folder : { "scan", "way" }) {
        CAPTURE(folder);
        const FolderListing listing = files.itemsInFolder(disk.path(folder), withFacts);
        CHECK(linesOf(listing) == Lines { "a.mov link", "b.mov" });
        for (const FolderItem item : listing)
            CHECK(item.facts.has_value() == (item.name == "b.mov"));
    }
    ListingRequest stopping = withFacts;
    stopping.links = platform::LinkPolicy::stop;
    for (const FolderItem item : files.itemsInFolder(disk.path("scan"), stopping))
        CHECK(item.facts.has_value() == (item.name == "b.mov"));
}

TEST_CASE("facts stay with their item when it is put into another listing, and a date stays a date")
{
    FolderListing listing;
    FolderItem file;
    file.name = "a.mov";
    file.facts = platform::FileFacts { longAgo, 7 };
    listing.append(file);
    FolderItem folder;
    folder.name = "folder";
    folder.modificationDate = longAgo;
    listing.append(folder);
    listing.setItem(0, listing[0]);
    CHECK(listing[0].facts == platform::FileFacts { longAgo, 7 });
    CHECK_FALSE(listing[0].modificationDate);
    CHECK(listing[1].modificationDate == longAgo);
    CHECK_FALSE(listing[1].facts);
    file.facts.reset();
    listing.setItem(0, file);
    CHECK_FALSE(listing[0].facts);
}

TEST_CASE_TEMPLATE("what a listing tells of its folder's real path is what resolving the folder answers", Machine,
    OMBRIX_ALL_FILE_MACHINES)
{
    const Machine machine;
    machine.disk.file("one/two/three/a.mov");
    machine.disk.file("plain file");
    machine.disk.link("absolute", machine.disk.path("one"));
    machine.disk.link("one/relative", "two");
    machine.disk.link("one/two/back", "../..");
    machine.disk.link("through root", machine.root + "/one");
    machine.disk.link("nowhere", "missing");
    machine.disk.link("circle", "circle");
    for (const char* path : { "", "/one", "/one/two/three", "/absolute", "/absolute/relative", "/one/relative/three",
             "/one/two/back", "/one/two/back/absolute/relative/back/one", "/through root/two", "/one/", "//one//two",
             "/one/../one", "/absolute/..", "/absolute/relative/..", "/one/./two", "/missing", "/absolute/missing",
             "/nowhere", "/circle", "/plain file", "/plain file/x", "/absolute/" }) {
        CAPTURE(path);
        const std::string answer = realPathFrom(machine, machine.root + path);
        CHECK((answer == "told" || answer == "its own" || answer == "not told"));
    }
    CHECK(realPathFrom(machine, "/") != "told");
}

TEST_CASE_TEMPLATE("a listing below a link that the machine adds, or through links on disk, tells the real path",
    Machine, MachineWithVolumes, MachineBelowVolume, DescribedMachineWithLinks, DescribedMachineBelowLink)
{
    const Machine machine;
    machine.disk.file("one/two/a.mov");
    machine.disk.link("absolute", machine.disk.path("one"));
    CHECK(realPathFrom(machine, machine.root + "/absolute/two") == "told");
    CHECK(
        realPathFrom(machine, machine.root + "/one/two") == (machine.root == machine.disk.path() ? "its own" : "told"));
}

TEST_CASE("where added links lead into one another a listing tells the real path, or does not tell it")
{
    const TemporaryFolder disk;
    disk.file("library/two/a.mov");
    disk.file("served/b.mov");
    disk.link("library/to added", "/Ombrix Middle/two");
    disk.link("library/to served", "two/inner");
    const ListedVolumes volumes;
    const platform::LinuxFileSystem kernel;
    const platform::LinkTable table {
        { { "/Ombrix Added", "/Ombrix Middle" }, { "/Ombrix Middle", disk.path("library") },
            { disk.path("library/two/inner"), disk.path("served") }, { "/Ombrix Circle", "/Ombrix Circle/x" } },
        volumes, kernel
    };
    struct {
        platform::LinkedFileSystem files;
    } const machine { { kernel, table } };
    for (const char* path : { "/Ombrix Added", "/Ombrix Added/two", "/Ombrix Middle/to added", "/Ombrix Added/to added",
             "/Ombrix Added/two/inner", "/Ombrix Middle/to served", "/Ombrix Added/to served/..", "/Ombrix Circle",
             "/Ombrix Added/missing" }) {
        CAPTURE(path);
        const std::string answer = realPathFrom(machine, path);
        CHECK((answer == "told" || answer == "not told"));
    }
    CHECK(machine.files.itemsInFolder("/Ombrix Added/to served", {}).otherRealPath() == disk.path("served"));
    CHECK(machine.files.itemsInFolder("/Ombrix Added/to added", {}).otherRealPath() == disk.path("library/two"));
}

TEST_CASE_TEMPLATE(
    "a listing that is asked for what holds it tells whether that has the marker, and is empty where it has not",
    Machine, OMBRIX_ALL_FILE_MACHINES)
{
    const Machine machine;
    for (const char* path : { "plain/mark", "plain/Media/a.mov", "unmarked/Media/a.mov", "linked/mark", "other/mark",
             "other/Media/a.mov", "dead/Media/a.mov", "follows/Media/a.mov", "none/mark" })
        machine.disk.file(path);
    machine.disk.link("linked/Media", "../other/Media");
    machine.disk.link("dead/mark", "missing");
    machine.disk.link("follows/mark", "../plain/mark");
    setModificationDate(machine.disk.path("linked"), longAgo);
    constexpr ListingRequest request { .markerBeside = "mark" };
    Lines told;
    for (const char* name : { "plain", "unmarked", "linked", "dead", "follows", "none" }) {
        CAPTURE(name);
        const std::string folder = machine.root + "/" + name;
        const FolderListing listing = machine.files.itemsInFolder(folder + "/Media", request);
        const std::optional<platform::FolderHolder>& holder = listing.holder();
        const bool isUnmarked = holder && !holder->hasMarker;
        CHECK(
            linesOf(listing) == (isUnmarked ? Lines {} : linesOf(machine.files.itemsInFolder(folder + "/Media", {}))));
        if (!holder)
            continue;
        told.emplace_back(name);
        CHECK(machine.files.exists(folder + "/mark") == holder->hasMarker);
        if (holder->hasMarker)
            CHECK(holder->modificationDate == machine.files.status(folder)->modificationDate);
    }
    Lines expected { "plain", "unmarked", "linked", "dead", "follows", "none" };
    // Where added links may lead, a link that leads nowhere in the kernel is no proof.
    if (std::is_same_v<Machine, MachineWithVolumes>)
        std::erase(expected, "dead");
    CHECK(told == (std::is_same_v<Machine, KernelMachine> ? Lines {} : expected));
}

TEST_CASE_TEMPLATE("a listing in the memory of another tells nothing of that", Machine, OMBRIX_ALL_FILE_MACHINES)
{
    const Machine machine;
    makeOneOfEachKind(machine, "scan");
    machine.disk.file("few/b.mov");
    FolderListing listing = machine.files.itemsInFolder(machine.root + "/scan", { .folderStatus = true });
    listing = machine.files.itemsInFolder(machine.root + "/few", { .spare = &listing });
    CHECK(linesOf(listing) == Lines { "b.mov" });
    CHECK_FALSE(listing.folderStatus());
    CHECK_FALSE(listing.hasLinks());
    listing = machine.files.itemsInFolder(machine.root + "/scan", { .fileFacts = true, .spare = &listing });
    CHECK(factsOf(listing) == factsOfOneOfEachKind);
}
