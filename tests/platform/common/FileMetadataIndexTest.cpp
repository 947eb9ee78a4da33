#include "platform/common/FileMetadataIndex.h"
#include "platform/ContentTypes.h"
#include "platform/common/FileMovies.h"
#include "platform/linux/LinuxFileSystem.h"
#include "tests/support/FaultyFileSystem.h"
#include "tests/support/MovieWriter.h"
#include "tests/support/TemporaryFolder.h"

#include <doctest/doctest.h>

using namespace tests;
using platform::Date;
using platform::Value;

namespace {

struct IndexOfDisk {
    TemporaryFolder disk {};
    platform::LinuxFileSystem kernel {};
    FaultyFileSystem files { kernel };
    platform::FileMovies movies { files };
    platform::FileMetadataIndex index { files, movies };
};

} // namespace

TEST_CASE("a movie's attributes are those of its file and of its header")
{
    const IndexOfDisk machine;
    const std::string bytes = movieBytes(640, 480);
    const std::string path = machine.disk.file("Trip.one.MOV", bytes);
    setModificationDate(path, { 1'300'000'000, 7 });
    CHECK(machine.index.attributesOfFile(path)
        == Value(Value::Dictionary { { "kMDItemFSName", "Trip.one.MOV" }, { "kMDItemPath", Value(path.c_str()) },
            { "kMDItemFSSize", static_cast<std::int64_t>(bytes.size()) },
            { "kMDItemFSContentChangeDate", Date { 1'300'000'000, 7 } },
            { "kMDItemFSCreationDate", Date { 1'300'000'000, 7 } }, { "kMDItemContentType", "org.ombrix.movie" },
            { "kMDItemDurationSeconds", 2.0 }, { "kMDItemPixelWidth", 640.0 }, { "kMDItemPixelHeight", 480.0 } }));
}

TEST_CASE("what a file does not have is left out, and nothing is opened that has no movie's extension")
{
    IndexOfDisk machine;
    machine.files.whenOpening = [](std::string_view) {
        CHECK_MESSAGE(false, "a file was opened");
        return platform::FileProblem::notPermitted;
    };
    const Value text = machine.index.attributesOfFile(machine.disk.file("mov", movieBytes(640, 480)));
    CHECK(text.valueForKey("kMDItemFSName") == Value("mov"));
    CHECK(text.valueForKey("kMDItemContentType").isNull());
    CHECK(text.valueForKey("kMDItemPixelWidth").isNull());
    const Value folder = machine.index.attributesOfFile(machine.disk.folder("folder.mov"));
    CHECK(folder.valueForKey("kMDItemFSName") == Value("folder.mov"));
    CHECK(folder.valueForKey("kMDItemFSSize").isNull());
    CHECK(folder.valueForKey("kMDItemContentType").isNull());
}

TEST_CASE("what does not exist has no attributes")
{
    const IndexOfDisk machine;
    CHECK(machine.index.attributesOfFile(machine.disk.path("missing.mov")).isNull());
    CHECK(machine.index.attributesOfFile(machine.disk.link("dangling.mov", "nowhere")).isNull());
}

TEST_CASE("a damaged movie has a content type and no size of picture")
{
    const IndexOfDisk machine;
    const Value attributes = machine.index.attributesOfFile(machine.disk.file("bad.mp4", "no movie"));
    CHECK(attributes.valueForKey("kMDItemContentType") == Value("org.ombrix.movie"));
    CHECK(attributes.valueForKey("kMDItemPixelWidth").isNull());
}

TEST_CASE("movies are told by four extensions, case ignored")
{
    for (const char* name : { "a.mov", "a.M4V", "a.Mp4", "a.3GP", ".a.mov", "a.b.mov" })
        CHECK(platform::isMovieName(name));
    for (const char* name : { "a.avi", "mov", ".mov", "a.mov.", "a.movx", "a.mo", "", "a.", "a.mov " })
        CHECK_FALSE(platform::isMovieName(name));
}
