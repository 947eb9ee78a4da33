#include "tests/apps/ProgramRun.h"
#include "tests/support/DescribedMachine.h"
#include "tests/support/GoldenText.h"
#include "tests/support/LibraryBuilder.h"
#include "tests/support/TemporaryFolder.h"

#include <doctest/doctest.h>

#include <chrono>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <thread>

using namespace tests;

namespace {

constexpr std::chrono::seconds longestWait { 30 };

/// A described machine with one project of two movies, and an editor and an "xdg-open" that write down how they were
/// started.
struct MachineToActOn {
    MachineToActOn()
    {
        BundleBuilder trip = library.project("Trip");
        trip.movie("a b%.mov", 640, 480);
        trip.movie("c.mov");
        described.home(disk.folder("home")).editor(script("bin/montaro"));
        script("bin/xdg-open");
        described.write(disk.path("machine.json"));
    }
    /// A program that writes its name and its arguments into `started`, one a line, whole or not at all.
    std::string script(const std::string& path)
    {
        std::string file = disk.file(path,
            "#!/bin/sh\n{ echo \"${0##*/}\"; for argument; do echo \"$argument\"; done; } > '" + started + ".new'\nmv '"
                + started + ".new' '" + started + "'\n");
        std::filesystem::permissions(file, std::filesystem::perms::owner_all);
        return file;
    }
    ProgramRun run(std::vector<std::string> arguments) const
    {
        arguments.insert(arguments.begin(), { "--machine", disk.path("machine.json") });
        RunWishes wishes { std::move(arguments) };
        wishes.environment = { { "PATH", disk.path("bin") + ":/usr/bin:/bin" },
            { "DBUS_SESSION_BUS_ADDRESS", "unix:path=" + disk.path("no-bus") } };
        return runProgram(wishes);
    }
    /// What was started, once it has run.
    std::string whatStarted() const
    {
        const auto end = std::chrono::steady_clock::now() + longestWait;
        while (!std::filesystem::exists(started) && std::chrono::steady_clock::now() < end)
            std::this_thread::yield();
        std::ifstream file(started, std::ios::binary);
        return { std::istreambuf_iterator<char>(file), {} };
    }

    TemporaryFolder disk {};
    const std::string started = disk.path("started");
    LibraryBuilder library { disk.path("home/Movies/Montaro Projects") };
    const std::string project = disk.path("home/Movies/Montaro Projects/Trip");
    const std::string movie = project + "/Shared Items/a b%.mov";
    DescribedMachine described {};
};

void checkAnswer(const ProgramRun& run, const std::string& output)
{
    CAPTURE(run.errors);
    CHECK(run.status == 0);
    CHECK(run.errors.empty());
    CHECK(run.output == output);
}

void checkRefused(const ProgramRun& run, int status, const std::string& text)
{
    CHECK(run.status == status);
    CHECK(run.output.empty());
    CHECK(run.errors == "ombrix: " + text + "\n");
}

} // namespace

TEST_CASE("a menu is printed with its items and their actions, for a program as one document")
{
    const MachineToActOn machine;
    checkAnswer(machine.run({ "menu", "--object", machine.movie, "--json" }),
        R"({"title":"Object Context Menu","items":[{"title":"Open in Montaro","action":"contextMenuOpen:","keyEquivalent":""},)"
        R"({"title":"Show in File Manager","action":"contextMenuReveal:","keyEquivalent":""}]})"
        "\n");
    checkAnswer(machine.run({ "menu", "--group", "Montaro", "--json" }),
        R"({"title":"Group Context Menu","items":[{"title":"Open Montaro","action":"contextMenuOpen:","keyEquivalent":""}]})"
        "\n");
    checkAnswer(machine.run({ "menu", "--group", machine.project }),
        "Group Context Menu\n  Open in Montaro  (contextMenuOpen:)\n");
}

TEST_CASE("an item without a text is left out of a menu, which may have none left")
{
    const MachineToActOn machine;
    const std::string bundle = machine.disk.path("plugins/Montaro.obplugin");
    std::filesystem::create_directories(machine.disk.path("plugins"));
    std::filesystem::copy(OMBRIX_MONTARO_BUNDLE, bundle, std::filesystem::copy_options::recursive);
    const std::string table = bundle + "/resources/en.strings.plist";
    std::string texts = contentOf(table);
    std::string expected = R"({"title":"Object Context Menu","items":[{"title":"Open in Montaro",)"
                           R"("action":"contextMenuOpen:","keyEquivalent":""}]})"
                           "\n";
    for (const char* key : { "RevealInNavion", "OpenInMontaro" }) {
        texts = replaced(texts, "<key>" + std::string(key) + "</key>", "<key>Other " + std::string(key) + "</key>");
        writeFile(table, texts);
        RunWishes wishes { { "--machine", machine.disk.path("machine.json"), "menu", "--object", machine.movie,
            "--json" } };
        wishes.environment = { { "OMBRIX_PLUGIN_PATH", machine.disk.path("plugins") } };
        checkAnswer(runProgram(wishes), expected);
        expected = "{\"title\":\"Object Context Menu\",\"items\":[]}\n";
    }
}

