#include "tests/apps/ExplainedMachine.h"

#include <doctest/doctest.h>

#include <algorithm>
#include <sstream>

using namespace tests;

namespace {

bool contains(const std::string& text, std::string_view part)
{
    return text.find(part) != std::string::npos;
}

bool linesFit(const std::string& text, std::size_t columns)
{
    std::istringstream lines(text);
    for (std::string line; std::getline(lines, line);) {
        const auto isContinued = [](char byte) { return (static_cast<unsigned char>(byte) & 0xC0U) == 0x80; };
        const auto continued = static_cast<std::size_t>(std::count_if(line.begin(), line.end(), isContinued));
        if (line.size() - continued > columns)
            return false;
    }
    return true;
}

} // namespace

TEST_CASE("a linked clip is listed by its entry and by its target, and by nothing in between")
{
    ExplainedMachine machine;
    const std::string target = machine.folder.file("store/real.mov");
    const std::string between = machine.folder.link("store/between", target);
    const BundleBuilder coast = machine.events.event("Coast").movieLink("linked", between);
    const std::string entry = coast.moviePath("linked");
    const std::vector<ExplainAnswer> answers = machine.answers({ entry, target, between });
    REQUIRE(answers.size() == 3);
    const std::vector<std::string> objects { "Montaro | " + target, coast.path() + " | " + target };
    CHECK(answers[0].objects == objects);
    CHECK(answers[0].lastRule == "year");
    CHECK(answers[1].objects == objects);
    CHECK(answers[1].lastRule == "real path");
    CHECK(std::count(answers[1].rules.begin(), answers[1].rules.end(), "link") == 1);
    CHECK_FALSE(answers[2].listed);
    CHECK(answers[2].lastRule == "search folder");
    CHECK(machine.answer(target).rules == answers[1].rules);
}

TEST_CASE("a link to a hidden file is no clip")
{
    ExplainedMachine machine;
    const std::string target = machine.folder.file("store/.real.mov");
    const BundleBuilder coast = machine.events.event("Coast").movieLink("linked", target);
    checkUnlisted(machine.answer(coast.moviePath("linked")), "hidden file",
        "what it leads to is hidden, by a full stop before its name or by the file .hidden of its folder",
        "let it lead to a file that is not hidden");
}

TEST_CASE("clips of a linked folder are listed by both of their paths, each with all its rules")
{
    ExplainedMachine machine;
    for (const char* name : { "a.mov", "b.mov", "c.mov" })
        machine.folder.file(std::string("store/clips/") + name);
    machine.events.file("Coast/CurrentVersion.mtrevent");
    machine.events.link("Coast/Original Media", machine.folder.path("store/clips"));
    const std::string target = machine.folder.path("store/clips/a.mov");
    const std::vector<ExplainAnswer> answers = machine.answers(
        { machine.events.path("Coast/Original Media/a.mov"), target, machine.folder.path("store/clips/b.mov") });
    REQUIRE(answers.size() == 3);
    CHECK(answers[0].objects.back() == machine.events.path("Coast") + " | " + target);
    CHECK(answers[1].objects == answers[0].objects);
    std::vector<std::string> rules = answers[0].rules;
    rules.emplace_back("real path");
    CHECK(rules.size() == 12);
    CHECK(answers[1].rules == rules);
    CHECK(answers[2].rules == rules);
}

TEST_CASE("on a volume an event is listed as it is searched, and its clips by their real paths too")
{
    ExplainedMachine machine;
    const BundleBuilder coast = machine.stick.event("Coast").movieWithBytes("a.mov", "clip");
    const std::string spelled = "/Volumes/Stick/Montaro Events/Coast";
    CHECK(machine.answer(spelled).groups == std::vector<std::string> { spelled });
    CHECK(machine.answer(spelled + "/Original Media/a.mov").listed);
    CHECK(machine.answer(coast.moviePath("a.mov")).listed);
    checkUnlisted(machine.answer(coast.path()), "search folder",
        "the folder that it lies in is searched by another path, /Volumes/Stick/Montaro Events",
        "ask about " + spelled);
}

