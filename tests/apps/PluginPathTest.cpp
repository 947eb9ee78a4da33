#include "tests/apps/ProgramRun.h"
#include "tests/support/TemporaryFolder.h"

#include <doctest/doctest.h>

#include <filesystem>
#include <string>

using namespace tests;

namespace {

constexpr const char* missing = "org.example.None: there is no such plug-in";

ProgramRun run(const std::string& pluginPath, std::vector<std::string> words)
{
    return runProgram({ std::move(words), { { "OMBRIX_PLUGIN_PATH", pluginPath } }, {} });
}

std::string errorsFor(const std::string& pluginPath)
{
    const ProgramRun answer = run(pluginPath, { "tree", "--source", "org.example.None" });
    CHECK(answer.status == 1);
    CHECK(answer.output == "");
    return answer.errors;
}

/// Checks that what is wrong with one folder is told where a source is not found, and where all are listed.
void checkTold(const std::string& folder, const std::string& problem)
{
    CAPTURE(folder);
    const std::string told = "OMBRIX_PLUGIN_PATH: " + folder + ": " + problem;
    CHECK(
        errorsFor(folder) == "ombrix: " + std::string(missing) + "; found: org.ombrix.OBMontaroPlugin; " + told + "\n");
    const ProgramRun listed = run(folder, { "plugins" });
    CHECK(listed.status == 0);
    CHECK(listed.output.find("org.ombrix.OBMontaroPlugin") == 0);
    CHECK(listed.errors == "ombrix: warning: " + told + "\n");
}

void addBundle(const TemporaryFolder& folder, const std::string& name)
{
    folder.file("plugins/" + name + ".obplugin/manifest.json",
        R"({"identifier": "org.test.)" + name
            + R"(", "version": "1", "hostInterface": {"minimum": 1, "maximum": 1}, "library": "none.so",)"
            + R"( "class": "None", "languages": ["en"]})");
}

} // namespace

TEST_CASE("a folder of plug-ins that leads to none is named where a source is not found, and with the plug-ins")
{
    const TemporaryFolder folder;
    checkTold(folder.path("missing"), "it does not exist");
    checkTold(folder.file("file"), "it is no folder");
    checkTold(folder.folder("empty"), "it holds no bundle, no folder NAME.obplugin");
    addBundle(folder, "One");
    checkTold(folder.path("plugins/One.obplugin"), "it is a bundle itself, name the folder that holds it");
}

TEST_CASE("a source that is not found is told by the first few that are, each named once")
{
    const TemporaryFolder folder;
    for (const char* name : { "A", "B", "C", "D" })
        addBundle(folder, name);
    CHECK(errorsFor(folder.path("plugins"))
        == "ombrix: " + std::string(missing) + "; found: org.test.A, org.test.B, org.test.C and 2 more\n");
    CHECK(run(folder.path("plugins"), { "plugins" }).errors == "");
}

TEST_CASE("a plug-in is loaded and listed with its table of texts that cannot be read")
{
    const TemporaryFolder folder;
    const std::string bundle = folder.path("plugins/Waiting.obplugin");
    folder.folder("plugins");
    std::filesystem::copy(WAITING_PLUGINS "/Waiting.obplugin", bundle, std::filesystem::copy_options::recursive);
    const std::string table = folder.file("plugins/Waiting.obplugin/resources/en.strings.plist", "no list");
    const ProgramRun listed = run(folder.path("plugins"), { "plugins", "--json" });
    CAPTURE(listed.output);
    CHECK(listed.output.find("\"path\":\"" + bundle + "\",\"loaded\":true,\"reason\":\"" + table + ": ")
        != std::string::npos);
    CHECK(run(folder.path("plugins"), { "plugins" }).output.find("\n    " + table + ": ") != std::string::npos);
}
