// Links that were named one by one, as a description names them.

#include "tests/platform/common/LinkedFiles.h"
#include "tests/support/ListingText.h"

#include <doctest/doctest.h>

using namespace tests;
using platform::FileProblem;
using platform::ItemKind;
using platform::ListingRequest;
using Lines = std::vector<std::string>;

namespace {

constexpr ListingRequest markedWithDates { .marker = "mark", .datesOfHolders = true };

} // namespace

TEST_CASE("what lies below a link is served from its target under the spelling that was asked for")
{
    LinkedFiles machine;
    machine.disk.file("real/Trip/a.mov", "12345");
    machine.link("/Added", machine.disk.path("real"));
    CHECK(linesOf(machine.files().itemsInFolder("/Added", {})) == Lines { "Trip folder container" });
    CHECK(linesOf(machine.files().itemsInFolder("/Added/Trip", {})) == Lines { "a.mov" });
    REQUIRE(machine.files().status("/Added/Trip/a.mov"));
    CHECK(machine.files().status("/Added/Trip/a.mov")->size == 5);
    CHECK(machine.files().openPlainFile("/Added/Trip/a.mov").file);
    CHECK(machine.files().resolvedPath("/Added/Trip/a.mov") == machine.disk.path("real/Trip/a.mov"));
    CHECK(machine.files().resolvedPath("/Added/missing") == machine.disk.path("real/missing"));
}

TEST_CASE("a link's path is whole components")
{
    LinkedFiles machine;
    machine.disk.file("real/a.mov");
    machine.link("/Added", machine.disk.path("real"));
    CHECK_FALSE(machine.files().exists("/Added more/a.mov"));
    CHECK_FALSE(machine.files().exists("/Adde/a.mov"));
    CHECK(machine.files().resolvedPath("/Added more") == "/Added more");
}

TEST_CASE("the longest link wins")
{
    LinkedFiles machine;
    machine.disk.file("outer/inner/wrong");
    machine.disk.file("elsewhere/right");
    machine.link("/Added", machine.disk.path("outer")).link("/Added/inner", machine.disk.path("elsewhere"));
    CHECK(linesOf(machine.files().itemsInFolder("/Added/inner", {})) == Lines { "right" });
    CHECK(machine.files().resolvedPath("/Added/inner/right") == machine.disk.path("elsewhere/right"));
}

TEST_CASE("a link that stands where nothing is on disk shows in no listing")
{
    LinkedFiles machine;
    machine.disk.file("folder/a.mov");
    machine.disk.folder("target");
    machine.link(machine.disk.path("folder/added"), machine.disk.path("target"));
    CHECK(linesOf(machine.files().itemsInFolder(machine.disk.path("folder"), {})) == Lines { "a.mov" });
    CHECK(machine.files().exists(machine.disk.path("folder/added")));
}

