#include "platform/linux/FolderOpening.h"
#include "platform/linux/LinuxFileSystem.h"
#include "tests/platform/linux/Environment.h"
#include "tests/support/TemporaryFolder.h"

#include <doctest/doctest.h>

#include <map>
#include <string>
#include <vector>

#include <sys/inotify.h>
#include <sys/socket.h>
#include <sys/stat.h>
#include <sys/sysmacros.h>
#include <sys/un.h>
#include <unistd.h>

using platform::FileProblem;
using platform::FolderItem;
using platform::FolderListing;
using platform::ItemKind;
using platform::LinkPolicy;
using platform::LinuxFileSystem;
using platform::ListingRequest;
using platform::MarkerAnswer;
using tests::TemporaryFolder;

namespace {

std::map<std::string, FolderItem> itemsByName(const FolderListing& listing)
{
    std::map<std::string, FolderItem> items;
    for (const FolderItem item : listing)
        items.emplace(item.name, item);
    return items;
}

ListingRequest asking(std::string_view marker, LinkPolicy links)
{
    ListingRequest request;
    request.marker = marker;
    request.datesOfHolders = true;
    request.links = links;
    return request;
}

void makeSocket(const std::string& path)
{
    const int number = socket(AF_UNIX, SOCK_STREAM, 0);
    sockaddr_un address {};
    address.sun_family = AF_UNIX;
    REQUIRE(path.size() < sizeof(address.sun_path));
    path.copy(address.sun_path, path.size());
    REQUIRE(bind(number, reinterpret_cast<const sockaddr*>(&address), sizeof(address)) == 0);
    close(number);
}

} // namespace

TEST_CASE("a folder opens step by step exactly as it opens in one call that follows no links")
{
    const TemporaryFolder temporary;
    temporary.file("real/inner/file");
    temporary.link("link", temporary.path("real"));
    temporary.link("real/circle", "circle");
    temporary.link("real/inner/last", ".");
    const std::vector<std::string> paths { "/", "real", "real/", "real//inner", "real/./inner", "real/../real", "link",
        "link/", "link/inner", "link/missing", "real/inner/last", "real/circle", "real/circle/x", "missing",
        "missing/link", "real/inner/file", "real/inner/file/x", std::string(300, 'n'), std::string(5000, '/') };
    for (const std::string& relativePath : paths) {
        const std::string path = relativePath == "/" ? relativePath : temporary.path() + '/' + relativePath;
        CAPTURE(path);
        const auto inOneCall = platform::openFolder(path, LinkPolicy::stop);
        const auto stepByStep = platform::openFolderStepByStep(path);
        CHECK(stepByStep.problem == inOneCall.problem);
        CHECK(stepByStep.descriptor.isOpen() == inOneCall.descriptor.isOpen());
    }
}

TEST_CASE("a folder opened step by step is the one that was named")
{
    const TemporaryFolder temporary;
    temporary.file("one/two/three");
    struct stat expected { };
    struct stat found { };
    REQUIRE(stat(temporary.path("one/two").c_str(), &expected) == 0);
    const auto folder = platform::openFolderStepByStep(temporary.path("one//two/"));
    REQUIRE(fstat(folder.descriptor.number(), &found) == 0);
    CHECK(found.st_ino == expected.st_ino);
}

TEST_CASE("sockets, pipes and devices are neither files nor folders, and nobody opens them")
{
    const TemporaryFolder temporary;
    makeSocket(temporary.path("socket"));
    temporary.pipe("pipe");
    std::vector<std::string> names { "pipe", "socket" };
    if (mknod(temporary.path("device").c_str(), S_IFCHR | 0600, makedev(1, 3)) == 0)
        names.emplace_back("device");
    const LinuxFileSystem files;
    const FolderListing listing = files.itemsInFolder(temporary.path(), asking("marker", LinkPolicy::follow));
    CHECK(listing.size() == names.size());
    for (const FolderItem item : listing) {
        CHECK(item.kind == ItemKind::other);
        CHECK(!item.flags.container);
        CHECK(item.marker == MarkerAnswer::absent);
    }
    for (const std::string& name : names) {
        CAPTURE(name);
        CHECK(files.openPlainFile(temporary.path(name)).problem == FileProblem::notAPlainFile);
        CHECK(files.itemsInFolder(temporary.path(name), {}).problem() == FileProblem::notAFolder);
        CHECK(files.status(temporary.path(name))->kind == ItemKind::other);
    }
}

TEST_CASE("a pipe is not even opened for a moment, whatever it is called")
{
    const TemporaryFolder temporary;
    const std::string pipe = temporary.pipe(".hidden");
    const int watch = inotify_init1(IN_NONBLOCK | IN_CLOEXEC);
    REQUIRE(inotify_add_watch(watch, pipe.c_str(), IN_OPEN) >= 0);
    const LinuxFileSystem files;
    CHECK(files.openPlainFile(pipe).problem == FileProblem::notAPlainFile);
    CHECK(files.itemsInFolder(temporary.path(), {}).size() == 1);
    CHECK(files.itemFlags(pipe).invisible);
    CHECK(!files.itemFlags(temporary.path("none")).invisible);
    char events[512];
    CHECK(read(watch, events, sizeof(events)) == -1);
    close(watch);
}

