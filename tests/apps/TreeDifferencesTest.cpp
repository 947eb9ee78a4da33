#include "apps/ombrix/TreeDifferences.h"
#include "tests/apps/PrintedTree.h"

#include <doctest/doctest.h>

using namespace tests;
using ombrix::readTreeDocument;
using ombrix::TreeDocument;
using Lines = std::vector<std::string>;

namespace {

Lines differences(const PrintedGroup& followed, const PrintedGroup& fresh)
{
    std::optional<TreeDocument> one = readTreeDocument(followed.json() + "\n");
    std::optional<TreeDocument> other = readTreeDocument(fresh.json() + "\n");
    REQUIRE(one);
    REQUIRE(other);
    ombrix::sortAsSource(*one);
    ombrix::sortAsSource(*other);
    const ombrix::ComparedTrees trees { *one, *other };
    Lines lines;
    for (const ombrix::TreeDifference& difference : ombrix::differencesOf(trees))
        lines.push_back(textOf(difference, trees));
    return lines;
}

PrintedMovie representative(const std::string& project)
{
    return { project + "/m.mov", R"({"Project Path":")" + project + R"("})" };
}

} // namespace

TEST_CASE("trees whose root's children stand in another order are equal, with the root's movies in theirs")
{
    const PrintedGroup beach = printedProject("/P/beach");
    const PrintedGroup alps = printedProject("/P/Alps");
    const PrintedGroup events = printedEvents({ printedYear("2011", { printedEvent("/E/a", { { "/E/a/1" } }) }) });
    const PrintedGroup loaded = printedRoot(
        { beach, events, alps }, { representative("/P/beach"), { "/E/a/1" }, { "/E/a/2" }, representative("/P/Alps") });
    const PrintedGroup reloaded = printedRoot(
        { alps, beach, events }, { representative("/P/Alps"), representative("/P/beach"), { "/E/a/1" }, { "/E/a/2" } });
    CHECK(differences(loaded, reloaded).empty());
    const PrintedGroup swapped = printedRoot(
        { alps, beach, events }, { representative("/P/Alps"), representative("/P/beach"), { "/E/a/2" }, { "/E/a/1" } });
    CHECK(
        differences(loaded, swapped) == Lines { "the group Montaro: a fresh load shows its movies in another order" });
}

TEST_CASE("projects of one name are put in the order of their IDs")
{
    const PrintedGroup one = printedProject("/A/Trip");
    const PrintedGroup other = printedProject("/B/trip");
    CHECK(differences(printedRoot({ one, other }), printedRoot({ other, one })).empty());
}

TEST_CASE("what only one of two trees has is told once, with all that is in it")
{
    const PrintedGroup both = printedProject("/P/a");
    const PrintedGroup more = printedProject("/P/b", { { "/P/b/x.mov" } });
    CHECK(differences(printedRoot({ both }), printedRoot({ both, more }))
        == Lines { "the group /P/b: only a fresh load shows it" });
    CHECK(differences(printedRoot({ both, more }), printedRoot({ both }))
        == Lines { "the group /P/b: a fresh load does not show it" });
    CHECK(differences(printedRoot({ printedProject("/P/a", { { "/P/a/1" }, { "/P/a/2" } }) }),
              printedRoot({ printedProject("/P/a", { { "/P/a/2" }, { "/P/a/3" } }) }))
        == Lines { "/P/a/1 in the group /P/a: a fresh load does not show it",
            "/P/a/3 in the group /P/a: only a fresh load shows it" });
}

TEST_CASE("a fact of a group or movie that is not alike is told with both values")
{
    PrintedGroup one = printedProject("/P/a", { { "/P/a/1", R"({"width":1})" } });
    PrintedGroup other = printedProject("/P/a", { { "/P/a/1", R"({"width":2})" } });
    other.name = "A \\\"b\\\"";
    CHECK(differences(printedRoot({ one }), printedRoot({ other }))
        == Lines { "the group /P/a: name is \"a\", a fresh load finds \"A \\\"b\\\"\"",
            "/P/a/1 in the group /P/a: attributes is {\"width\":1}, a fresh load finds {\"width\":2}" });
}

TEST_CASE("groups below the root have to stand in one order")
{
    const PrintedGroup a = printedEvent("/E/a");
    const PrintedGroup b = printedEvent("/E/b");
    CHECK(differences(printedRoot({ printedYear("2011", { a, b }) }), printedRoot({ printedYear("2011", { b, a }) }))
        == Lines { "the group 2011: a fresh load shows its groups in another order" });
    CHECK(differences(printedRoot({ printedYear("2011", { a, b }) }), printedRoot({ printedYear("2011", { b }) }))
        == Lines { "the group /E/a: a fresh load does not show it" });
}

TEST_CASE("a tree as deep as folders can be is compared without a deep stack")
{
    PrintedGroup deep = printedProject("/P/end");
    std::string text = deep.json();
    const std::string empty = R"("childGroups":[])";
    for (int level = 0; level < 5'000; ++level)
        text.insert(text.rfind(empty) + empty.size() - 1, printedProject("/P/x").json());
    std::optional<TreeDocument> one = readTreeDocument(text);
    std::optional<TreeDocument> other = readTreeDocument(text);
    REQUIRE(one);
    CHECK(one->groups.size() == 5'001);
    CHECK(ombrix::differencesOf({ *one, *other }).empty());
}

TEST_CASE("a document that was cut short is no tree")
{
    const std::string text = printedRoot({ printedProject("/P/a", { { "/P/a/1" } }) }).json();
    for (std::size_t length = 0; length < text.size(); ++length)
        CHECK_FALSE(readTreeDocument(text.substr(0, length)));
}