TEST_CASE("a link that stands where a real folder is counts as a link in a listing")
{
    LinkedFiles machine;
    machine.disk.folder("folder/Trip.app/only on disk");
    machine.disk.file("folder/.Hid/x");
    machine.disk.file("target/mark");
    setModificationDate(machine.disk.path("target"), { 1'300'000'000, 0 });
    machine.link(machine.disk.path("folder/Trip.app"), machine.disk.path("target"));
    machine.link(machine.disk.path("folder/.Hid"), machine.disk.path("missing"));
    CHECK(linesOf(machine.files().itemsInFolder(machine.disk.path("folder"), markedWithDates))
        == Lines { ".Hid link invisible", "Trip.app link holder @1300000000" });
    const platform::ItemFlags flags = machine.files().itemFlags(machine.disk.path("folder/Trip.app"));
    CHECK_FALSE((flags.invisible || flags.container || flags.package));
    CHECK_FALSE(machine.files().exists(machine.disk.path("folder/Trip.app/only on disk")));
    CHECK(linesOf(machine.files().itemsInFolder(machine.disk.path("folder/Trip.app"), {})) == Lines { "mark" });
}

TEST_CASE("a link counts as one in a listing whichever way its folder was spelled")
{
    LinkedFiles machine;
    machine.disk.folder("folder/Trip");
    machine.disk.file("target/mark");
    machine.disk.link("way", machine.disk.path("folder"));
    machine.link(machine.disk.path("folder/Trip"), machine.disk.path("target"));
    machine.link("/Added", machine.disk.path("folder"));
    for (const std::string& folder : { machine.disk.path("folder"), machine.disk.path("way"), std::string("/Added"),
             std::string("/Added/"), "/" + machine.disk.path("folder") }) {
        CAPTURE(folder);
        CHECK(linesOf(machine.files().itemsInFolder(folder, { .marker = "mark" })) == Lines { "Trip link holder" });
    }
    // Here the link stands at a path that leads through another one.
    LinkedFiles other;
    other.disk.folder("folder/Trip");
    other.disk.file("target/mark");
    other.link("/Added", other.disk.path("folder")).link("/Added/Trip", other.disk.path("target"));
    CHECK(linesOf(other.files().itemsInFolder("/Added", { .marker = "mark" })) == Lines { "Trip link holder" });
    CHECK(linesOf(other.files().itemsInFolder(other.disk.path("folder"), { .marker = "mark" }))
        == Lines { "Trip folder container" });
}

TEST_CASE("a marker may be an added link")
{
    LinkedFiles machine;
    machine.disk.folder("folder/Trip");
    machine.disk.file("folder/Gone/mark");
    machine.disk.folder("folder/Plain");
    machine.disk.file("target");
    machine.link(machine.disk.path("folder/Trip/mark"), machine.disk.path("target"));
    machine.link(machine.disk.path("folder/Gone/mark"), machine.disk.path("missing"));
    CHECK(linesOf(machine.files().itemsInFolder(machine.disk.path("folder"), { .marker = "mark" }))
        == Lines { "Gone folder container", "Plain folder container", "Trip folder container holder" });
}

TEST_CASE("a list of hidden names may be an added link")
{
    LinkedFiles machine;
    machine.disk.file("folder/a.mov");
    machine.disk.file("folder/b.mov");
    machine.disk.file("list", "a.mov\nadded\n");
    machine.link(machine.disk.path("folder/.hidden"), machine.disk.path("list"));
    machine.link(machine.disk.path("folder/added"), machine.disk.path("list"));
    CHECK(linesOf(machine.files().itemsInFolder(machine.disk.path("folder"), {}))
        == Lines { "a.mov invisible", "b.mov" });
    CHECK(machine.files().itemFlags(machine.disk.path("folder/a.mov")).invisible);
    CHECK(machine.files().itemFlags(machine.disk.path("folder/added")).invisible);
    CHECK_FALSE(machine.files().itemFlags(machine.disk.path("folder/b.mov")).invisible);
}

TEST_CASE("the target of a real link is looked up among the added ones")
{
    LinkedFiles machine;
    machine.disk.file("target/mark", "123");
    machine.disk.link("folder/absolute", "/Added");
    machine.disk.link("folder/relative", "../added");
    machine.disk.link("folder/file", "/Added/mark");
    machine.disk.link("folder/holder/mark", "/Added/mark");
    machine.link("/Added", machine.disk.path("target")).link(machine.disk.path("added"), machine.disk.path("target"));
    const std::string folder = machine.disk.path("folder");
    CHECK(linesOf(machine.files().itemsInFolder(folder, { .marker = "mark" }))
        == Lines { "absolute link holder", "file link", "holder folder container holder", "relative link holder" });
    CHECK(machine.files().exists(folder + "/absolute/mark"));
    CHECK(linesOf(machine.files().itemsInFolder(folder + "/relative", {})) == Lines { "mark" });
    CHECK(machine.files().resolvedPath(folder + "/absolute/mark") == machine.disk.path("target/mark"));
    CHECK(machine.files().resolvedPath(folder + "/relative/missing") == machine.disk.path("target/missing"));
    REQUIRE(machine.files().status(folder + "/file"));
    CHECK(machine.files().status(folder + "/file")->size == 3);
    CHECK(machine.files().openPlainFile(folder + "/absolute/mark").file);
    CHECK(machine.files().linkTarget(folder + "/absolute") == std::string("/Added"));
}

TEST_CASE("an added link hides what really stands below its path, also for links that lead there")
{
    LinkedFiles machine;
    machine.disk.file("shadowed/on disk");
    machine.disk.file("target/served");
    machine.disk.link("way", "shadowed");
    machine.link(machine.disk.path("shadowed"), machine.disk.path("target"));
    CHECK(linesOf(machine.files().itemsInFolder(machine.disk.path("way"), {})) == Lines { "served" });
    CHECK_FALSE(machine.files().exists(machine.disk.path("way/on disk")));
    CHECK(machine.files().openPlainFile(machine.disk.path("way/served")).file);
    CHECK(machine.files().resolvedPath(machine.disk.path("way")) == machine.disk.path("target"));
}

TEST_CASE("a link may lead to a path that is itself below a link")
{
    LinkedFiles machine;
    machine.disk.file("target/inner/a.mov");
    machine.link("/First", "/Second/inner").link("/Second", machine.disk.path("target"));
    CHECK(machine.files().exists("/First/a.mov"));
    CHECK(machine.files().resolvedPath("/First/a.mov") == machine.disk.path("target/inner/a.mov"));
}

TEST_CASE("added links in circles end")
{
    LinkedFiles machine;
    machine.link("/One", "/Two").link("/Two", "/One").link("/Self", "/Self").link("/Grows", "/Grows/more");
    for (const char* path : { "/One", "/Two/x", "/Self", "/Grows", "/Self/below" }) {
        CAPTURE(path);
        CHECK_FALSE(machine.files().exists(path));
        CHECK(machine.files().itemsInFolder(path, {}).problem() == FileProblem::linksInCircles);
        CHECK(machine.files().openPlainFile(path).problem == FileProblem::linksInCircles);
        CHECK(machine.files().resolvedPath(path) == path);
    }
    CHECK(machine.files().linkStatus("/One"));
}

TEST_CASE("real and added links that lead to each other end")
{
    LinkedFiles machine;
    machine.disk.link("real", "/Added");
    machine.link("/Added", machine.disk.path("real"));
    CHECK_FALSE(machine.files().exists("/Added"));
    CHECK_FALSE(machine.files().exists(machine.disk.path("real/x")));
    CHECK(machine.files().resolvedPath(machine.disk.path("real/x")) == machine.disk.path("real/x"));
}

TEST_CASE("a link's own status and target are a link's")
{
    LinkedFiles machine;
    machine.disk.file("target/a.mov", "12345");
    machine.disk.folder("folder/real");
    machine.link("/Added", machine.disk.path("target"));
    machine.link(machine.disk.path("folder/real"), machine.disk.path("target"));
    for (const std::string& path :
        { std::string("/Added"), machine.disk.path("folder/real"), std::string("/Added/") }) {
        CAPTURE(path);
        REQUIRE(machine.files().linkStatus(path));
        CHECK(machine.files().linkStatus(path)->kind == ItemKind::symbolicLink);
        CHECK(machine.files().linkStatus(path)->size == machine.disk.path("target").size());
        CHECK(machine.files().linkTarget(path) == machine.disk.path("target"));
        REQUIRE(machine.files().status(path));
        CHECK(machine.files().status(path)->kind == ItemKind::folder);
    }
    REQUIRE(machine.files().linkStatus("/Added/a.mov"));
    CHECK(machine.files().linkStatus("/Added/a.mov")->kind == ItemKind::file);
    CHECK_FALSE(machine.files().linkTarget("/Added/a.mov"));
}

TEST_CASE("two dots after a link mean the folder that holds its target")
{
    LinkedFiles machine;
    machine.disk.file("one/two/here");
    machine.link("/Added", machine.disk.path("one/two"));
    CHECK(machine.files().exists("/Added/../two/here"));
    CHECK(linesOf(machine.files().itemsInFolder("/Added/..", {})) == Lines { "two folder container" });
    CHECK(machine.files().exists(machine.disk.path("one/../../../../../../../../Added/here")));
}

TEST_CASE("a link to a file is opened and has its facts")
{
    LinkedFiles machine;
    machine.disk.file("a.mov", "12345");
    machine.link("/Added.mov", machine.disk.path("a.mov"));
    CHECK(machine.files().openPlainFile("/Added.mov").file);
    CHECK(machine.files().status("/Added.mov")->size == 5);
    CHECK(machine.files().itemsInFolder("/Added.mov", {}).problem() == FileProblem::notAFolder);
    CHECK_FALSE(machine.files().exists("/Added.mov/below"));
}

TEST_CASE("a folder's path is known to be real when nothing was followed")
{
    LinkedFiles machine;
    machine.disk.folder("folder/Trip");
    machine.disk.link("way", "folder");
    machine.link("/Added", machine.disk.path("folder"));
    CHECK(machine.files().itemsInFolder(machine.disk.path("folder"), {}).pathIsReal());
    CHECK_FALSE(machine.files().itemsInFolder(machine.disk.path("way"), {}).pathIsReal());
    CHECK_FALSE(machine.files().itemsInFolder("/Added", {}).pathIsReal());
    CHECK_FALSE(machine.files().itemsInFolder("/Added/Trip", {}).pathIsReal());
    CHECK_FALSE(machine.files().itemsInFolder(machine.disk.path("folder/Trip/.."), {}).pathIsReal());
    CHECK_FALSE(machine.files().itemsInFolder(machine.disk.path("folder") + "/", {}).pathIsReal());
}

TEST_CASE("a folder that the disk fails to read says so through a link")
{
    LinkedFiles machine;
    machine.disk.folder("folder/Trip");
    machine.link("/Added", machine.disk.path("folder"));
    machine.calls.whenListing = [](std::string_view) { return FileProblem::readError; };
    CHECK(machine.files().itemsInFolder("/Added", {}).problem() == FileProblem::readError);
}

TEST_CASE("a folder with no link on the way costs one call, whatever was added elsewhere")
{
    LinkedFiles machine;
    machine.disk.folder("folder/Trip");
    SUBCASE("nothing was added") { }
    SUBCASE("links were named")
    {
        machine.link("/Added", "/elsewhere");
    }
    const platform::LinkedFileSystem& files = machine.files();
    Lines calls;
    machine.calls.onEachCall = [&calls](std::string_view path) { calls.emplace_back(path); };
    CHECK(files.itemsInFolder(machine.disk.path("folder"), markedWithDates).size() == 1);
    CHECK(calls == Lines { machine.disk.path("folder") });
    CHECK(machine.volumes.timesListed == 0);
}
