#include "platform/common/LexicalPath.h"

#include <doctest/doctest.h>

using namespace platform;

TEST_CASE("a normalised path has single slashes, no single dots and no slash at its end")
{
    CHECK(lexicallyNormalised("/a//b/./c/") == "/a/b/c");
    CHECK(lexicallyNormalised("/a/../b") == "/a/../b");
    CHECK(lexicallyNormalised("//") == "/");
    CHECK(lexicallyNormalised("/.") == "/");
    CHECK(lexicallyNormalised("./a/.") == "a");
    CHECK(lexicallyNormalised("").empty());
    CHECK(lexicallyNormalised("/.a/b.") == "/.a/b.");
}

TEST_CASE("a path is normalised exactly when normalising changes nothing")
{
    for (const char* path : { "/a", "/", "a", "a/b", "/a//b", "/a/", "/a/.", "/a/./b", "./a", ".", "", "/.a", "/a/..",
             "//", "/..", "a.", "/a./b" }) {
        CAPTURE(path);
        const bool isUnchanged = lexicallyNormalised(path) == path;
        CHECK((isLexicallyNormalised(path) == isUnchanged || std::string_view(path).empty()));
    }
}

TEST_CASE("a path that a person wrote is made absolute by its text")
{
    CHECK(lexicallyAbsolute("x", "/a/b") == "/a/b/x");
    CHECK(lexicallyAbsolute("../x/", "/a/b") == "/a/x");
    CHECK(lexicallyAbsolute("../../../x", "/a/b") == "/x");
    CHECK(lexicallyAbsolute(".", "/a/b") == "/a/b");
    CHECK(lexicallyAbsolute("/x//y/..", "/a/b") == "/x");
    CHECK(lexicallyAbsolute("..", "/a") == "/");
}

TEST_CASE("components of dots are told from names that begin with dots")
{
    CHECK(hasDotComponent("/a/./b"));
    CHECK(hasDotComponent(".."));
    CHECK(hasDotComponent("/a/.."));
    CHECK_FALSE(hasDotComponent("/.a/..b/c."));
    CHECK_FALSE(hasDotComponent(""));
}
