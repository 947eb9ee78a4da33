#include "apps/ombrix/SearchFolders.h"
#include "platform/linux/LinuxPlatform.h"
#include "tests/support/FaultyFileSystem.h"
#include "tests/support/TemporaryFolder.h"

#include <doctest/doctest.h>

using namespace ombrix;
using platform::FileProblem;

namespace {

struct Machine {
    platform::LinuxPlatform real;
    tests::TemporaryFolder folder;
    tests::FaultyFileSystem files { real.platform().fileSystem };
};

} // namespace

TEST_CASE("a search folder exists, is absent, is no folder, or cannot be read")
{
    Machine machine;
    const std::string library = machine.folder.folder("library");
    CHECK(searchProblem(machine.files, library) == FileProblem::none);
    CHECK(searchProblem(machine.files, machine.folder.path("none")) == FileProblem::missing);
    CHECK(searchProblem(machine.files, machine.folder.file("file")) == FileProblem::notAFolder);
    CHECK(searchProblem(machine.files, machine.folder.path("file/below")) == FileProblem::missing);
    machine.files.whenListing = [](std::string_view) { return FileProblem::notPermitted; };
    CHECK(searchProblem(machine.files, library) == FileProblem::notPermitted);
}

TEST_CASE("a folder whose names may be listed but not looked at cannot be read")
{
    Machine machine;
    const std::string library = machine.folder.folder("library");
    machine.folder.file("library/item");
    machine.files.whenAskedForStatus = [&](std::string_view path) { return path == library; };
    CHECK(searchProblem(machine.files, library) == FileProblem::none);
    machine.files.whenOpening = [](std::string_view) { return FileProblem::notPermitted; };
    CHECK(searchProblem(machine.files, library) == FileProblem::notPermitted);
}

TEST_CASE("the state of a search folder says why it cannot be read")
{
    CHECK(searchStateText(FileProblem::none) == "exists");
    CHECK(searchStateText(FileProblem::missing) == "absent");
    CHECK(searchStateText(FileProblem::notAFolder) == "not a folder");
    CHECK(searchStateText(FileProblem::notPermitted) == "not readable: permission denied");
    CHECK(searchStateText(FileProblem::readError) == "not readable: the disk cannot be read");
}

TEST_CASE("what cannot be read is there and is not absent")
{
    Machine machine;
    const std::string closed = machine.folder.folder("closed");
    machine.files.whenListing
        = [&](std::string_view folder) { return folder == closed ? FileProblem::notPermitted : FileProblem::none; };
    const SearchFolderCounts counts = countSearchFolders(machine.files,
        { closed, machine.folder.folder("open"), machine.folder.path("none"), machine.folder.file("f") });
    CHECK(counts.existing == 2);
    CHECK(counts.unreadable == 1);
    CHECK(counts.absent == 2);
}
