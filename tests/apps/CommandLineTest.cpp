#include "tests/apps/ProgramRun.h"
#include "tests/support/DescribedMachine.h"
#include "tests/support/LibraryBuilder.h"
#include "tests/support/TemporaryFolder.h"

#include <doctest/doctest.h>

#include <algorithm>
#include <csignal>
#include <filesystem>

using namespace tests;

namespace {

/// A machine with one project of two movies, one without any, and one in a folder.
struct MadeMachine {
    MadeMachine()
        : library(folder.folder("home/Movies/Montaro Projects"))
    {
        library.project("Trip").movie("a.mov").movie("b.mp4", 640, 360).movieWithBytes("c.MOV", "no movie");
        library.project("Draft");
        library.project("Clients/Harbour film").movie("final.mov");
        description.home(folder.path("home")).editor(folder.file("editor")).localVolume("/");
        description.write(file());
    }

    std::string file() const { return folder.path("machine.json"); }

    RunWishes wishes(std::vector<std::string> arguments) const
    {
        arguments.insert(arguments.begin(), { "--machine", file() });
        return { arguments, {}, {} };
    }
    ProgramRun run(const std::vector<std::string>& arguments) const { return runProgram(wishes(arguments)); }

    const TemporaryFolder folder;
    LibraryBuilder library;
    DescribedMachine description;
};

RunWishes waitingSource(std::vector<std::string> arguments)
{
    arguments.insert(arguments.begin(), { "--source", "org.ombrix.tests.Waiting" });
    return { arguments, { { "OMBRIX_PLUGIN_PATH", WAITING_PLUGINS } }, {} };
}

bool contains(const std::string& text, std::string_view part)
{
    return text.find(part) != std::string::npos;
}

bool isOneLine(const std::string& text)
{
    return std::count(text.begin(), text.end(), '\n') == 1 && text.back() == '\n' && text.substr(0, 8) == "ombrix: ";
}

void checkRefused(const ProgramRun& run, int status)
{
    CAPTURE(run.errors);
    CHECK(run.status == status);
    CHECK(run.output.empty());
    CHECK(isOneLine(run.errors));
}

} // namespace

TEST_CASE("the tree in a pipe is complete and plain")
{
    const MadeMachine machine;
    const ProgramRun run = machine.run({ "tree" });
    CHECK(run.status == 0);
    CHECK(run.errors.empty());
    CHECK(contains(run.output, "Montaro "));
    CHECK(contains(run.output, "Trip"));
    CHECK(contains(run.output, "2 movies"));
    CHECK(contains(run.output, "Harbour film"));
    CHECK(contains(run.output, "└─ Events"));
    CHECK_FALSE(contains(run.output, "\x1b"));
}

TEST_CASE("a part of the tree is found by its ID, else by its name")
{
    const MadeMachine machine;
    const ProgramRun byName = machine.run({ "tree", "Trip", "--json" });
    CHECK(byName.status == 0);
    CHECK(byName.output == machine.run({ "tree", machine.library.path("Trip"), "--json" }).output);
    const ProgramRun unknown = machine.run({ "tree", "Tripp" });
    checkRefused(unknown, 1);
    CHECK(contains(unknown.errors, "did you mean \"Trip\"?"));
}

TEST_CASE("paths and movies can be ended by zero bytes")
{
    const MadeMachine machine;
    const ProgramRun movies = machine.run({ "objects", "--group", "Montaro", "-0" });
    CHECK(movies.status == 0);
    CHECK(std::count(movies.output.begin(), movies.output.end(), '\0') == 2);
    CHECK(machine.run({ "objects", "--group", "Montaro" }).output.find('\0') == std::string::npos);
    const ProgramRun paths = machine.run({ "paths", "-0" });
    CHECK(paths.output.substr(0, paths.output.find('\0')) == machine.library.path());
}

