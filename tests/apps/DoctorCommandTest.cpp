#include "platform/formats/Json.h"
#include "tests/apps/ProgramRun.h"
#include "tests/apps/SilentDisk.h"
#include "tests/support/DescribedMachine.h"
#include "tests/support/LibraryBuilder.h"
#include "tests/support/TemporaryFolder.h"

#include <doctest/doctest.h>

#include <algorithm>
#include <chrono>

using namespace tests;

namespace {

struct CheckedMachine {
    CheckedMachine()
        : library(folder.folder("home/Movies/Montaro Projects"))
    {
        description.home(folder.path("home")).localVolume("/");
        description.editor(folder.file("editor"));
    }

    ProgramRun run(std::vector<std::string> arguments = {}) const
    {
        description.write(folder.path("machine.json"));
        arguments.insert(arguments.begin(), { "--machine", folder.path("machine.json"), "doctor" });
        return runProgram({ arguments, {}, {} });
    }

    const TemporaryFolder folder;
    LibraryBuilder library;
    DescribedMachine description;
};

bool contains(const std::string& text, std::string_view part)
{
    return text.find(part) != std::string::npos;
}

/// "severity subject" of each finding, in order, and whether the machine is healthy.
std::vector<std::string> summary(const std::string& output)
{
    const platform::JsonResult document = platform::readJson(output);
    CAPTURE(output);
    REQUIRE(document.problem.empty());
    std::vector<std::string> lines { document.root.member("healthy")->boolean ? "healthy" : "ill" };
    for (const platform::JsonNode& finding : document.root.member("findings")->items) {
        CHECK(finding.members.size() == 4);
        CHECK_FALSE(finding.member("text")->text.empty());
        lines.push_back(finding.member("severity")->text + " " + finding.member("subject")->text);
    }
    return lines;
}

using Lines = std::vector<std::string>;

} // namespace

TEST_CASE("a sound machine is healthy and has no finding in JSON")
{
    const CheckedMachine machine;
    const ProgramRun run = machine.run({ "--json" });
    CHECK(run.status == 0);
    CHECK(run.errors.empty());
    CHECK(summary(run.output) == Lines { "healthy" });
    const std::string text = machine.run().output;
    CHECK(contains(text, "ok    editor       " + machine.folder.path("editor") + "\n"));
    CHECK(contains(text, "ok    libraries    1 search folder exists; 3 do not, which is normal\n"));
    CHECK(contains(text, "ok    preferences  none is damaged\n"));
}

TEST_CASE("a missing editor makes a machine ill")
{
    CheckedMachine machine;
    machine.description.editor(machine.folder.path("none"));
    const ProgramRun run = machine.run();
    CHECK(run.status == 1);
    CHECK(contains(run.output, "FAIL  editor       nothing exists at " + machine.folder.path("none")));
    CHECK(summary(machine.run({ "--json" }).output) == Lines { "ill", "fail editor" });
}

TEST_CASE("a disk of another format, one folder under two spellings, stray libraries and damaged preferences are told")
{
    CheckedMachine machine;
    const std::string stick = machine.folder.folder("stick");
    machine.folder.folder("stick/Montaro Events");
    machine.folder.folder("home/Videos/Montaro Events");
    machine.folder.file("home/.config/user-dirs.dirs", "XDG_VIDEOS_DIR=\"$HOME/Videos\"\n");
    machine.folder.file("home/Library/Preferences/org.ombrix.Montaro.plist", "junk");
    machine.description.localVolume(stick, "Stick", "vfat").removableMedium(stick, "Stick");
    machine.description.link("/Volumes/Stick", stick);
    const ProgramRun run = machine.run({ "--json" });
    CHECK(run.status == 0);
    CHECK(summary(run.output)
        == Lines { "healthy", "note libraries", "warn libraries", "note volumes", "warn preferences" });
    const std::string text = machine.run().output;
    const std::string home = machine.folder.path("home");
    CHECK(contains(text, "fix:  mv -n '" + home + "/Videos/Montaro Events' '" + home + "/Movies/Montaro Events'\n"));
    CHECK(contains(text,
        "fix:  mv -n " + home + "/Library/Preferences/org.ombrix.Montaro.plist " + home
            + "/Library/Preferences/org.ombrix.Montaro.plist.damaged\n"));
    CHECK(contains(text, stick + " is of type msdos: shown, but the editor keeps no libraries there\n"));
}

TEST_CASE("a disk that never answers is named after 2 seconds, and everything else is told")
{
    CheckedMachine machine;
    const std::string hung = machine.folder.folder("hung");
    machine.description.localVolume(hung, "Hung").link("/Volumes/Hung", hung);
    const SilentDisk disk(hung);
    if (!disk.isThere()) {
        MESSAGE("skipped: this system lets nobody mount a disk that does not answer");
        return;
    }
    const auto began = std::chrono::steady_clock::now();
    const ProgramRun run = machine.run();
    CHECK(run.status == 1);
    CHECK(contains(run.output, "FAIL  volumes      " + hung + " does not answer within 2 seconds\n"));
    CHECK(contains(run.output, "fix:  sudo umount --lazy " + hung + "\n"));
    CHECK(contains(run.output, "ok    editor"));
    CHECK(contains(run.output, "ok    libraries    1 search folder exists; 3 do not"));
    CHECK(std::chrono::steady_clock::now() - began < std::chrono::seconds(30));
}

TEST_CASE("the question that the program asks of itself is listed nowhere and refused when it is typed")
{
    const ProgramRun typed = runProgram({ { "answer" }, {}, {} });
    CHECK(typed.status == 2);
    CHECK(contains(typed.errors, "unknown command \"answer\""));
    CHECK_FALSE(contains(runProgram({ { "--help" }, {}, {} }).output, "answer"));
}
