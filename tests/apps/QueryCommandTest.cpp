#include "tests/apps/ProgramRun.h"
#include "tests/support/DescribedMachine.h"
#include "tests/support/MovieWriter.h"
#include "tests/support/TemporaryFolder.h"

#include <doctest/doctest.h>

#include <algorithm>
#include <csignal>
#include <filesystem>

using namespace tests;

namespace {

const char* const movies = "(kMDItemContentType = 'org.ombrix.movie')";

ProgramRun query(std::vector<std::string> arguments)
{
    arguments.insert(arguments.begin(), "query");
    return runProgram({ arguments, {}, {} });
}

void checkAnswer(const ProgramRun& run, const std::string& output)
{
    CAPTURE(run.errors);
    CHECK(run.status == 0);
    CHECK(run.errors.empty());
    CHECK(run.output == output);
}

/// Refused in one line, which holds `text`, with nothing printed.
void checkRefused(const ProgramRun& run, int status, const std::string& text)
{
    CAPTURE(run.errors);
    CHECK(run.status == status);
    CHECK(run.output.empty());
    CHECK(run.errors == "ombrix: " + text + "\n");
}

} // namespace

TEST_CASE("a query prints the paths of the files that match, one a line, scope after scope")
{
    const TemporaryFolder folder;
    const std::string first = folder.file("one/.hid/a.mov", movieBytes(640, 480));
    const std::string second = folder.file("two/B.MP4", movieBytes(1920, 1080));
    folder.file("two/c.txt");
    checkAnswer(query({ movies, folder.path("two"), folder.path("one") }), second + "\n" + first + "\n");
    checkAnswer(query({ "kMDItemPixelWidth >= 1920", folder.path() }), second + "\n");
    checkAnswer(query({ "kMDItemFSName = 'none'", folder.path() }), "");
    checkAnswer(query({ movies, second, second }), second + "\n" + second + "\n");
}

TEST_CASE("paths of a query can be ended by zero bytes or printed as JSON")
{
    const TemporaryFolder folder;
    const std::string path = folder.file("a\n\xFF.mov");
    checkAnswer(query({ movies, folder.path(), "-0" }), path + std::string(1, '\0'));
    checkAnswer(query({ movies, folder.path() }), path + "\n");
    checkAnswer(query({ "--json", movies, folder.path() }), "[\"" + folder.path() + "/a\\n\uFFFD.mov\"]\n");
    checkAnswer(query({ "--json", "kMDItemFSName = 'x'", folder.path() }), "[]\n");
    CHECK(query({ "--json", "-0", movies, folder.path() }).status == 2);
}

TEST_CASE("a scope keeps its spelling, and a relative one is made absolute")
{
    const TemporaryFolder folder;
    folder.file("real/a.mov");
    const std::string link = folder.link("link", "real");
    checkAnswer(query({ movies, link + "/" }), link + "/a.mov\n");
    checkAnswer(query({ movies, folder.path() + "/real/../link" }), folder.path() + "/real/../link/a.mov\n");
    const std::string relative = std::filesystem::relative(folder.path("real")).string();
    checkAnswer(query({ movies, relative }), folder.path("real") + "/a.mov\n");
}

TEST_CASE("a query asks the machine that is described and needs no editor")
{
    const TemporaryFolder folder;
    folder.file("stick/a.mov");
    DescribedMachine description;
    description.link("/Volumes/Stick", folder.path("stick")).write(folder.path("machine.json"));
    checkAnswer(
        query({ "--machine", folder.path("machine.json"), movies, "/Volumes/Stick" }), "/Volumes/Stick/a.mov\n");
}

TEST_CASE("an expression that is none is refused with its column, before anything is printed")
{
    const TemporaryFolder folder;
    folder.file("a.mov");
    checkRefused(query({ "kMDItemFSName = 'a", folder.path() }), 2, "query: column 17: this quoted text has no end");
    checkRefused(query({ "", folder.path() }), 2, "query: column 1: the query is empty");
    checkRefused(query({}), 2, "query: EXPRESSION is missing (\"ombrix help query\")");
    checkRefused(query({ movies }), 2, "query: SCOPE is missing (\"ombrix help query\")");
    checkRefused(query({ movies, folder.path(), "" }), 2, "query: \"\" is no path");
}

TEST_CASE("a scope that does not exist is told in one line, and the others are answered all the same")
{
    const TemporaryFolder folder;
    const std::string file = folder.file("a.mov");
    const ProgramRun run = query({ movies, folder.path("no\nne"), folder.path() });
    CHECK(run.status == 1);
    CHECK(run.output == file + "\n");
    CHECK(run.errors == "ombrix: " + folder.path() + "/no\\x0ane: it does not exist\n");
    checkRefused(query({ movies, "./none" }), 1, "./none: it does not exist");
    checkRefused(query({ movies, folder.link("dangling", "none") }), 1, folder.path("dangling: it does not exist"));
}