TEST_CASE("a path that leads into a library by a link is told by what the search calls it")
{
    ExplainedMachine machine;
    const BundleBuilder trip = machine.projects.project("Trip").movie("a.mov");
    machine.folder.link("alias", machine.folder.path("home"));
    machine.folder.link("short", trip.path());
    machine.projects.link("Trip/Shared Items/b.mov", "a.mov");
    const std::string searched = "the folder that it lies in is searched by another path, " + machine.projects.path();
    for (const std::string name : { "a.mov", "b.mov" }) {
        const std::string alias = machine.folder.path("alias/Movies/Montaro Projects/Trip/Shared Items/" + name);
        checkUnlisted(machine.answer(alias), "search folder", searched, "ask about " + trip.moviePath(name));
        const std::string shortcut = machine.folder.path("short/Shared Items/" + name);
        checkUnlisted(machine.answer(shortcut), "search folder", searched, "ask about " + trip.moviePath(name));
        CHECK(machine.answer(trip.moviePath(name)).listed);
    }
}

TEST_CASE("a volume that is not searched, and a place outside of all, are told apart")
{
    ExplainedMachine machine;
    checkUnlisted(machine.answer("/Volumes/Disk/Montaro Events/Coast"), "search folder",
        "its volume or folder is not searched; folders of that name are searched in the home folder's Movies and at "
        "the top of local volumes and removable media",
        "move the library there, or mount its volume");
    checkUnlisted(machine.answer("/no such place"), "search folder",
        "it lies in none of the 6 folders that are searched",
        "move it into a library, such as " + machine.projects.path());
    checkUnlisted(
        machine.answer("/"), "search folder", "it holds folders that are searched, and is none itself", "null");
}

TEST_CASE("a search folder shows what it holds, and one that is missing is told so")
{
    ExplainedMachine machine;
    checkUnlisted(
        machine.answer(machine.projects.path()), "record", "a search folder shows what it holds, not itself", "null");
    checkUnlisted(machine.answer("/Volumes/Stick/Montaro Projects"), "existence", "nothing is there", "null");
    const ExplainAnswer inside = machine.answer("/Volumes/Stick/Montaro Projects/Trip");
    checkUnlisted(inside, "listing", "it cannot be listed: it does not exist",
        "Montaro Projects: create the folder, or mount its volume");
    CHECK(inside.rules == std::vector<std::string> { "search folder", "listing" });
    CHECK(inside.lastPath == "/Volumes/Stick/Montaro Projects");
}

TEST_CASE("what is not there is told by the first rule that meets it")
{
    ExplainedMachine machine;
    const BundleBuilder trip = machine.projects.project("Trip").movie("a.mov");
    for (const std::string& path : { trip.moviePath("b.mov"), trip.moviePath("a.mov/x"), trip.path() + "/none/x" })
        checkUnlisted(machine.answer(path), "existence", "nothing is there", "null");
    CHECK(machine.answer(trip.path() + "/none/x").lastPath == trip.path() + "/none");
}

TEST_CASE("without the editor every path is answered by that alone")
{
    ExplainedMachine machine;
    machine.hasEditor = false;
    const BundleBuilder trip = machine.projects.project("Trip").movie("a.mov");
    for (const ExplainAnswer& answer : machine.answers({ trip.path(), "/none" })) {
        CHECK(answer.rules == std::vector<std::string> { "editor" });
        checkUnlisted(answer, "editor", "the editor is not installed, so nothing is loaded",
            "install the editor (\"ombrix info\" says where it is looked for)");
    }
}

TEST_CASE("a path is made absolute as text")
{
    ExplainedMachine machine;
    const BundleBuilder trip = machine.projects.project("Trip").movie("a.mov");
    const std::string library = machine.projects.path();
    for (const std::string& path :
        { trip.path() + "/", library + "/./Trip//", library + "/none/../Trip", "/.." + trip.path() }) {
        const ExplainAnswer answer = machine.answer(path);
        CHECK(answer.path == trip.path());
        CHECK(answer.listed);
    }
    const std::vector<ExplainAnswer> relative = machine.answers({ ".", "..", "a file", "./a file/" });
    REQUIRE(relative.size() == 4);
    CHECK(relative[2].path == (relative[0].path == "/" ? "" : relative[0].path) + "/a file");
    CHECK(relative[3].path == relative[2].path);
    CHECK(relative[0].path.substr(0, relative[1].path.size()) == relative[1].path);
    const ProgramRun empty = runProgram(machine.wishes({ "" }));
    CHECK(empty.status == 2);
    CHECK(empty.output.empty());
    CHECK(empty.errors == "ombrix: explain: \"\" is no path\n");
}

