#include "tests/apps/ProgramRun.h"
#include "tests/support/DescribedMachine.h"
#include "tests/support/LibraryBuilder.h"
#include "tests/support/TemporaryFolder.h"

#include <doctest/doctest.h>

#include <algorithm>
#include <csignal>

using namespace tests;

namespace {

/// A machine with a project in a folder, one with a hostile name, and one with many movies.
struct MadeMachine {
    MadeMachine()
        : library(folder.folder("home/Movies/Montaro Projects"))
    {
        library.project("Travel/Grüße").movie("Beach sunset.mov").movie("sunset.mov");
        library.project("Bad \x1b[31m\nsunset");
        BundleBuilder many = library.project("Many");
        for (int take = 10; take < 40; ++take)
            many.movieWithBytes("take " + std::to_string(take) + ".mov", "no movie");
        description.home(folder.path("home")).editor(folder.file("editor")).localVolume("/");
        description.write(folder.path("machine.json"));
    }

    RunWishes wishes(std::vector<std::string> arguments) const
    {
        arguments.insert(arguments.begin(), { "--machine", folder.path("machine.json"), "find" });
        return { arguments, {}, {} };
    }
    ProgramRun run(const std::vector<std::string>& arguments) const { return runProgram(wishes(arguments)); }
    std::string movie(const std::string& name) const { return library.path("Travel/Grüße/Shared Items/" + name); }

    const TemporaryFolder folder;
    LibraryBuilder library;
    DescribedMachine description;
};

bool contains(const std::string& text, std::string_view part)
{
    return text.find(part) != std::string::npos;
}

auto linesIn(const std::string& text)
{
    return std::count(text.begin(), text.end(), '\n');
}

std::string hit(const std::string& kind, const std::string& name, const std::string& path, const std::string& group)
{
    return R"({"kind":")" + kind + R"(","name":")" + name + R"(","path":")" + path + R"(","group":")" + group + "\"}";
}

} // namespace

TEST_CASE("what is found is printed best first with the group that it lies in")
{
    const MadeMachine machine;
    const ProgramRun run = machine.run({ "SUNSET", "--json", "--kind", "object" });
    CHECK(run.status == 0);
    CHECK(run.errors.empty());
    const std::string project = machine.library.path("Travel/Grüße");
    CHECK(run.output
        == "[" + hit("object", "sunset", machine.movie("sunset.mov"), project) + ","
            + hit("object", "Beach sunset", machine.movie("Beach sunset.mov"), project) + "]\n");
    CHECK(machine.run({ "grusse", "--json" }).output
        == "[" + hit("group", "Grüße", project, machine.library.path("Travel")) + "]\n");
}

TEST_CASE("the root lies in no group")
{
    const MadeMachine machine;
    CHECK(contains(machine.run({ "montaro", "--json", "--limit", "1" }).output, "\"name\":\"Montaro\""));
    CHECK(contains(machine.run({ "montaro", "--json", "--limit", "1" }).output, "\"group\":null}]\n"));
}

TEST_CASE("a person is shown twenty hits and the count of the rest, a program all of them")
{
    const MadeMachine machine;
    const ProgramRun shown = machine.run({ "take" });
    CHECK(shown.status == 0);
    CHECK(linesIn(shown.output) == 21);
    CHECK(contains(shown.output, "\n… 10 more (\"--limit 30\" shows all)\n"));
    CHECK(linesIn(machine.run({ "take", "--limit", "30" }).output) == 30);
    CHECK(contains(machine.run({ "take", "--limit=1" }).output, "\n… 29 more ("));
    const std::string all = machine.run({ "take", "--json" }).output;
    CHECK(contains(all, "take 10"));
    CHECK(contains(all, "take 39"));
    const std::string paths = machine.run({ "take", "-0" }).output;
    CHECK(std::count(paths.begin(), paths.end(), '\0') == 30);
    CHECK(machine.run({ "beach", "-0" }).output == machine.movie("Beach sunset.mov") + '\0');
}

