#include "apps/ombrix/Arguments.h"
#include "apps/common/DisplayWidth.h"
#include "apps/ombrix/Help.h"

#include <doctest/doctest.h>

#include <algorithm>

using namespace ombrix;

namespace {

ParsedArguments parse(std::vector<std::string_view> words)
{
    return parseArguments(words);
}

void checkScreen(const std::string& text)
{
    CHECK(std::count(text.begin(), text.end(), '\n') <= 40);
    std::string_view rest = text;
    while (!rest.empty()) {
        const std::string_view line = rest.substr(0, rest.find('\n'));
        CAPTURE(line);
        CHECK(apps::displayWidth(line) <= 80);
        rest.remove_prefix(line.size() + 1);
    }
}

} // namespace

TEST_CASE("global options stand before or after the command, with their value behind or in the same word")
{
    for (const auto& words : { std::vector<std::string_view> { "--machine", "a b", "tree", "--source=x" },
             std::vector<std::string_view> { "--source", "x", "tree", "--machine=a b" } }) {
        const ParsedArguments parsed = parse(words);
        CHECK(parsed.problem.empty());
        CHECK(parsed.arguments.machineFile == "a b");
        CHECK(parsed.arguments.source == "x");
        CHECK(parsed.arguments.command == commandNamed("tree"));
    }
}

TEST_CASE("arguments are bytes and a value may look like an option")
{
    const ParsedArguments parsed = parse({ "objects", "--group", "--\xff\n=", "-0" });
    CHECK(parsed.problem.empty());
    CHECK(*parsed.arguments.valueOf("--group") == "--\xff\n=");
    CHECK(parsed.arguments.has("-0"));
    CHECK(*parse({ "objects", "--group=" }).arguments.valueOf("--group") == "");
}

TEST_CASE("nothing behind two hyphens is an option")
{
    const ParsedArguments parsed = parse({ "tree", "--", "--all" });
    CHECK(parsed.problem.empty());
    CHECK(parsed.arguments.operands == std::vector<std::string> { "--all" });
    CHECK(parse({ "--", "tree" }).arguments.command == commandNamed("tree"));
}

TEST_CASE("of an option that is typed twice the last value counts")
{
    CHECK(*parse({ "objects", "--group", "a", "--group", "b" }).arguments.valueOf("--group") == "b");
}

TEST_CASE("a mistake is told in one line with a suggestion")
{
    CHECK(parse({ "tre" }).problem == "unknown command \"tre\" (did you mean \"tree\"?)");
    CHECK(parse({ "zzzzzz" }).problem == "unknown command \"zzzzzz\" (\"ombrix --help\" lists them)");
    CHECK(parse({ "a\nb" }).problem.find('\n') == std::string::npos);
    CHECK(parse({ "tree", "--jsn" }).problem == "tree: unknown option --jsn (did you mean \"--json\"?)");
    CHECK(parse({ "--machin", "x", "tree" }).problem == "unknown option --machin (did you mean \"--machine\"?)");
    CHECK(parse({ "tree", "--json=1" }).problem == "tree: option --json takes no value");
    CHECK(parse({ "tree", "--machine" }).problem == "tree: option --machine needs a value: FILE");
    CHECK(parse({ "tree", "a", "b" }).problem == "tree: b: one argument too many");
    CHECK(parse({}).problem == "no command given (\"ombrix --help\" lists them)");
    CHECK(parse({ "--color=alwys", "tree" }).problem
        == "option --color is auto, always or never, not \"alwys\" (did you mean \"always\"?)");
    CHECK(parse({ "--json", "tree" }).problem
        == "unknown option --json before the command (options of a command follow its name)");
    CHECK(parse({ "paths", "--group", "x" }).problem == "paths: unknown option --group");
}

TEST_CASE("help and the version need no command")
{
    CHECK(parse({ "--help" }).arguments.wantsHelp);
    CHECK(parse({ "-h" }).arguments.wantsHelp);
    CHECK(parse({ "--version" }).arguments.wantsVersion);
    CHECK(parse({ "tree", "-h" }).arguments.command == commandNamed("tree"));
}

TEST_CASE("every help text fits on one screen and every command has two examples that parse")
{
    checkScreen(helpText());
    for (const CommandInfo& command : commands()) {
        CAPTURE(command.name);
        checkScreen(helpText(command));
        REQUIRE(command.examples.size() == 2);
        for (const Example& example : command.examples)
            CHECK(example.command.find("ombrix") != std::string_view::npos);
    }
}
