#include "platform/linux/LinuxFileSystem.h"
#include "tests/support/TemporaryFolder.h"

#include <doctest/doctest.h>

#include <string>
#include <utility>
#include <vector>

#include <fcntl.h>
#include <linux/limits.h>
#include <unistd.h>

using platform::LinuxFileSystem;
using tests::TemporaryFolder;

TEST_CASE("paths resolve as far as they exist, and the rest stays as written")
{
    const TemporaryFolder temporary;
    temporary.file("real/inner/file");
    temporary.link("link", "real");
    temporary.link("absolute", temporary.path("real/inner"));
    temporary.link("up", "real/inner/..");
    temporary.link("viaLink", "link/inner");
    temporary.link("dangling", "real/missing/x");
    temporary.link("danglingUp", "../" + temporary.path().substr(temporary.path().rfind('/') + 1) + "/nothing");
    temporary.link("loop", "loop");
    temporary.link("one", "two");
    temporary.link("two", "one");
    temporary.link("first", "one");
    temporary.link("slashes", "real//inner///");
    const std::vector<std::pair<std::string, std::string>> cases { { "", "" }, { "/", "" }, { "/real", "/real" },
        { "/real/../real/./inner//file", "/real/inner/file" }, { "/link", "/real" }, { "/link/inner", "/real/inner" },
        { "/absolute/file", "/real/inner/file" }, { "/absolute/..", "/real" }, { "/up/inner", "/real/inner" },
        { "/viaLink/file", "/real/inner/file" }, { "/slashes/file", "/real/inner/file" },
        { "/dangling", "/real/missing/x" }, { "/dangling/y", "/real/missing/x/y" }, { "/danglingUp", "/nothing" },
        { "/loop", "/loop" }, { "/loop/x/y", "/loop/x/y" }, { "/one", "/one" }, { "/first", "/first" },
        { "/first/x", "/first/x" }, { "/missing/a/../b", "/missing/a/../b" }, { "/link/missing/x", "/real/missing/x" },
        { "/real/inner/file/x", "/real/inner/file/x" }, { "/real/inner/file/..", "/real/inner/file/.." } };
    const LinuxFileSystem files;
    for (const auto& entry : cases) {
        const std::string& path = entry.first;
        const std::string& expected = entry.second;
        CAPTURE(path);
        CHECK(files.resolvedPath(temporary.path() + path) == temporary.path() + expected);
    }
}

TEST_CASE("a link in circles below a link resolves to the real path of its folder, and its name")
{
    const TemporaryFolder temporary;
    temporary.link("real/loop", "loop");
    temporary.link("link", "real");
    CHECK(LinuxFileSystem().resolvedPath(temporary.path("link/loop")) == temporary.path("real/loop"));
}

TEST_CASE("the root resolves to itself however it is spelled")
{
    const LinuxFileSystem files;
    for (const char* spelling : { "/", "//", "/.", "/..", "/../..", "/./../" })
        CHECK(files.resolvedPath(spelling) == "/");
}

TEST_CASE("a component with a zero byte in it does not exist")
{
    const TemporaryFolder temporary;
    temporary.link("link", "real");
    temporary.file("real/file");
    const std::string odd = std::string("/fi") + '\0' + "le";
    CHECK(LinuxFileSystem().resolvedPath(temporary.path("link") + odd) == temporary.path("real") + odd);
}

TEST_CASE("paths longer than the system takes are resolved too")
{
    const TemporaryFolder temporary;
    temporary.folder("real");
    const std::string name(200, 'd');
    const std::string deepest = tests::makeNestedFolders(temporary.path("real"), name, 60);
    REQUIRE(deepest.size() > PATH_MAX);
    temporary.link("link", "real");
    const std::string throughLink = temporary.path("link") + deepest.substr(temporary.path("real").size());
    const LinuxFileSystem files;
    CHECK(files.resolvedPath(throughLink) == deepest);
    CHECK(files.resolvedPath(throughLink + "/..") == deepest.substr(0, deepest.rfind('/')));
    CHECK(files.resolvedPath(throughLink + "/missing") == deepest + "/missing");
}

TEST_CASE("as many links as the kernel follows are followed, and no more")
{
    const TemporaryFolder temporary;
    temporary.folder("target");
    temporary.link("0", "target");
    for (int number = 1; number < 60; ++number)
        temporary.link(std::to_string(number), std::to_string(number - 1));
    const LinuxFileSystem files;
    for (int number = 0; number < 60; ++number) {
        const std::string path = temporary.path(std::to_string(number));
        CHECK(files.resolvedPath(path) == (files.exists(path) ? temporary.path("target") : path));
    }
}

TEST_CASE("a magic link of the kernel that names no path harms nothing")
{
    int ends[2];
    REQUIRE(pipe(ends) == 0);
    const std::string path = "/proc/self/fd/" + std::to_string(ends[0]);
    CHECK(LinuxFileSystem().resolvedPath(path).find("pipe:[") != std::string::npos);
    close(ends[0]);
    close(ends[1]);
}