TEST_CASE("names in a query's answer are escaped on a terminal, and links to their files")
{
    const TemporaryFolder folder;
    const std::string file = folder.file("a\x1b.mov");
    const RunWishes wishes { { "query", movies, folder.path(), "--color=never", "--hyperlink=never" }, {}, {} };
    CHECK(runOnTerminal(wishes, {}).output == folder.path() + "/a\\x1b.mov\n");
    const RunWishes linked { { "query", movies, folder.path(), "--color=never", "--hyperlink=always" }, {}, {} };
    const std::string output = runOnTerminal(linked, {}).output;
    CHECK(output.find("\x1b]8;;file://") == 0);
    CHECK(output.find(folder.path() + "/a%1B.mov\x1b\\") != std::string::npos);
}

TEST_CASE("a query ends by the signal when nobody reads it, and fails when its output cannot be written")
{
    const TemporaryFolder folder;
    folder.file("a.mov");
    CHECK(runProgramForNobody({ { "query", movies, folder.path() }, {}, {} }).status == 128 + SIGPIPE);
    const ProgramRun full = runProgram({ { "query", movies, folder.path() }, {}, "/dev/full" });
    CHECK(full.status == 1);
    CHECK(full.errors.find("ombrix: standard output: ") == 0);
}

TEST_CASE("a live query prints what is there, then what comes and goes, at once, until a signal ends it")
{
    const TemporaryFolder folder;
    const std::string first = folder.file("a/one.mov");
    RunningProgram program({ { "query", "--live", movies, folder.path("a"), folder.path("later") } });
    REQUIRE(program.prints(first + "\n"));
    const std::string second = folder.file("a/two.mov");
    REQUIRE(program.prints("+" + second + "\n"));
    const std::string third = folder.file("later/below/three.mov");
    REQUIRE(program.prints("+" + third + "\n"));
    std::filesystem::remove(first);
    REQUIRE(program.prints("-" + first + "\n"));
    CHECK(program.workingFolder() == "/");
    const ProgramRun run = program.end(SIGTERM);
    CHECK(run.status == 128 + SIGTERM);
    CHECK(run.errors.empty());
    CHECK(run.output == first + "\n+" + second + "\n+" + third + "\n-" + first + "\n");
}

TEST_CASE("paths of a live query can be ended by zero bytes, and it has no one document")
{
    const TemporaryFolder folder;
    const std::string first = folder.file("a/one.mov");
    const std::string zero(1, '\0');
    RunningProgram program({ { "query", "--live", "-0", movies, folder.path("a") } });
    REQUIRE(program.prints(first + zero));
    const std::string second = folder.file("a/t\nwo.mov");
    CHECK(program.prints("+" + second + zero));
    CHECK(query({ "--live", "--json", movies, folder.path() }).status == 2);
}

TEST_CASE("a live query fails when its output cannot be written")
{
    const TemporaryFolder folder;
    folder.file("a.mov");
    const ProgramRun full = runProgram({ { "query", "--live", movies, folder.path() }, {}, "/dev/full" });
    CHECK(full.status == 1);
    CHECK(full.errors.find("ombrix: standard output: ") == 0);
}

TEST_CASE("a disk's format is told by the file system that holds a path, and a path that does not exist has none")
{
    const TemporaryFolder folder;
    folder.folder("stick/Movies");
    const std::string machine = folder.path("machine.json");
    const auto format = [&](const std::string& path) {
        const ProgramRun run = runProgram({ { "--machine", machine, "disk-format", path }, {}, {} });
        CHECK(run.status == 0);
        CHECK(run.errors.empty());
        return run.output;
    };
    const std::pair<const char*, const char*> types[] { { "vfat", "false\n" }, { "msdos", "false\n" },
        { "ntfs3", "false\n" }, { "nfs4", "false\n" }, { "orbfs", "false\n" }, { "davfs", "false\n" },
        { "udf", "false\n" }, { "exfat", "true\n" }, { "ext4", "true\n" }, { "MSDOS", "true\n" } };
    for (const auto& row : types) {
        const char* const type = row.first;
        const char* const expected = row.second;
        CAPTURE(type);
        DescribedMachine description;
        description.localVolume(folder.path("stick"), "Stick", type);
        description.link("/Volumes/Stick", folder.path("stick")).write(machine);
        CHECK(format(folder.path("stick/Movies")) == expected);
        CHECK(format("/Volumes/Stick") == expected);
        CHECK(format(folder.path("stick/none")) == "false\n");
    }
    CHECK(format("") == "false\n");
    CHECK(format(std::filesystem::relative(folder.path("stick")).string()) == "true\n");
}

TEST_CASE("a disk's format is refused without a path and for an unknown source")
{
    checkRefused(
        runProgram({ { "disk-format" }, {}, {} }), 2, "disk-format: PATH is missing (\"ombrix help disk-format\")");
    checkRefused(runProgram({ { "disk-format", "/", "--source", "org.example.None" }, {}, {} }), 1,
        "org.example.None: there is no such plug-in; found: org.ombrix.OBMontaroPlugin");
}
