#include "tests/apps/ProgramRun.h"
#include "tests/support/DescribedMachine.h"
#include "tests/support/FencedBlocks.h"
#include "tests/support/GoldenText.h"
#include "tests/support/LibraryBuilder.h"
#include "tests/support/TemporaryFolder.h"

#include <doctest/doctest.h>

#include <algorithm>
#include <csignal>
#include <string>

using namespace tests;

namespace {

/// A run of the example for a user whose home and data folders lie in `folder`.
RunWishes exampleRun(const TemporaryFolder& folder)
{
    RunWishes wishes;
    wishes.program = OMBRIX_HOST_EXAMPLE;
    wishes.environment = { { "HOME", folder.path("home") }, { "XDG_DATA_HOME", folder.path("data") },
        { "XDG_DATA_DIRS", "/nonexistent" } };
    return wishes;
}

void installEditor(const TemporaryFolder& folder)
{
    const std::string editor = folder.file("editor");
    folder.file("data/applications/org.ombrix.Montaro.desktop",
        "[Desktop Entry]\nType=Application\nName=Montaro\nExec=" + editor + "\n");
}

} // namespace

TEST_CASE("the example of an application prints the tree when it is published, and Ctrl-C ends it")
{
    const TemporaryFolder folder;
    installEditor(folder);
    LibraryBuilder projects(folder.folder("home/Movies/Montaro Projects"));
    projects.project("Clients/Meyer").movie("a.mov");
    TerminalWishes terminal;
    terminal.sendSignalAfter = "  Events\n";
    terminal.signal = SIGINT;
    const ProgramRun run = runWithErrorsOnTerminal(exampleRun(folder), terminal);
    CHECK(run.status == 0);
    CHECK(run.errors.empty());
    CHECK(run.output == "Montaro\n  Clients\n    Meyer\n  Events\n");
}

TEST_CASE("the example of an application prints the tree again when a project has come")
{
    const TemporaryFolder folder;
    installEditor(folder);
    LibraryBuilder projects(folder.folder("home/Movies/Montaro Projects"));
    projects.project("Meyer").movie("a.mov");
    RunningProgram program(exampleRun(folder));
    REQUIRE(program.prints("Montaro\n  Meyer\n  Events\n"));
    projects.project("Berger").movie("b.mov");
    CHECK(program.prints("  Berger\n"));
    CHECK(program.end(SIGINT).status == 0);
}

TEST_CASE("the example of an application says so when there is nothing to load")
{
    const TemporaryFolder folder;
    TerminalWishes terminal;
    terminal.sendSignalAfter = "no editor there";
    terminal.signal = SIGINT;
    const ProgramRun run = runWithErrorsOnTerminal(exampleRun(folder), terminal);
    CHECK(run.status == 0);
    CHECK(run.output.empty());
    CHECK(run.errors == "nothing to load: no editor there\n");
}

TEST_CASE("what README shows of an application is a part of the example, which has at most fifty lines")
{
    const std::string example = contentOf(OMBRIX_SOURCE_FOLDER "/examples/host/HostExample.cpp");
    CHECK(std::count(example.begin(), example.end(), '\n') <= 50);
    const std::string readme = contentOf(OMBRIX_SOURCE_FOLDER "/README.md");
    const std::string fence = "```cpp\n";
    const std::size_t start = readme.find(fence, readme.find("## Embed")) + fence.size();
    const std::string shown = readme.substr(start, readme.find("```\n", start) - start);
    CHECK(shown.starts_with("int browse("));
    CHECK(example.find("\n" + shown) != std::string::npos);
}

TEST_CASE("the example with a loop of its own counts what is on a described machine, and ends by itself")
{
    const TemporaryFolder folder;
    LibraryBuilder projects(folder.folder("home/Movies/Montaro Projects"));
    projects.project("Clients/Meyer").movie("a.mov");
    DescribedMachine description;
    description.home(folder.path("home")).editor(folder.file("editor"));
    description.write(folder.path("machine.json"));
    RunWishes wishes;
    wishes.program = OMBRIX_OWN_LOOP_EXAMPLE;
    wishes.arguments = { folder.path("machine.json") };
    const ProgramRun run = runProgram(wishes);
    CHECK(run.status == 0);
    CHECK(run.errors.empty());
    CHECK(run.output == "4 groups\n");
    wishes.arguments = { folder.path("none.json") };
    CHECK(runProgram(wishes).status == 1);
}

TEST_CASE("what the guide to embedding shows is a part of the examples, to the letter")
{
    std::string examples = "\n";
    for (const char* file : { "HostExample.cpp", "OwnLoopExample.cpp", "CMakeLists.txt" })
        examples += contentOf(OMBRIX_SOURCE_FOLDER "/examples/host/" + std::string(file)) + "\n";
    const std::vector<FencedBlock> blocks = fencedBlocks(contentOf(OMBRIX_SOURCE_FOLDER "/docs/embedding.md"));
    CHECK(blocks.size() >= 4);
    for (const FencedBlock& block : blocks) {
        CAPTURE(block.text);
        CHECK(examples.find(block.text) != std::string::npos);
    }
}
