#include "platform/PathText.h"

#include <doctest/doctest.h>

using namespace platform;

TEST_CASE("the last component of a path is its name")
{
    CHECK(lastPathComponent("/a/b.mov") == "b.mov");
    CHECK(lastPathComponent("/a/b/") == "b");
    CHECK(lastPathComponent("name") == "name");
    CHECK(lastPathComponent("/") == "/");
    CHECK(lastPathComponent("//") == "/");
    CHECK(lastPathComponent("").empty());
}

TEST_CASE("without its last component a path names its folder")
{
    CHECK(pathByRemovingLastComponent("/a/b.mov") == "/a");
    CHECK(pathByRemovingLastComponent("/a/b//") == "/a");
    CHECK(pathByRemovingLastComponent("/a//b") == "/a");
    CHECK(pathByRemovingLastComponent("/a") == "/");
    CHECK(pathByRemovingLastComponent("/") == "/");
    CHECK(pathByRemovingLastComponent("name").empty());
    CHECK(pathByRemovingLastComponent("").empty());
}

TEST_CASE("paths are joined by one slash")
{
    CHECK(pathJoined("/a", "b") == "/a/b");
    CHECK(pathJoined("/a/", "b") == "/a/b");
    CHECK(pathJoined("/", "b") == "/b");
    CHECK(pathJoined("", "b") == "b");
    CHECK(pathJoined("/a", "") == "/a");
}

TEST_CASE("below a folder is told by whole components")
{
    CHECK(isSameOrBelow("/a/b", "/a"));
    CHECK(isSameOrBelow("/a", "/a"));
    CHECK(isSameOrBelow("/a", "/a/"));
    CHECK(isSameOrBelow("/a", "/"));
    CHECK(isSameOrBelow("/", "/"));
    CHECK_FALSE(isSameOrBelow("/ab", "/a"));
    CHECK_FALSE(isSameOrBelow("/", "/a"));
    CHECK_FALSE(isSameOrBelow("a", "/"));
    CHECK_FALSE(isSameOrBelow("", "/"));
    CHECK(pathRelativeTo("/a/b/c", "/a") == "b/c");
    CHECK(pathRelativeTo("/a/b", "/") == "a/b");
    CHECK(pathRelativeTo("/a", "/a").empty());
    CHECK(pathRelativeTo("/ab", "/a").empty());
}

TEST_CASE("the extension is the text after the last full stop")
{
    CHECK(extensionOfName("a.mov") == "mov");
    CHECK(extensionOfName("a.tar.gz") == "gz");
    CHECK(extensionOfName("a. b c") == " b c");
    CHECK(nameWithoutExtension("a.tar.gz") == "a.tar");
    CHECK(extensionOfName("plain").empty());
    CHECK(nameWithoutExtension("plain") == "plain");
    CHECK(nameWithoutExtension("").empty());
}

TEST_CASE("a name that begins or ends with its only full stop has no extension")
{
    CHECK(extensionOfName(".mov").empty());
    CHECK(nameWithoutExtension(".mov") == ".mov");
    CHECK(extensionOfName("a.").empty());
    CHECK(nameWithoutExtension("a.") == "a.");
    CHECK(nameWithoutExtension(".") == ".");
    CHECK(extensionOfName(".a.mov") == "mov");
    CHECK(nameWithoutExtension(".a.mov") == ".a");
    CHECK(nameWithoutExtension("a.b.") == "a.b");
    CHECK(nameWithoutExtension("..") == ".");
}
