#include "apps/common/DisplayWidth.h"
#include "tests/apps/ProgramRun.h"
#include "tests/support/DescribedMachine.h"
#include "tests/support/LibraryBuilder.h"
#include "tests/support/TemporaryFolder.h"

#include <doctest/doctest.h>

#include <algorithm>
#include <csignal>
#include <cstdio>

using namespace tests;

namespace {

constexpr const char* hostileName = "bad\x1b[31m\nname\u202e";

struct LargeMachine {
    LargeMachine()
        : library(folder.folder("home/Movies/Montaro Projects"))
    {
        for (int project = 0; project < 60; ++project)
            library.project("Clients/Project " + std::to_string(project));
        library.project(hostileName);
        description.home(folder.path("home")).editor(folder.file("editor"));
        description.write(folder.path("machine.json"));
    }

    RunWishes wishes(std::vector<std::string> arguments) const
    {
        arguments.insert(arguments.end(), { "--machine", folder.path("machine.json") });
        return { arguments, {}, {} };
    }

    const TemporaryFolder folder;
    LibraryBuilder library;
    DescribedMachine description;
};

RunWishes waitingTree()
{
    return { { "--source", "org.ombrix.tests.Waiting", "tree" }, { { "OMBRIX_PLUGIN_PATH", WAITING_PLUGINS } }, {} };
}

bool contains(const std::string& text, std::string_view part)
{
    return text.find(part) != std::string::npos;
}

auto linesIn(const std::string& text)
{
    return std::count(text.begin(), text.end(), '\n');
}

/// What a terminal shows of the last line: each carriage return begins to write over it.
std::string lastLineShown(const std::string& text)
{
    std::string shown;
    std::size_t column = 0;
    for (const char letter : text) {
        if (letter == '\r') {
            column = 0;
        } else if (column == shown.size()) {
            shown += letter;
            ++column;
        } else {
            shown[column++] = letter;
        }
    }
    return shown.substr(0, shown.find_last_not_of(' ') + 1);
}

} // namespace

TEST_CASE("on a terminal the tree is folded to its height and names the command that unfolds it")
{
    const LargeMachine machine;
    const ProgramRun run = runOnTerminal(machine.wishes({ "tree", "--color=never" }), { 20, 80 });
    CHECK(run.status == 0);
    CHECK(linesIn(run.output) <= 19);
    CHECK(contains(run.output, "more"));
    CHECK(contains(run.output, "ombrix tree Clients --machine " + machine.folder.path("machine.json") + "\n"));
    CHECK(contains(run.output, "└─ Events"));
    CHECK(linesIn(runOnTerminal(machine.wishes({ "tree", "Clients" }), { 20, 80 }).output) > 60);
    CHECK(linesIn(runOnTerminal(machine.wishes({ "tree", "--all" }), { 20, 80 }).output) > 60);
}

TEST_CASE("the command that unfolds a part works when it is pasted, whatever the part is called")
{
    for (const char* name : { "it's a \"quoted\" $HOME", "-odd", "line\nfeed\x1b", "Events", " *" }) {
        const TemporaryFolder folder;
        LibraryBuilder library(folder.folder("home/Movies/Montaro Projects"));
        for (int project = 0; project < 40; ++project)
            library.project(std::string(name) + "/Project " + std::to_string(project));
        DescribedMachine description;
        const std::string file = folder.path("my machine.json");
        description.home(folder.path("home")).editor(folder.file("editor")).write(file);
        const ProgramRun run = runOnTerminal({ { "tree", "--color=never", "--machine", file }, {}, {} }, { 12, 60 });
        const std::size_t start = run.output.find("ombrix tree ");
        REQUIRE(start != std::string::npos);
        const std::string pasted = run.output.substr(start, run.output.find('\n', start) - start);
        const std::string script
            = folder.file("paste", "ombrix() { " OMBRIX_PROGRAM " \"$@\"; }\n" + pasted + " | grep -c 'Project '\n");
        CAPTURE(pasted);
        std::FILE* answer = ::popen(("bash '" + script + "'").c_str(), "r");
        int count = 0;
        CHECK(std::fscanf(answer, "%d", &count) == 1);
        ::pclose(answer);
        CHECK(count == 40);
    }
}

TEST_CASE("IDs are whole on a terminal, and other columns line up")
{
    const LargeMachine machine;
    LibraryBuilder(machine.folder.path("home/Movies/Montaro Projects"))
        .project("Clients/A project with a name that is longer than any column for names");
    for (const int columns : { 60, 80, 120 }) {
        const ProgramRun run = runOnTerminal(machine.wishes({ "groups", "--color=never" }), { 24, columns });
        const std::string place = "   " + machine.library.path("Clients/Project 7") + "\n";
        CHECK(contains(run.output, place));
        CHECK(contains(run.output, "   " + machine.library.path(hostileName).substr(0, 20)));
        CHECK(contains(run.output, "A project"));
        CHECK(contains(run.output, "…"));
    }
}