TEST_CASE("what is asked of a missing group, source, description or option is refused in one line")
{
    const MadeMachine machine;
    checkRefused(machine.run({ "objects", "--group", "no\nsuch" }), 1);
    checkRefused(machine.run({ "message", "--group", "none" }), 1);
    checkRefused(machine.run({ "tree", "--source", "org.example.None" }), 1);
    for (const char* command : { "tree", "objects --group", "message --group" }) {
        std::vector<std::string> words { std::string(command).substr(0, std::string_view(command).find(' ')) };
        if (words[0] != command)
            words.emplace_back("--group");
        words.emplace_back("");
        const ProgramRun nameless = machine.run(words);
        checkRefused(nameless, 1);
        CHECK(contains(nameless.errors, "ombrix: " + words[0] + ": \"\" is the ID "));
    }
    checkRefused(machine.run({ "message" }), 2);
    checkRefused(machine.run({ "objects", "--group", "a", "--group", "b" }), 2);
    checkRefused(machine.run({ "plugins", "--source", "x" }), 2);
    checkRefused(machine.run({ "tree", "--jsn" }), 2);
    checkRefused(runProgram({ { "tre" }, {}, {} }), 2);
    checkRefused(runProgram({ {}, {}, {} }), 2);
    checkRefused(runProgram({ { "--machine", machine.folder.path("none.json"), "info" }, {}, {} }), 1);
    checkRefused(runProgram({ { "help", "tre" }, {}, {} }), 2);
}

TEST_CASE("a faulty description is refused by file, line and key")
{
    const TemporaryFolder folder;
    const std::string file = folder.file("machine.json", "{\n \"volumes\": []\n}\n");
    const ProgramRun run = runProgram({ { "tree", "--machine", file }, {}, {} });
    checkRefused(run, 1);
    CHECK(contains(run.errors, "ombrix: " + file + ":2: "));
    CHECK(contains(run.errors, "\"volumes\""));
}

TEST_CASE("without the editor nothing is loaded, and what needs no load still answers")
{
    const TemporaryFolder folder;
    const std::string file = folder.file("machine.json", "{\"editor\": {\"path\": \"none\"}}");
    for (const char* command : { "tree", "groups" })
        checkRefused(runProgram({ { command, "--machine", file }, {}, {} }), 1);
    const ProgramRun info = runProgram({ { "info", "--json", "--machine", file }, {}, {} });
    CHECK(info.status == 0);
    CHECK(contains(info.output, "\"canLoadData\":false"));
    CHECK(runProgram({ { "paths", "--machine", file }, {}, {} }).status == 0);
}

TEST_CASE("a library that is there and cannot be read is neither absent nor fatal")
{
    const MadeMachine machine;
    const std::string closed = machine.folder.path("home/Movies/Montaro Projects");
    std::filesystem::remove_all(closed);
    std::filesystem::create_symlink(closed, closed);
    CHECK(contains(machine.run({ "paths" }).output, closed + "   not readable: its symbolic links lead in circles\n"));
    CHECK(contains(machine.run({ "info" }).output, "project folders exist (1 not readable), "));
    const ProgramRun tree = machine.run({ "tree" });
    CHECK(tree.status == 0);
    CHECK(contains(tree.output, "1 folder unreadable"));
    CHECK(tree.errors == "ombrix: warning: " + closed + ": its symbolic links lead in circles\n");
    CHECK(machine.run({ "paths", "--json" }).errors.empty());
}

TEST_CASE("a source that offers no inspection has empty lists and null")
{
    const ProgramRun paths = runProgram(waitingSource({ "paths", "--json" }));
    CHECK(paths.output == "{\"projects\":[],\"events\":[]}\n");
    const ProgramRun info = runProgram(waitingSource({ "info", "--json" }));
    CHECK(contains(info.output, "\"mostRecentEventFirst\":null"));
    CHECK(contains(info.output, "\"pluginVersionString\":null"));
}

TEST_CASE("the plug-ins of the folders named in the environment are found first")
{
    const ProgramRun run = runProgram({ { "plugins", "--json" }, { { "OMBRIX_PLUGIN_PATH", WAITING_PLUGINS } }, {} });
    CHECK(run.status == 0);
    CHECK(contains(run.output, "[{\"identifier\":\"org.ombrix.tests.Waiting\",\"version\":\"1.0\""));
    CHECK(contains(run.output, "\"identifier\":\"org.ombrix.OBMontaroPlugin\""));
}

