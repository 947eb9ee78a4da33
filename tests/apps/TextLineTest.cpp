#include "apps/ombrix/TextLine.h"
#include "apps/common/DisplayWidth.h"
#include "apps/ombrix/SuggestedCommand.h"

#include <doctest/doctest.h>

using namespace ombrix;

namespace {

TextLine lineOf(std::optional<int> columns)
{
    static const apps::Style style { apps::StyleWishes() };
    return { style, columns };
}

} // namespace

TEST_CASE("a text is cut at its end, a name in its middle, and off a terminal nothing is")
{
    CHECK(lineOf(10).add(2, "a sentence that is long").text() == "  a sente…");
    CHECK(lineOf(12).addName(2, "a long name.mov").text() == "  a lon….mov");
    CHECK(lineOf({}).add(2, "a sentence").addName(4, "a long name.mov").text() == "  a sentence  a long name.mov");
}

TEST_CASE("a text that is to stay whole moves to the left and then makes the line longer")
{
    CHECK(lineOf(20).add(0, "ab").addWhole(15, "a command").text() == "ab         a command");
    CHECK(lineOf(10).add(0, "ab").addWhole(8, "a command").text() == "ab  a command");
    CHECK(lineOf(10).add(0, "ab").addWhole(8, "a command").height() == 2);
    CHECK(lineOf(10).add(0, "ab").addMoving(8, "a command").text() == "ab  a com…");
    CHECK(lineOf(10).add(0, "ab").addMoving(8, "a command").height() == 1);
}

TEST_CASE("words are wrapped at spaces and a long one stands alone")
{
    CHECK(apps::wrappedWords("a few words", 5) == std::vector<std::string> { "a few", "words" });
    CHECK(apps::wrappedWords("an incomprehensibility 東京", 6)
        == std::vector<std::string> { "an", "incomprehensibility", "東京" });
    CHECK(apps::wrappedWords("", 6) == std::vector<std::string> { "" });
}

TEST_CASE("a suggested command asks the same machine and source and is safe to paste")
{
    Arguments arguments;
    CHECK(suggestedCommand(arguments, "tree", "Anna & Tom") == "ombrix tree 'Anna & Tom'");
    CHECK(suggestedCommand(arguments, "tree --all") == "ombrix tree --all");
    arguments.machineFile = "my machine.json";
    arguments.source = "org.example.Source";
    CHECK(suggestedCommand(arguments, "tree", "Trip")
        == "ombrix tree Trip --machine 'my machine.json' --source org.example.Source");
    CHECK(suggestedCommand(arguments, "tree", "-x")
        == "ombrix tree --machine 'my machine.json' --source org.example.Source -- -x");
}
