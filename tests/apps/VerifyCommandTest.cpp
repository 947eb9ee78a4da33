#include "tests/apps/ProgramRun.h"
#include "tests/support/DescribedMachine.h"
#include "tests/support/LibraryBuilder.h"
#include "tests/support/TemporaryFolder.h"

#include <doctest/doctest.h>

#include <csignal>

using namespace tests;

namespace {

struct VerifiedMachine {
    VerifiedMachine()
        : projects(folder.folder("home/Movies/Montaro Projects"))
        , events(folder.folder("home/Movies/Montaro Events"))
    {
        projects.project("Trip").movie("a.mov");
        projects.project("beach").movie("b.mov");
        events.event("Coast").movie("c.mov").movie("d.mov");
        description.home(folder.path("home")).localVolume("/").editor(folder.file("editor"));
        description.write(folder.path("machine.json"));
    }

    RunWishes wishes(std::vector<std::string> arguments) const
    {
        arguments.insert(arguments.begin(), { "--machine", folder.path("machine.json"), "verify" });
        return { arguments, {}, {} };
    }

    const TemporaryFolder folder;
    LibraryBuilder projects;
    LibraryBuilder events;
    DescribedMachine description;
};

bool contains(const std::string& text, std::string_view part)
{
    return text.find(part) != std::string::npos;
}

} // namespace

TEST_CASE("a tree that nothing has happened to is equal to a fresh load")
{
    const VerifiedMachine machine;
    const ProgramRun json = runProgram(machine.wishes({ "--for", "0", "--json" }));
    CHECK(json.status == 0);
    CHECK(json.errors.empty());
    CHECK(json.output == "{\"equal\":true,\"differences\":[]}\n");
    const ProgramRun text = runProgram(machine.wishes({ "--for=0.01" }));
    CHECK(text.status == 0);
    CHECK(contains(text.output, "equal to a fresh load: "));
    CHECK(contains(text.output, "4 movies, 1 publication\n"));
}

TEST_CASE("when it is interrupted it compares and ends with the status of that")
{
    const VerifiedMachine machine;
    for (const int signal : { SIGINT, SIGTERM, SIGHUP }) {
        TerminalWishes terminal;
        terminal.sendSignalAfter = "Ctrl-C compares and ends";
        terminal.signal = signal;
        const ProgramRun run = runOnTerminal(machine.wishes({ "--color=never" }), terminal);
        CHECK(run.status == 0);
        CHECK(contains(run.output, "\nequal to a fresh load: "));
    }
}

TEST_CASE("a time that is no number of seconds is wrong usage")
{
    const VerifiedMachine machine;
    for (const char* wrong : { "", "x", "-1", "1s", "nan", "1e3", " 1" }) {
        const ProgramRun run = runProgram(machine.wishes({ std::string("--for=") + wrong }));
        CHECK(run.status == 2);
        CHECK(run.output.empty());
        CHECK(contains(run.errors, "ombrix: verify: option --for is a number of seconds, not \""));
    }
}

TEST_CASE("without an editor there is nothing to follow")
{
    VerifiedMachine machine;
    machine.description.editor(machine.folder.path("none"));
    machine.description.write(machine.folder.path("machine.json"));
    const ProgramRun run = runProgram(machine.wishes({ "--for", "0" }));
    CHECK(run.status == 1);
    CHECK(run.output.empty());
    CHECK(contains(run.errors, "the editor is not installed"));
}