TEST_CASE("names of every kind of bytes are answered as they are, and are safe on a terminal")
{
    ExplainedMachine machine;
    const std::string name = "line\nfeed \x1b[31m caf\xe9";
    const BundleBuilder trip = machine.projects.project(name).movie("a b.mov");
    const std::vector<ExplainAnswer> answers = machine.answers({ trip.path(), trip.moviePath("a b.mov") });
    REQUIRE(answers.size() == 2);
    CHECK(answers[0].listed);
    CHECK(answers[0].path == machine.projects.path("line\nfeed \x1b[31m caf\xef\xbf\xbd"));
    CHECK(answers[1].listed);
    RunWishes wishes = machine.wishes({ trip.path(), "--color=never", "--hyperlink=never" });
    const ProgramRun terminal = runOnTerminal(wishes, {});
    CHECK_FALSE(contains(terminal.output, "\x1b"));
    CHECK(contains(terminal.output, "line\\x0afeed \\x1b[31m caf\\xe9"));
    CHECK(contains(runProgram(wishes).output, name));
}

TEST_CASE("several paths are answered in the order asked, each below its own name")
{
    ExplainedMachine machine;
    const BundleBuilder trip = machine.projects.project("Trip").movie("a.mov");
    const std::vector<std::string> paths { "/none", trip.path(), "/none" };
    const std::vector<ExplainAnswer> answers = machine.answers(paths);
    REQUIRE(answers.size() == 3);
    for (std::size_t index = 0; index < 3; ++index)
        CHECK(answers[index].path == paths[index]);
    const ProgramRun text = runProgram(machine.wishes({ "/none", trip.path() }));
    CHECK(text.output.substr(0, 6) == "/none\n");
    CHECK(contains(text.output, "\n\n~/Movies/Montaro Projects/Trip\nlisted   project Trip\n"));
    CHECK_FALSE(contains(runProgram(machine.wishes({ trip.path() })).output, "Projects/Trip\n"));
}

TEST_CASE("a library that is searched twice lists a path in each of its places, by the way through the first")
{
    ExplainedMachine machine;
    machine.description.removableMedium("/Volumes/Stick");
    machine.stick.event("Coast").movieWithBytes("a.mov", "clip");
    const std::string coast = "/Volumes/Stick/Montaro Events/Coast";
    const ExplainAnswer answer = machine.answer(coast);
    CHECK(answer.groups == std::vector<std::string> { coast, coast });
    CHECK(std::count(answer.rules.begin(), answer.rules.end(), "search folder") == 1);
    CHECK(machine.answer(coast + "/Original Media/a.mov").objects.size() == 4);
}

TEST_CASE("a path that two libraries meet is told by the one that lists it")
{
    ExplainedMachine machine;
    // The stick is the first library's folder "Nested.app", which is a package there.
    machine.projects.project("Nested.app/Montaro Projects/Trip").movie("a.mov");
    machine.description.removableMedium(machine.projects.path("Nested.app"));
    const std::string trip = machine.projects.path("Nested.app/Montaro Projects/Trip");
    const std::vector<ExplainAnswer> answers = machine.answers({ trip, trip + "/none" });
    REQUIRE(answers.size() == 2);
    CHECK(answers[0].listed);
    CHECK(answers[0].lastRule == "project");
    CHECK(answers[1].lastRule == "package");
}

