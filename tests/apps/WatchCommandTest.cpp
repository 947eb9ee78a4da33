#include "tests/apps/ProgramRun.h"
#include "tests/support/DescribedMachine.h"
#include "tests/support/LibraryBuilder.h"
#include "tests/support/TemporaryFolder.h"

#include <doctest/doctest.h>

#include <csignal>
#include <filesystem>
#include <string>
#include <vector>

using namespace tests;

namespace {

/// A home with an editor, watched by the real machine.
class Home {
public:
    Home()
    {
        _folder.file("montaro");
        _folder.folder("home/Movies/Montaro Events");
        _folder.folder("home/Movies/Montaro Projects");
        DescribedMachine description;
        description.home(_folder.path("home")).editor(_folder.path("montaro")).write(_folder.path("machine.json"));
    }

    RunWishes watch(std::vector<std::string> options = {}) const
    {
        options.insert(options.begin(), { "--machine", _folder.path("machine.json"), "watch" });
        return { options };
    }
    std::string path(const std::string& inside) const { return _folder.path("home/" + inside); }
    LibraryBuilder events() const { return LibraryBuilder(path("Movies/Montaro Events")); }
    LibraryBuilder projects() const { return LibraryBuilder(path("Movies/Montaro Projects")); }
    const TemporaryFolder& folder() const { return _folder; }

private:
    const TemporaryFolder _folder {};
};

std::size_t countOf(const std::string& text, const std::string& part)
{
    std::size_t count = 0;
    for (std::size_t found = text.find(part); found != std::string::npos; found = text.find(part, found + 1))
        ++count;
    return count;
}

std::size_t countLines(const std::string& text)
{
    return countOf(text, "\n");
}

void checkRefused(const ProgramRun& run, int status, const std::string& text)
{
    CHECK(run.status == status);
    CHECK(run.output.empty());
    CHECK(run.errors == "ombrix: " + text + "\n");
}

} // namespace

TEST_CASE("a watch prints the tree at once and again when it is published, each a document of one line")
{
    const Home home;
    home.projects().project("Draft\n");
    RunningProgram program(home.watch({ "--json" }));
    REQUIRE(program.prints("]}\n"));
    CHECK(countLines(program.output()) == 1);
    CHECK(program.output().find("{\"typeIdentifier\":\"OBMontaroRootGroupTypeIdentifier\"") == 0);
    home.events().event("Coast").movie("a.mov");
    REQUIRE(program.prints("\"name\":\"Coast\""));
    const ProgramRun run = program.end(SIGINT);
    CHECK(run.status == 0);
    CHECK(run.errors.empty());
    // What was made just before the watch began may count as a change, too.
    CHECK(countLines(run.output) >= 2);
    CHECK(countOf(run.output, "{\"typeIdentifier\":\"OBMontaroRootGroupTypeIdentifier\"") == countLines(run.output));
}

TEST_CASE("a watch tells people and programs in a line what came and went, and why")
{
    const Home home;
    BundleBuilder draft = home.projects().project("Draft");
    RunningProgram lines(home.watch());
    RunningProgram changes(home.watch({ "--changes" }));
    REQUIRE(lines.prints("watching  4 search folders, "));
    REQUIRE(lines.prints(" folders (inotify)\n"));
    REQUIRE(changes.prints("]}\n"));
    draft.movie("a.mov"); // its marker is left alone, which the query would tell of first now and then
    home.projects().folder("Clients");
    // In one line, unless the two came before and after a scan.
    CHECK(lines.prints("  projects  + Clients  "));
    CHECK(lines.prints("~ Draft: 0 → 1 movie  "));
    CHECK(lines.prints("scanned in "));
    CHECK(lines.prints(" (changed: " + home.path("Movies/Montaro Projects")));
    const std::string library = home.path("Movies/Montaro Projects");
    CHECK(changes.prints("{\"half\":\"projects\",\"added\":["));
    CHECK(changes.prints("{\"kind\":\"object\",\"name\":\"a\",\"path\":\"" + library
        + "/Draft/Shared Items/a.mov\",\"group\":\"" + library + "/Draft\"}"));
    CHECK(changes.prints(
        "{\"kind\":\"group\",\"name\":\"Clients\",\"path\":\"" + library + "/Clients\",\"group\":\"Montaro\"}"));
    CHECK(changes.prints(",\"removed\":[],\"changed\":[{\"kind\":\"group\",\"name\":\"Draft\","));
    CHECK(changes.prints("],\"cause\":\"changed: " + library));
    CHECK(lines.end(SIGHUP).status == 0);
    CHECK(changes.end(SIGTERM).status == 0);
}

TEST_CASE("a watch tells that a restart shows another order of the editor's")
{
    const Home home;
    RunningProgram program(home.watch());
    REQUIRE(program.prints("watching"));
    writeFile(home.path("Library/Preferences/org.ombrix.Montaro.plist"),
        "<plist><dict><key>ZREventLibraryModule.arrangeEventsByMostRecent</key><false/></dict></plist>");
    CHECK(program.prints("warning   the editor's order of events changed: a restart shows it\n"));
}

TEST_CASE("a watch holds no working folder")
{
    const Home home;
    RunningProgram program(home.watch());
    REQUIRE(program.prints("watching"));
    CHECK(program.workingFolder() == "/");
}

TEST_CASE("a watch ends after the time it was told")
{
    const Home home;
    const ProgramRun run = runProgram(home.watch({ "--json", "--for", "0.01" }));
    CHECK(run.status == 0);
    CHECK(countLines(run.output) == 1);
    CHECK(runProgram(home.watch({ "--changes", "--for=0" })).output == run.output);
    for (const char* wrong : { "", "x", "-1", "1s", "nan", "inf", " 1", "1e3" }) {
        checkRefused(runProgram(home.watch({ "--for", wrong })), 2,
            "watch: option --for is a number of seconds, not \"" + std::string(wrong) + "\"");
    }
}

TEST_CASE("a watch without an editor says so")
{
    const TemporaryFolder folder;
    DescribedMachine description;
    description.home(folder.path()).write(folder.path("machine.json"));
    checkRefused(runProgram({ { "--machine", folder.path("machine.json"), "watch" } }), 1,
        "Montaro: the editor is not installed, so its libraries are not shown");
}

TEST_CASE("a watch whose output cannot be written ends")
{
    const Home home;
    RunWishes wishes = home.watch({ "--json" });
    wishes.outputFile = "/dev/full";
    const ProgramRun full = runProgram(wishes);
    CHECK(full.status == 1);
    CHECK(full.errors.find("ombrix: standard output: ") == 0);
    CHECK(runProgramForNobody(home.watch({ "--json" })).status == 128 + SIGPIPE);
}