TEST_CASE("a hit in a pipe tells its kind, its groups and its whole path")
{
    const MadeMachine machine;
    CHECK(machine.run({ "beach" }).output
        == "Beach sunset   movie   Travel › Grüße   " + machine.movie("Beach sunset.mov") + "\n");
}

TEST_CASE("nothing found is no failure")
{
    const MadeMachine machine;
    const ProgramRun json = machine.run({ "nowhere", "--json" });
    CHECK(json.status == 0);
    CHECK(json.output == "[]\n");
    CHECK(json.errors.empty());
    const ProgramRun text = machine.run({ "now\nhere", "--kind", "group" });
    CHECK(text.status == 0);
    CHECK(text.output.empty());
    CHECK(text.errors == "ombrix: find: nothing is called \"now\\x0ahere\" (looked through 6 names)\n");
    CHECK(contains(machine.run({ "nowhere" }).errors, "(looked through 38 names)\n"));
    CHECK(contains(machine.run({ "beach sunset.mov" }).errors,
        "(looked through 38 names; they have no extensions, and \"beach sunset\" is among them)\n"));
}

TEST_CASE("a search without a word, a kind that is none and a limit that is no number are wrong usage")
{
    const MadeMachine machine;
    for (const std::vector<std::string>& arguments : std::vector<std::vector<std::string>> { {}, { "" }, { " \t\n" },
             { "a", "--limit", "0" }, { "a", "--limit", "1x" }, { "a", "--limit", "-1" }, { "a", "--limit", "" },
             { "a", "--limit", "99999999999999999999999" }, { "a", "--kind", "clip" }, { "a", "-0", "--json" } }) {
        const ProgramRun run = machine.run(arguments);
        CAPTURE(run.errors);
        CHECK(run.status == 2);
        CHECK(run.output.empty());
        CHECK(linesIn(run.errors) == 1);
        CHECK(run.errors.substr(0, 14) == "ombrix: find: ");
    }
    CHECK(contains(machine.run({ "a", "--kind", "objct" }).errors, "(did you mean \"object\"?)"));
}

TEST_CASE("the newest of equally good hits stands first where that is asked for")
{
    const MadeMachine machine;
    const auto movie = [&machine](const std::string& take) {
        return machine.library.path("Many/Shared Items/take " + take + ".mov");
    };
    for (int take = 10; take < 40; ++take)
        setModificationDate(movie(std::to_string(take)), { 1'000'000'000, 0 });
    setModificationDate(movie("25"), { 1'200'000'000, 0 });
    setModificationDate(movie("17"), { 1'300'000'000, 0 });
    CHECK(machine.run({ "take", "--newest", "--limit", "2", "-0" }).output == movie("17") + '\0' + movie("25") + '\0');
}

TEST_CASE("a hit is one safe line of a terminal, however narrow")
{
    const MadeMachine machine;
    for (const int columns : { 20, 40, 80, 200 }) {
        CAPTURE(columns);
        const ProgramRun run = runOnTerminal(machine.wishes({ "sunset", "--color=never" }), { 24, columns });
        CHECK(run.status == 0);
        CHECK(linesIn(run.output) == 3);
        CHECK_FALSE(contains(run.output, "\x1b"));
    }
    CHECK(contains(runOnTerminal(machine.wishes({ "sunset" }), {}).output, "\x1b]8;;file://"));
    CHECK(contains(machine.run({ "bad" }).output, "\x1b[31m\nsunset"));
}

TEST_CASE("without the editor nothing is found, and a full disk is told")
{
    const MadeMachine machine;
    RunWishes wishes = machine.wishes({ "take" });
    wishes.outputFile = "/dev/full";
    CHECK(runProgram(wishes).status == 1);
    const std::string file = machine.folder.file("bare.json", "{}");
    const ProgramRun bare = runProgram({ { "find", "take", "--json", "--machine", file }, {}, {} });
    CHECK(bare.status == 1);
    CHECK(bare.output.empty());
    CHECK(linesIn(bare.errors) == 1);
}