TEST_CASE("paths are read from standard input, each ended by a zero byte")
{
    ExplainedMachine machine;
    const BundleBuilder trip = machine.projects.project("line\nfeed").movie("a.mov");
    RunWishes wishes = machine.wishes({ "-0", "-" });
    wishes.inputFile = machine.folder.file("paths", trip.path() + std::string("\0/none", 6));
    const ProgramRun text = runProgram(wishes);
    CHECK(text.status == 0);
    CHECK(contains(text.output, "listed   project line\nfeed\n"));
    CHECK(contains(text.output, "\n\n/none\nnot listed"));
    wishes.arguments.push_back("--json");
    const ProgramRun json = runProgram(wishes);
    CHECK(std::count(json.output.begin(), json.output.end(), '\n') == 2);
    wishes.inputFile.clear();
    CHECK(runProgram(wishes).output.empty());
    CHECK(runProgram(machine.wishes({ "-0" })).status == 2);
    CHECK(runProgram(machine.wishes({ "-0", "/none" })).status == 2);
    CHECK(runProgram(machine.wishes({})).status == 2);
}

TEST_CASE("an empty path among others is explained as one that lies nowhere")
{
    ExplainedMachine machine;
    const BundleBuilder trip = machine.projects.project("Trip").movie("a.mov");
    RunWishes wishes = machine.wishes({ "-0", "-", "--json" });
    wishes.inputFile = machine.folder.file("paths", std::string("\0", 1) + trip.path());
    const ProgramRun run = runProgram(wishes);
    CHECK(run.status == 0);
    CHECK(run.output.starts_with("{\"path\":\"\",\"listed\":false,"));
    CHECK(contains(run.output, "\n{\"path\":\"" + trip.path() + "\",\"listed\":true,"));
}

TEST_CASE("standard input that cannot be read is a failure, not an end")
{
    ExplainedMachine machine;
    RunWishes wishes = machine.wishes({ "-0", "-" });
    wishes.inputFile = machine.folder.path();
    const ProgramRun run = runProgram(wishes);
    CHECK(run.status == 1);
    CHECK(run.errors == "ombrix: standard input: it cannot be read\n");
}

TEST_CASE("in a text the deciding rule is marked, its reason is whole, and lines fit the terminal")
{
    ExplainedMachine machine;
    const BundleBuilder trip = machine.projects.project("Trip").movieWithBytes("final.MOV", "");
    const RunWishes wishes = machine.wishes({ trip.moviePath("final.MOV"), "--color=never", "--hyperlink=never" });
    const std::string text = runProgram(wishes).output;
    CHECK(contains(text, "not listed   the extension \"MOV\" is not one of mov, m4v, mp4, 3gp (case matters"));
    CHECK(
        contains(text, "\n  1 ok   search folder   ~/Movies/Montaro Projects   home folder, 1st of 3 for projects\n"));
    CHECK(contains(text, "\n  7 NO   extension       final.MOV                   ← decides\n"));
    CHECK(contains(text, "\nto list it   rename it to final.mov\n"));
    for (const int columns : { 60, 80, 100 }) {
        TerminalWishes terminal;
        terminal.columns = columns;
        const std::string shown = runOnTerminal(wishes, terminal).output;
        CAPTURE(shown);
        CHECK(linesFit(shown, static_cast<std::size_t>(columns)));
        CHECK(contains(shown, "final.MOV"));
        CHECK(contains(shown, "← decides"));
        CHECK_FALSE(contains(shown, "…"));
    }
}

TEST_CASE("on a narrow terminal what decides has its name, and what is listed is told whole")
{
    ExplainedMachine machine;
    const BundleBuilder trip
        = machine.projects.project("Trip to the harbour").movie("a long way.mov").movieWithBytes("Uppercase.MOV", "");
    RunWishes wishes = machine.wishes(
        { trip.moviePath("a long way.mov"), trip.moviePath("Uppercase.MOV"), "--color=never", "--hyperlink=never" });
    TerminalWishes terminal;
    terminal.columns = 40;
    const std::string shown = runOnTerminal(wishes, terminal).output;
    CAPTURE(shown);
    CHECK(linesFit(shown, 40));
    CHECK(contains(shown, "~/Movies/Montaro Projects/\nTrip to the harbour/Shared Items/\na long way.mov\n"));
    CHECK(contains(shown, "\nlisted   movie \"a long way\" of the\n         project Trip to the harbour\n"));
    CHECK(contains(shown, "\n  1 ok   search folder   ~/Movies/M…ects\n            home folder, 1st of 3 for\n"));
    CHECK(contains(shown, "\n  4 ok   hidden file\n            no file .hidden names it\n"));
    CHECK(contains(shown, "   Uppercase.MOV\n            ← decides\n"));
}