TEST_CASE("a container is a package when its extension says so, in capital or small letters")
{
    const TemporaryFolder temporary;
    const std::vector<std::string> packages { "a.app", "b.BUNDLE", "c.frameWork", "d.framewor\u212a", "e.plugin",
        "f.obplugin", "g.x.app", "..app" };
    const std::vector<std::string> others { "app", ".app", "h.app.", "i.apps", "j.app ", "k.plugi", "l.obplugins" };
    for (const std::string& name : packages)
        temporary.folder(name);
    for (const std::string& name : others)
        temporary.folder(name);
    temporary.file("file.app");
    temporary.link("link.app", "a.app");
    const LinuxFileSystem files;
    const FolderListing listing = files.itemsInFolder(temporary.path(), {});
    const auto items = itemsByName(listing);
    CHECK(items.size() == packages.size() + others.size() + 2);
    for (const auto& entry : items) {
        const std::string& name = entry.first;
        const FolderItem& item = entry.second;
        CAPTURE(name);
        const bool isPackage = std::find(packages.begin(), packages.end(), name) != packages.end();
        CHECK(item.flags.package == isPackage);
        CHECK(files.itemFlags(temporary.path(name)).package == isPackage);
    }
}

TEST_CASE("names in .hidden are compared byte by byte, and the last line may lack its end")
{
    const TemporaryFolder temporary;
    for (const char* name : { "plain", "with space", "bad\xff", "CASE", "carriage", "last", "shown" })
        temporary.file(name);
    temporary.file(".hidden", "plain\n\nwith space\nbad\xff\ncase\ncarriage\r\nmissing\nlast");
    const LinuxFileSystem files;
    const FolderListing listing = files.itemsInFolder(temporary.path(), {});
    std::map<std::string, bool> invisible;
    for (const FolderItem item : listing)
        invisible.emplace(item.name, item.flags.invisible);
    CHECK(invisible
        == std::map<std::string, bool> { { "plain", true }, { "with space", true }, { "bad\xff", true },
            { "CASE", false }, { "carriage", false }, { "last", true }, { "shown", false }, { ".hidden", true } });
    for (const auto& [name, isInvisible] : invisible)
        CHECK(files.itemFlags(temporary.path(name)).invisible == isInvisible);
}

TEST_CASE("of an enormous .hidden what fits is read, and the line that is cut names nothing")
{
    const TemporaryFolder temporary;
    constexpr std::size_t limit = 16 << 20;
    std::string text = "first\n";
    text.append(limit - text.size() - 3, '\n').append("beyond\n");
    temporary.file("first");
    temporary.file("bey");
    temporary.file("beyond");
    temporary.file(".hidden", text);
    const LinuxFileSystem files;
    const FolderListing listing = files.itemsInFolder(temporary.path(), {});
    for (const FolderItem item : listing) {
        CAPTURE(std::string(item.name));
        CHECK(item.flags.invisible == (item.name == "first" || item.name == ".hidden"));
    }
}

TEST_CASE("a marker is found inside folders, and through links only where links are followed")
{
    const TemporaryFolder temporary;
    const std::string longName(255, 'n');
    temporary.file("holder/marker");
    temporary.file(longName + "/marker");
    temporary.folder("empty");
    temporary.file("file");
    temporary.link("byLink/marker", "nowhere");
    temporary.link("byGoodLink/marker", temporary.path("file"));
    temporary.link("link", "holder");
    const LinuxFileSystem files;
    const auto markers = [&](LinkPolicy links, bool followsMarkers = false) {
        ListingRequest request = asking("marker", links);
        request.followsMarkers = followsMarkers;
        const FolderListing listing = files.itemsInFolder(temporary.path(), request);
        std::map<std::string, MarkerAnswer> answers;
        for (const FolderItem item : listing) {
            answers.emplace(item.name, item.marker);
            CHECK(item.modificationDate.has_value() == (item.marker != MarkerAnswer::absent));
        }
        return answers;
    };
    std::map<std::string, MarkerAnswer> expected { { "holder", MarkerAnswer::present },
        { longName, MarkerAnswer::present }, { "empty", MarkerAnswer::absent }, { "file", MarkerAnswer::absent },
        { "byLink", MarkerAnswer::absent }, { "byGoodLink", MarkerAnswer::present },
        { "link", MarkerAnswer::present } };
    CHECK(markers(LinkPolicy::follow) == expected);
    expected["byLink"] = expected["byGoodLink"] = MarkerAnswer::link;
    expected["link"] = MarkerAnswer::absent;
    CHECK(markers(LinkPolicy::stop) == expected);
    expected["byGoodLink"] = MarkerAnswer::present;
    CHECK(markers(LinkPolicy::stop, true) == expected);
}

