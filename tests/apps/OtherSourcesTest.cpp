// What the commands say of a source that has no editor and does not tell where it looks, and of one with faults.

#include "tests/apps/ProgramRun.h"
#include "tests/support/TemporaryFolder.h"

#include <doctest/doctest.h>

#include <csignal>
#include <filesystem>
#include <string>
#include <vector>

using namespace tests;

namespace {

RunWishes wishesOf(std::vector<std::string> arguments, const std::string& told = {})
{
    arguments.insert(arguments.begin(), { "--source", "org.ombrix.tests.Waiting" });
    return { std::move(arguments), { { "OMBRIX_PLUGIN_PATH", WAITING_PLUGINS }, { "OMBRIX_WAITING", told } }, {} };
}

void checkFailed(const ProgramRun& run, const std::string& text)
{
    CHECK(run.status == 1);
    CHECK(run.output.empty());
    CHECK(run.errors == "ombrix: " + text + "\n");
}

} // namespace

TEST_CASE("a load that throws is one line, and so is any other error of a source")
{
    for (const char* command : { "tree", "groups", "watch", "verify" }) {
        CAPTURE(command);
        checkFailed(runProgram(wishesOf({ command }, "throw")), "Waiting: the load failed: the disk is made of cheese");
    }
    checkFailed(runProgram(wishesOf({ "info" }, "nameless")), "org.ombrix.tests.Waiting: it has no name");
}

TEST_CASE("a source that cannot load is not said to lack an editor where it may have none")
{
    checkFailed(runProgram(wishesOf({ "tree" }, "unable")), "Waiting: it cannot load now");
    const ProgramRun doctor = runProgram(wishesOf({ "doctor", "--json" }));
    CHECK(doctor.output.find("\"editor\"") == std::string::npos);
}

TEST_CASE("what the menu of a source does not offer is said to be that")
{
    const TemporaryFolder folder;
    const std::string file = folder.file("a.mov");
    checkFailed(runProgram(wishesOf({ "reveal", file })), file + ": the menu of Waiting does not offer this");
    checkFailed(runProgram(wishesOf({ "open" })), "editor: the menu of Waiting does not offer this");
}

TEST_CASE("a difference is never excused by a place where the source does not tell that it looks")
{
    const TemporaryFolder disk;
    RunWishes wishes = wishesOf({ "verify" }, "deaf");
    wishes.environment.emplace_back("OMBRIX_WAITING_FOLDER", disk.folder("here"));
    RunningProgram verify(wishes);
    REQUIRE(verify.prints("following changes"));
    std::filesystem::remove(disk.path("here"));
    const ProgramRun run = verify.end(SIGINT);
    CAPTURE(run.output);
    CHECK(run.status == 1);
    CHECK(run.output.find("not equal to a fresh load") != std::string::npos);
    CHECK(run.output.find("note") == std::string::npos);
}