TEST_CASE("the message of a group is printed, and nothing where it has none")
{
    const MadeMachine machine;
    const ProgramRun draft = machine.run({ "message", "--group", machine.library.path("Draft") });
    CHECK(draft.status == 0);
    CHECK(std::count(draft.output.begin(), draft.output.end(), '\n') == 1);
    const ProgramRun trip = machine.run({ "message", "--group", machine.library.path("Trip") });
    CHECK(trip.status == 0);
    CHECK(trip.output.empty());
}

TEST_CASE("what was left out is listed on request with the reason")
{
    const MadeMachine machine;
    const ProgramRun run = machine.run({ "tree", "--skipped" });
    CHECK(contains(run.output, machine.library.path("Trip/Shared Items/c.MOV") + "\n    the extension \"MOV\""));
    CHECK(contains(run.output, "\n1 item skipped\n"));
    CHECK(contains(machine.run({ "tree", "Draft", "--skipped" }).output, "\nnothing was skipped\n"));
    const ProgramRun beside = machine.run({ "tree", "--skipped", "--json" });
    CHECK(beside.output == machine.run({ "tree", "--json" }).output);
    CHECK(beside.errors.starts_with("skipped: "));
}

TEST_CASE("a write that fails is told in one line, and a reader that left is not told of")
{
    const MadeMachine machine;
    for (const char* option : { "--all", "--json" }) {
        RunWishes wishes = machine.wishes({ "tree", option });
        wishes.outputFile = "/dev/full";
        checkRefused(runProgram(wishes), 1);
    }
    const ProgramRun nobody = runProgramForNobody(machine.wishes({ "tree" }));
    CHECK(nobody.status == 128 + SIGPIPE);
    CHECK(nobody.errors.empty());
}

TEST_CASE("help and the version go to standard output")
{
    const ProgramRun help = runProgram({ { "--help" }, {}, {} });
    CHECK(help.status == 0);
    CHECK(help.errors.empty());
    CHECK(help.output == runProgram({ { "help" }, {}, {} }).output);
    CHECK(help.output == runProgram({ { "--help", "x" }, {}, {} }).output);
    CHECK(runProgram({ { "tree", "-h" }, {}, {} }).output == runProgram({ { "help", "tree" }, {}, {} }).output);
    CHECK(contains(runProgram({ { "--version" }, {}, {} }).output, "(host interface 1.1)\n"));
}

TEST_CASE("a preferences file that cannot be read is logged once, however many questions a command asks")
{
    const TemporaryFolder folder;
    const std::string file = folder.file("machine.json", "{\"home\": \"home\"}");
    for (const char* domain : { "org.ombrix.Montaro", "org.ombrix.browser" })
        folder.file("home/Library/Preferences/" + std::string(domain) + ".plist", "damaged");
    for (const auto& words : { std::vector<std::string> { "info" }, std::vector<std::string> { "info", "--json" },
             std::vector<std::string> { "paths" }, std::vector<std::string> { "tree" } }) {
        RunWishes wishes { words, { { "OMBRIX_LOG", "2" } }, {} };
        wishes.arguments.insert(wishes.arguments.end(), { "--machine", file });
        const std::string errors = runProgram(wishes).errors;
        CAPTURE(errors);
        for (const char* cause : { "org.ombrix.Montaro.plist", "org.ombrix.browser.plist" }) {
            CHECK(contains(errors, cause));
            CHECK(errors.find(cause) == errors.rfind(cause));
        }
    }
}

TEST_CASE("logs go to standard error from level 2 on, one line each")
{
    const TemporaryFolder folder;
    const std::string file = folder.file("machine.json", "{}");
    RunWishes wishes { { "info", "--machine", file }, { { "OMBRIX_LOG", "2" } }, {} };
    CHECK(contains(runProgram(wishes).errors, "OBMontaroPlugin[2]: "));
    wishes.environment = { { "OMBRIX_LOG", "1" } };
    CHECK(runProgram(wishes).errors.empty());
    wishes.environment = { { "OMBRIX_LOG", "much" } };
    CHECK(runProgram(wishes).errors.empty());
}