TEST_CASE("a folder that may not be listed, and one that may only be listed, answer what they allow")
{
    const TemporaryFolder temporary;
    temporary.file("closed/x");
    temporary.file("listable/holder/marker");
    temporary.file("passable/name.app/x");
    temporary.file("passable/.hidden", "name.app\n");
    chmod(temporary.path().c_str(), 0755);
    chmod(temporary.path("closed").c_str(), 0);
    chmod(temporary.path("listable").c_str(), 0444);
    chmod(temporary.path("passable").c_str(), 0711);
    const auto check = [&] {
        const LinuxFileSystem files;
        const FolderListing listable
            = files.itemsInFolder(temporary.path("listable"), asking("marker", LinkPolicy::stop));
        const auto stepByStep = platform::openFolderStepByStep(temporary.path("listable"));
        const auto closedStepByStep = platform::openFolderStepByStep(temporary.path("closed"));
        const platform::ItemFlags flags = files.itemFlags(temporary.path("passable/name.app"));
        return files.itemsInFolder(temporary.path("closed"), {}).problem() == FileProblem::notPermitted
            && closedStepByStep.problem == FileProblem::notPermitted && listable.size() == 1
            && listable[0].marker == MarkerAnswer::absent && stepByStep.descriptor.isOpen()
            && files.itemsInFolder(temporary.path("passable"), {}).problem() == FileProblem::notPermitted
            && flags.invisible && flags.package;
    };
    CHECK(tests::askAsOrdinaryUser(check) == tests::ChildAnswer::yes);
    for (const char* name : { "closed", "listable", "passable" })
        chmod(temporary.path(name).c_str(), 0755);
}

TEST_CASE("what may not be looked at from inside a folder, or leads nowhere, is no proof that the marker is absent")
{
    const TemporaryFolder temporary;
    for (const char* file : { "event/mark", "event/Media/a", "linked/Media/b", "none/Media/c" })
        temporary.file(file);
    temporary.link("linked/mark", "/Volumes/Nowhere/mark");
    chmod(temporary.path().c_str(), 0755);
    chmod(temporary.path("event/Media").c_str(), 0444);
    const auto check = [&] {
        const LinuxFileSystem files;
        const ListingRequest request { .markerBeside = "mark", .links = LinkPolicy::stop };
        const FolderListing closed = files.itemsInFolder(temporary.path("event/Media"), request);
        const FolderListing linked = files.itemsInFolder(temporary.path("linked/Media"), request);
        const FolderListing none = files.itemsInFolder(temporary.path("none/Media"), request);
        return !closed.holder() && closed.size() == 1 && !linked.holder() && linked.size() == 1 && none.holder()
            && !none.holder()->hasMarker && none.empty();
    };
    CHECK(tests::askAsOrdinaryUser(check) == tests::ChildAnswer::yes);
    chmod(temporary.path("event/Media").c_str(), 0755);
}

TEST_CASE("a listing of a hundred thousand items is whole, and every name is told once")
{
    const TemporaryFolder temporary;
    constexpr int count = 100'000;
    // Links are the cheapest items to make: all to one file.
    const std::string file = temporary.file("0");
    for (int number = 1; number < count; ++number)
        REQUIRE(symlink("0", temporary.path(std::to_string(number)).c_str()) == 0);
    const LinuxFileSystem files;
    const FolderListing listing = files.itemsInFolder(temporary.path(), {});
    std::vector<bool> seen(count);
    for (const FolderItem item : listing)
        seen[std::stoul(std::string(item.name))] = true;
    CHECK(listing.size() == count);
    CHECK(std::count(seen.begin(), seen.end(), true) == count);
}

TEST_CASE("no call leaves a descriptor open")
{
    const TemporaryFolder temporary;
    temporary.file("folder/.hidden", "x\n");
    temporary.file("folder/file", "text");
    temporary.link("link", "folder");
    temporary.link("circle", "circle");
    const LinuxFileSystem files;
    const int before = tests::openDescriptors();
    for (const char* name : { "folder", "folder/file", "link", "link/file", "circle", "missing" }) {
        const std::string path = temporary.path(name);
        for (const LinkPolicy links : { LinkPolicy::follow, LinkPolicy::stop })
            files.itemsInFolder(path, asking("file", links));
        files.itemFlags(path);
        files.resolvedPath(path);
        files.openPlainFile(path);
        files.linkTarget(path);
        platform::openFolderStepByStep(path);
    }
    CHECK(tests::openDescriptors() == before);
}

TEST_CASE("only a folder that was reached without links knows its path to be real")
{
    const TemporaryFolder temporary;
    temporary.folder("folder");
    const LinuxFileSystem files;
    const auto pathIsReal = [&](const std::string& path, LinkPolicy links) {
        return files.itemsInFolder(path, asking({}, links)).pathIsReal();
    };
    CHECK(pathIsReal(temporary.path("folder"), LinkPolicy::stop));
    CHECK(!pathIsReal(temporary.path("folder"), LinkPolicy::follow));
    CHECK(!pathIsReal(temporary.path("folder") + "/../folder", LinkPolicy::stop));
    CHECK(!pathIsReal(temporary.path("folder") + "/", LinkPolicy::stop));
    CHECK(!pathIsReal(temporary.path("missing"), LinkPolicy::stop));
}
