#include "tests/golden/Recipe.h"
#include "tests/support/GoldenText.h"
#include "tests/support/TemporaryFolder.h"

#include <doctest/doctest.h>

#include <algorithm>
#include <array>
#include <cstdio>
#include <filesystem>
#include <string>
#include <vector>

using namespace tests;

// Each folder here is one shape of library, named after the rule that it shows: `machine.json` describes the machine,
// `library.txt` its files, `tree.json` is the tree that the program prints, `reason.txt` says in a line why it is
// right. No folder of a library holds two items that show, for the order in which a disk lists them is its own.

namespace {

/// Stands for the folder of the library in `tree.json`.
constexpr std::string_view rootInTrees = "/ROOT";

std::vector<std::filesystem::path> goldenFolders()
{
    std::vector<std::filesystem::path> folders;
    for (const auto& entry : std::filesystem::directory_iterator(OMBRIX_GOLDEN_FOLDER)) {
        if (entry.is_directory())
            folders.push_back(entry.path());
    }
    std::sort(folders.begin(), folders.end());
    return folders;
}

/// What the program prints about a machine, errors included.
std::string printedTree(const std::string& machineFile)
{
    const std::string command = "env -u OMBRIX_PLUGIN_PATH -u OMBRIX_LOG LC_ALL=C '" OMBRIX_PROGRAM "' --machine '"
        + machineFile + "' tree --json 2>&1";
    std::string printed;
    std::FILE* const output = popen(command.c_str(), "r");
    if (!output)
        return "the program cannot be run";
    std::array<char, 4096> block {};
    for (std::size_t count = 1; count > 0;) {
        count = std::fread(block.data(), 1, block.size(), output);
        printed.append(block.data(), count);
    }
    const int status = pclose(output);
    return status == 0 ? printed : printed + "and ends with status " + std::to_string(status);
}

} // namespace

TEST_CASE("each golden library gives its tree to the letter")
{
    for (const std::filesystem::path& golden : goldenFolders()) {
        INFO(golden.filename().string() << ": " << contentOf(golden / "reason.txt"));
        const TemporaryFolder disk;
        CHECK(makeLibrary(contentOf(golden / "library.txt"), disk.path()) == "");
        const std::string machine = disk.file("machine.json", contentOf(golden / "machine.json"));
        const std::string printed = replaced(printedTree(machine), disk.path(), rootInTrees);
        CHECK(uniformLayout(printed) == uniformLayout(contentOf(golden / "tree.json")));
    }
}

TEST_CASE("each golden library has its machine, its files, its tree and one line of reason")
{
    CHECK(goldenFolders().size() > 10);
    for (const std::filesystem::path& golden : goldenFolders()) {
        INFO(golden.filename().string());
        for (const char* name : { "machine.json", "library.txt", "tree.json" })
            CHECK(std::filesystem::is_regular_file(golden / name));
        const std::string reason = contentOf(golden / "reason.txt");
        CHECK(std::count(reason.begin(), reason.end(), '\n') == 1);
        CHECK(reason.ends_with(".\n"));
    }
}

TEST_CASE("a recipe that cannot be followed names its line")
{
    const TemporaryFolder disk;
    CHECK(makeLibrary("folder a\nfolders b\nfolder c\n", disk.path()) == "folders b");
    CHECK(makeLibrary("folder\n", disk.path()) == "folder");
    CHECK(makeLibrary("", disk.path()) == "");
}
