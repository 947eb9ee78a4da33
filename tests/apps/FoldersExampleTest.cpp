#include "tests/apps/ProgramRun.h"
#include "tests/support/FencedBlocks.h"
#include "tests/support/GoldenText.h"
#include "tests/support/MovieWriter.h"
#include "tests/support/TemporaryFolder.h"
#include "tests/support/Turns.h"

#include <doctest/doctest.h>

#include <algorithm>
#include <filesystem>
#include <sstream>
#include <string>
#include <vector>

using namespace tests;

namespace {

const std::string exampleFolder = OMBRIX_SOURCE_FOLDER "/examples/folders/";
constexpr const char* exampleIdentifier = "org.ombrix.example.Folders";

/// The machine that the example's golden tree is of, with movies in three folders, one of them on a stick.
struct MachineOfFolders {
    MachineOfFolders()
    {
        disk.file("machine.json", contentOf(exampleFolder + "golden/machine.json"));
        disk.file("clips/Beach.mov", movieBytes(1920, 1080));
        disk.file("clips/apples.MP4", movieBytes(640, 480));
        disk.file("clips/.hidden.mov");
        disk.file("clips/notes.txt");
        disk.file("clips/Folder.mov/inside.mov");
        disk.link("clips/Link.mov", "Beach.mov");
        disk.file("stick/Films/東京の夜.m4v", movieBytes(640, 480));
        disk.folder("clips/Empty");
        for (const auto& entry : std::filesystem::recursive_directory_iterator(disk.path()))
            setModificationDate(entry.path().string(), { 1'299'146'400, 0 });
    }
    ProgramRun run(const std::string& folders, std::vector<std::string> words) const
    {
        words.insert(words.end(), { "--machine", disk.path("machine.json") });
        RunWishes wishes { std::move(words) };
        wishes.environment = { { "OMBRIX_PLUGIN_PATH", plugins }, { "OMBRIX_FOLDERS", folders },
            { "PATH", disk.path("bin") + ":/usr/bin:/bin" },
            { "DBUS_SESSION_BUS_ADDRESS", "unix:path=" + disk.path("no-bus") } };
        return runProgram(wishes);
    }
    /// What the program prints of the example's source, with the disk's folder as "/ROOT"; errors included.
    std::string printed(std::vector<std::string> words, const std::string& folders = allFolders) const
    {
        words.insert(words.end(), { "--source", exampleIdentifier });
        const ProgramRun answer = run(folders, std::move(words));
        return replaced(answer.output + answer.errors, disk.path(), "/ROOT");
    }

    /// A folder twice, one that is no absolute path, and one that is missing too.
    static constexpr const char* allFolders = "/Clips:/Volumes/Stick/Films/:/Clips:here:/Clips/Empty::/missing";

    std::string plugins = OMBRIX_EXAMPLE_PLUGINS;
    TemporaryFolder disk {};
};

/// Copies the headers that a source may include, and no other.
void copyPublicHeaders(const std::string& folder)
{
    for (const char* name : { "host", "platform" }) {
        makeFolder(folder + "/" + name);
        for (const auto& entry : std::filesystem::directory_iterator(OMBRIX_SOURCE_FOLDER "/" + std::string(name))) {
            const std::string file = entry.path().filename();
            const bool isPublic = file.ends_with(".h") && (name == std::string("platform") || file.starts_with("OB"));
            if (isPublic)
                std::filesystem::copy(entry.path(), folder + "/" + name);
        }
    }
}

std::string golden(const std::string& name)
{
    return contentOf(exampleFolder + "golden/" + name);
}

/// Every file of the example, and of its tests, one after the other.
std::string wholeExample()
{
    std::string text;
    for (const auto& entry : std::filesystem::recursive_directory_iterator(exampleFolder)) {
        if (entry.is_regular_file())
            text += "\n" + contentOf(entry.path());
    }
    for (const char* test : { "FoldersExampleTest.cpp", "FoldersExampleFollowingTest.cpp" })
        text += "\n" + contentOf(OMBRIX_SOURCE_FOLDER "/tests/apps/" + std::string(test));
    return text;
}

/// What a transcript shows that a command prints.
std::string withoutCommand(const std::string& transcript)
{
    return transcript.starts_with("$ ") ? transcript.substr(transcript.find('\n') + 1) : transcript;
}

} // namespace

TEST_CASE("the example of a source gives its golden tree")
{
    const MachineOfFolders machine;
    CHECK(uniformLayout(machine.printed({ "tree", "--json" })) == uniformLayout(golden("tree.json")));
}

TEST_CASE("the example of a source has its groups and its totals in the lists for people")
{
    const MachineOfFolders machine;
    CHECK(machine.printed({ "tree" }) == golden("tree.txt"));
    CHECK(machine.printed({ "groups" }) == golden("groups.txt"));
    CHECK(machine.printed({ "find", "bea" }) == "Beach   movie   Clips   /Clips/Beach.mov\n");
}

TEST_CASE("the example of a source offers its item for a movie and a folder, and none for the whole")
{
    const MachineOfFolders machine;
    const std::string menu = uniformLayout(golden("menu.json"));
    CHECK(uniformLayout(machine.printed({ "menu", "--object", "/Clips/Beach.mov", "--json" })) == menu);
    CHECK(uniformLayout(machine.printed({ "menu", "--group", "/Clips", "--json" })) == menu);
    CHECK(machine.printed({ "menu", "--group", "Folders" }) == "null\n");
}

TEST_CASE("the example of a source reveals what is there, by its real path")
{
    const MachineOfFolders machine;
    const std::string script = machine.disk.file("bin/xdg-open", "#!/bin/sh\nexec mkdir \"$1/opened\"\n");
    std::filesystem::permissions(script, std::filesystem::perms::owner_all);
    CHECK(machine.printed({ "reveal", "/Clips/gone.mov" }) == "ombrix: /Clips/gone.mov: no such file or directory\n");
    CHECK(machine.printed({ "reveal", "/Clips/Beach.mov" }) == "");
    CHECK(waitUntil([&] { return std::filesystem::exists(machine.disk.path("clips/opened")); }));
}

TEST_CASE("the example of a source says in the person's language why something is empty")
{
    const MachineOfFolders machine;
    CHECK(machine.printed({ "message", "--group", "/Clips/Empty" }) == "This folder has no movies.\n");
    CHECK(machine.printed({ "message", "--group", "/missing" }) == "There is no such folder now.\n");
    CHECK(machine.printed({ "message", "--group", "/Clips" }) == "");
    CHECK(machine.printed({ "message", "--group", "Folders" }) == "");
    CHECK(machine.printed({ "tree" }, "")
        == "Folders   Name folders of movies in OMBRIX_FOLDERS, and they appear here.\n");
}

TEST_CASE("a source without an editor is not said to lack one, and one that tells no folders searches none")
{
    const MachineOfFolders machine;
    CHECK(machine.printed({ "info" })
        == "Folders   ready, org.ombrix.example.Folders 1.0\n"
           "    thread   load priority 0.5\n"
           "    offers   nothing\n");
    CHECK(machine.printed({ "paths" }) == "The source tells of no folder that it searches.\n");
    CHECK(machine.printed({ "paths", "--json" }) == "{\"projects\":[],\"events\":[]}\n");
    const std::string explained = machine.printed({ "explain", "/Clips/notes.txt", "--json" });
    CHECK(explained.find("\"the source tells of no folder that it searches\"") != std::string::npos);
    CHECK(machine.printed({ "explain", "/Clips/Beach.mov", "--json" }).find("\"listed\":true") != std::string::npos);
}

TEST_CASE("the example of a source is found beside the installed one, which is not disturbed")
{
    const MachineOfFolders machine;
    const ProgramRun found = machine.run("", { "plugins" });
    CHECK(found.output.find("org.ombrix.example.Folders   1.0        loaded") != std::string::npos);
    CHECK(found.output.find("org.ombrix.OBMontaroPlugin") != std::string::npos);
    const ProgramRun other = machine.run(MachineOfFolders::allFolders, { "tree" });
    CHECK(other.errors == "ombrix: Montaro: the editor is not installed, so its libraries are not shown\n");
}

TEST_CASE("the example of a source is built outside of this tree with the public headers and the library alone")
{
    MachineOfFolders machine;
    copyPublicHeaders(machine.disk.path("headers"));
    machine.plugins = machine.disk.folder("plugins");
    RunWishes build { { machine.disk.path("headers"), OMBRIX_LIBRARIES, machine.plugins + "/Folders.obplugin" } };
    build.program = exampleFolder + "build.sh";
    build.environment
        = { { "PATH", "/usr/bin:/bin" }, { "CXX", OMBRIX_COMPILER }, { "CXXFLAGS", OMBRIX_COMPILER_FLAGS } };
    const ProgramRun built = runProgram(build);
    REQUIRE(built.errors == "");
    REQUIRE(built.status == 0);
    CHECK(machine.printed({ "tree" }) == golden("tree.txt"));
}

TEST_CASE("a public header includes no header that is not public")
{
    const TemporaryFolder headers;
    copyPublicHeaders(headers.path());
    int includes = 0;
    for (const auto& entry : std::filesystem::recursive_directory_iterator(headers.path())) {
        std::istringstream lines(entry.is_regular_file() ? contentOf(entry.path()) : std::string());
        for (std::string line; std::getline(lines, line);) {
            constexpr std::string_view include = "#include \"";
            if (!line.starts_with(include))
                continue;
            CAPTURE(entry.path());
            CAPTURE(line);
            CHECK(std::filesystem::exists(headers.path(line.substr(include.size(), line.rfind('"') - include.size()))));
            ++includes;
        }
    }
    CHECK(includes > 50);
}

TEST_CASE("the example of a source has fewer than two hundred lines")
{
    const std::string source = contentOf(exampleFolder + "FoldersPlugin.cpp");
    REQUIRE_FALSE(source.empty());
    CHECK(std::count(source.begin(), source.end(), '\n') < 200);
}

TEST_CASE("what the guide for authors shows of a source is a part of the example, to the letter")
{
    const std::string example = wholeExample();
    int parts = 0;
    const std::string guide = contentOf(OMBRIX_SOURCE_FOLDER "/docs/plugins.md");
    const std::string reference = contentOf(OMBRIX_SOURCE_FOLDER "/docs/plugins-reference.md");
    for (const FencedBlock& block : fencedBlocks(guide + reference)) {
        if (block.language == "sh")
            continue;
        CAPTURE(block.text);
        CHECK(example.find("\n" + withoutCommand(block.text)) != std::string::npos);
        ++parts;
    }
    CHECK(parts > 10);
}
