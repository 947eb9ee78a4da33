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

TEST_CASE("an option with a value is typed once, unless it only says how things look")
{
    CHECK(parse({ "objects", "--group", "a", "--group=b" }).problem == "objects: option --group is given twice");
    CHECK(parse({ "--machine", "a", "tree", "--machine=a" }).problem == "tree: option --machine is given twice");
    CHECK(parse({ "tree", "--source", "a", "--source", "b" }).problem == "tree: option --source is given twice");
    CHECK(parse({ "tree", "--color=always", "--color=never" }).arguments.color == apps::When::never);
    CHECK(parse({ "tree", "--all", "--all", "--json", "--json" }).problem.empty());
}

TEST_CASE("an option that means nothing to a command, or beside another, is refused")
{
    CHECK(parse({ "plugins", "--source", "x" }).problem == "plugins: option --source means nothing here");
    CHECK(parse({ "--source=x", "help", "tree" }).problem == "help: option --source means nothing here");
    CHECK(parse({ "paths", "-0", "--json" }).problem == "paths: options -0 and --json exclude each other");
    CHECK(parse({ "paths", "--json", "-0" }).problem == "paths: options -0 and --json exclude each other");
    CHECK(parse({ "objects", "--group", "x", "--json", "-0" }).problem
        == "objects: options -0 and --json exclude each other");
}

TEST_CASE("an option that a command cannot do without is missed, and stands without brackets in help")
{
    for (const char* command : { "objects", "message" }) {
        CHECK(parse({ command }).problem
            == std::string(command) + ": option --group ID is missing (\"ombrix help " + command + "\")");
        const std::string help = helpText(*commandNamed(command));
        CHECK(help.find("  ombrix " + std::string(command) + " --group ID") != std::string::npos);
    }
    CHECK(helpText(*commandNamed("tree")).find(" [--all] ") != std::string::npos);
}

TEST_CASE("help tells of the commands to which no source can be named, each by itself and all together")
{
    const std::string all = helpText();
    const std::string line = all.substr(all.find("  --source"), all.find("  --color") - all.find("  --source"));
    for (const CommandInfo& command : commands()) {
        CAPTURE(command.name);
        const bool isExcepted = !command.takesSource;
        CHECK((line.find(" " + std::string(command.name)) != std::string::npos) == isExcepted);
        CHECK((helpText(command).find("without --source") != std::string::npos) == isExcepted);
    }
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
    CHECK(parse({ "tree", "--source=" }).problem == "tree: option --source needs a value: IDENTIFIER");
}

TEST_CASE("only an option whose own letters are near is suggested")
{
    CHECK(parse({ "message", "--json" }).problem == "message: unknown option --json");
    CHECK(parse({ "help", "--json" }).problem == "help: unknown option --json");
    CHECK(parse({ "groups", "--all" }).problem == "groups: unknown option --all");
    CHECK(parse({ "tree", "-x" }).problem == "tree: unknown option -x");
    CHECK(parse({ "tree", "-all" }).problem == "tree: unknown option -all (did you mean \"--all\"?)");
    CHECK(parse({ "tree", "--hlep" }).problem == "tree: unknown option --hlep (did you mean \"--help\"?)");
}

TEST_CASE("help and the version need no command")
{
    CHECK(parse({ "--help" }).arguments.wantsHelp);
    CHECK(parse({ "-h" }).arguments.wantsHelp);
    CHECK(parse({ "--version" }).arguments.wantsVersion);
    CHECK(parse({ "tree", "-h" }).arguments.command == commandNamed("tree"));
}

TEST_CASE("whoever asks for help or the version gets it whatever else is typed")
{
    const std::vector<std::string_view> lines[] { { "--help", "x" }, { "x", "--help" }, { "tree", "--help", "x", "y" },
        { "tree", "--bogus", "-h" }, { "objects", "--help" }, { "--version", "x" }, { "plugins", "--version" } };
    for (const auto& words : lines) {
        const ParsedArguments parsed = parse(words);
        CHECK(parsed.problem.empty());
        CHECK(parsed.arguments.wantsHelp != parsed.arguments.wantsVersion);
    }
    CHECK(parse({ "objects", "--group", "-h" }).arguments.valueOf("--group") != nullptr);
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