TEST_CASE("a menu of nothing that is there is null")
{
    const MachineToActOn machine;
    checkAnswer(machine.run({ "menu", "--object", "/nowhere.mov", "--json" }), "null\n");
    checkAnswer(machine.run({ "menu", "--group", "nothing" }), "null\n");
}

TEST_CASE("open starts the described editor by its path, and outlives neither it nor waits for it")
{
    const MachineToActOn machine;
    checkAnswer(machine.run({ "open" }), "");
    CHECK(machine.whatStarted() == "montaro\n");
}

TEST_CASE("open says so where the editor is not registered or cannot be started")
{
    MachineToActOn machine;
    machine.described.editor(machine.disk.path("bin/missing"));
    machine.described.write(machine.disk.path("machine.json"));
    checkRefused(
        machine.run({ "open" }), 1, "editor: " + machine.disk.path("bin/missing") + ": No such file or directory");
    DescribedMachine().home(machine.disk.path("home")).write(machine.disk.path("machine.json"));
    checkRefused(machine.run({ "open" }), 1, "editor: the editor is not installed");
}

TEST_CASE("reveal opens the folder of any file where no file manager answers on the bus")
{
    const MachineToActOn machine;
    checkAnswer(machine.run({ "reveal", machine.movie }), "");
    CHECK(machine.whatStarted() == "xdg-open\n" + machine.project + "/Shared Items\n");
}

TEST_CASE("reveal refuses what is not there, and nothing is started")
{
    const MachineToActOn machine;
    checkRefused(machine.run({ "reveal", "/nowhere.mov" }), 1, "/nowhere.mov: no such file or directory");
    checkRefused(machine.run({ "reveal" }), 2, "reveal: PATH is missing (\"ombrix help reveal\")");
    CHECK_FALSE(std::filesystem::exists(machine.started));
}

TEST_CASE("export prints the property list of the projects that the selection belongs to")
{
    const MachineToActOn machine;
    const ProgramRun group = machine.run({ "export", "--group", machine.project });
    CHECK(group.status == 0);
    CHECK(group.output.find("<key>ProjectPath</key>") != std::string::npos);
    CHECK(group.output.find("<string>{640, 480}</string>") != std::string::npos);
    CHECK(group.output.find("<string>" + machine.movie + "</string>") != std::string::npos);
    const ProgramRun object
        = machine.run({ "export", "--object", machine.project + "/Shared Items/c.mov", "--in", "Montaro" });
    CHECK(object.output == group.output);
    const ProgramRun own = machine.run({ "export", "--object", machine.movie, "--in", machine.project });
    CHECK(own.output.find("<dict/>") != std::string::npos);
    checkAnswer(machine.run({ "export", "--group", "Events" }), "");
}

TEST_CASE("export refuses what is mixed up or not there")
{
    const MachineToActOn machine;
    checkRefused(
        machine.run({ "export" }), 2, "export: --object PATH or --group ID is missing (\"ombrix help export\")");
    checkRefused(
        machine.run({ "export", "--object", "a", "--group", "b" }), 2, "export: objects and groups are exported apart");
    checkRefused(machine.run({ "export", "--in", "a", "--object", "b" }), 2,
        "export: option --in belongs behind the --object that it is about");
    checkRefused(machine.run({ "export", "--object", "/nowhere.mov" }), 1, "/nowhere.mov: no object has this path");
    checkRefused(machine.run({ "export", "--object", machine.project, "--in", "Montaro" }), 1,
        machine.project + ": no object of that group has this path");
    CHECK(machine.run({ "export", "--group", "nothing" }).status == 1);
}

TEST_CASE("export for the clipboard fails at once, and loads nothing, where there is no display")
{
    MachineToActOn machine;
    const std::string problem = "clipboard: there is no display (neither DISPLAY nor WAYLAND_DISPLAY is set)";
    checkRefused(machine.run({ "export", "--clipboard", "--group", machine.project }), 1, problem);
    DescribedMachine().home(machine.disk.path("home")).write(machine.disk.path("machine.json"));
    checkRefused(machine.run({ "export", "--clipboard", "--group", machine.project }), 1, problem);
    checkRefused(machine.run({ "export", "--clipboard" }), 2,
        "export: --object PATH or --group ID is missing (\"ombrix help export\")");
}