TEST_CASE("of what was left out the path loses its middle and the reason is wrapped, not cut")
{
    const LargeMachine machine;
    LibraryBuilder(machine.folder.path("home/Movies/Montaro Projects"))
        .project("Clients/Long")
        .movieWithBytes("a movie whose name is longer than it ought to be.MOV", "no movie");
    for (const int columns : { 60, 80 }) {
        const ProgramRun run
            = runOnTerminal(machine.wishes({ "tree", "Clients", "--skipped", "--color=never" }), { 24, columns });
        const std::size_t start = run.output.find("\n\n") + 2;
        std::string_view rest = std::string_view(run.output).substr(start, run.output.find("\n1 item skipped") - start);
        const std::string_view path = rest.substr(0, rest.find('\n'));
        CHECK(path.starts_with(machine.folder.path().substr(0, 10)));
        CHECK(path.find("…") != std::string_view::npos);
        CHECK(path.ends_with(".MOV"));
        std::string reason;
        while (!rest.empty()) {
            const std::string_view line = rest.substr(0, rest.find('\n'));
            CHECK(apps::displayWidth(line) <= columns);
            reason += line.substr(std::min<std::size_t>(3, line.size()));
            rest.remove_prefix(std::min(rest.size(), line.size() + 1));
        }
        CHECK(contains(reason, "to list it, rename it to "));
    }
}

TEST_CASE("a plug-in is listed with its whole reason and the end of its path, however narrow the terminal is")
{
    const TemporaryFolder folder;
    const std::string parent = folder.folder("a folder with a name that no terminal is wide enough for, not this one");
    makeFolder(parent + "/Empty.obplugin");
    const ProgramRun run
        = runOnTerminal({ { "plugins", "--color=never" }, { { "OMBRIX_PLUGIN_PATH", parent } }, {} }, { 24, 60 });
    CHECK(run.status == 0);
    CHECK(contains(run.output, "…"));
    CHECK(contains(run.output, "Empty.obplugin"));
    CHECK(contains(run.output, "refused"));
}

TEST_CASE("the tree in a pipe says nothing of time even where standard error is a terminal")
{
    const LargeMachine machine;
    const ProgramRun run = runWithErrorsOnTerminal(machine.wishes({ "tree" }), {});
    CHECK(run.errors.empty());
    CHECK(linesIn(run.output) > 60);
}

TEST_CASE("a footer on the terminal tells how long it took and how many folders were searched")
{
    const LargeMachine machine;
    const ProgramRun run = runOnTerminal(machine.wishes({ "tree", "--color=never" }), { 20, 80 });
    CHECK(contains(run.output, "ms · "));
    CHECK(contains(run.output, "folders searched, "));
}

TEST_CASE("a hostile name is shown by its codes on a terminal and byte for byte in a pipe")
{
    const LargeMachine machine;
    const ProgramRun shown = runOnTerminal(machine.wishes({ "tree", "--all", "--color=never" }), { 100, 80 });
    CHECK(contains(shown.output, "bad\\x1b[31m\\x0aname\\u202e"));
    CHECK_FALSE(contains(shown.output, "\x1b"));
    CHECK_FALSE(contains(shown.output, "\u202e"));
    CHECK(contains(runProgram(machine.wishes({ "tree" })).output, hostileName));
}

TEST_CASE("NO_COLOR, a dumb terminal and a pipe get not one escape")
{
    const LargeMachine machine;
    CHECK(contains(runOnTerminal(machine.wishes({ "tree" }), {}).output, "\x1b["));
    RunWishes wishes = machine.wishes({ "tree" });
    CHECK_FALSE(contains(runOnTerminal(wishes, { 24, 80, "dumb" }).output, "\x1b"));
    wishes.environment = { { "NO_COLOR", "1" } };
    CHECK_FALSE(contains(runOnTerminal(wishes, {}).output, "\x1b"));
    wishes.environment = { { "NO_COLOR", "" } };
    CHECK(contains(runOnTerminal(wishes, {}).output, "\x1b["));
    wishes.environment = { { "CLICOLOR_FORCE", "1" } };
    CHECK(contains(runProgram(wishes).output, "\x1b["));
}

TEST_CASE("names are links to their folders where links are asked for")
{
    const LargeMachine machine;
    const ProgramRun run = runProgram(machine.wishes({ "tree", "--hyperlink=always" }));
    CHECK(contains(run.output, "\x1b]8;;file://"));
    CHECK(contains(run.output, "/Montaro%20Projects/Clients/Project%207\x1b\\Project 7\x1b]8;;\x1b\\"));
}

TEST_CASE("progress shows while a load takes long, and Ctrl-C ends it by the signal and leaves nothing")
{
    for (const int signal : { SIGINT, SIGTERM, SIGHUP }) {
        TerminalWishes terminal;
        terminal.sendSignalAfter = "scanning Stick";
        terminal.signal = signal;
        const ProgramRun run = runOnTerminal(waitingTree(), terminal);
        CAPTURE(run.output);
        CHECK(run.status == 128 + signal);
        CHECK(contains(run.output, "38,110 clips"));
        CHECK(contains(run.output, "Ctrl-C cancels"));
        CHECK(lastLineShown(run.output).empty());
        CHECK_FALSE(contains(run.output, "\x1b"));
    }
}

TEST_CASE("a load that a disk keeps waiting names the disk, also where standard error is no terminal")
{
    const TemporaryFolder folder;
    TerminalWishes terminal;
    terminal.sendSignalAfter = "waiting for Stick";
    terminal.signal = SIGTERM;
    const ProgramRun shown = runOnTerminal(waitingTree(), terminal);
    CHECK(shown.status == 128 + SIGTERM);
    CHECK(contains(shown.output, "waiting for Stick (/Volumes/Stick/Montaro Projects)"));
    CHECK(lastLineShown(shown.output).empty());
}
