#include "platform/common/FileMovies.h"
#include "platform/linux/LinuxFileSystem.h"
#include "tests/support/MovieWriter.h"
#include "tests/support/TemporaryFolder.h"

#include <doctest/doctest.h>

using namespace tests;

namespace {

struct MoviesOnDisk {
    TemporaryFolder disk {};
    platform::LinuxFileSystem files {};
    platform::FileMovies movies { files };

    std::optional<platform::MovieHeader> headerOf(const MovieContent& content) const
    {
        return movies.headerOfMovie(disk.file("a.mov", movieBytes(content)));
    }
};

} // namespace

TEST_CASE("a movie's header is read wherever it stands and however it tells sizes")
{
    const MoviesOnDisk machine;
    for (HeaderPlace place : { HeaderPlace::beforeMedia, HeaderPlace::afterMedia }) {
        for (BoxSizes sizes : { BoxSizes::small, BoxSizes::large }) {
            MovieContent content;
            content.width = 640;
            content.height = 480;
            content.seconds = 2.5;
            content.headerPlace = place;
            content.boxSizes = sizes;
            content.mediaBytes = 100'000;
            const auto header = machine.headerOf(content);
            REQUIRE(header);
            CHECK(header->resolution == platform::Size { 640, 480 });
            CHECK(header->duration == 2.5);
        }
    }
}

TEST_CASE("a movie is as large as it is shown")
{
    const MoviesOnDisk machine;
    MovieContent turned;
    turned.rotation = Rotation::quarter;
    REQUIRE(machine.headerOf(turned));
    CHECK(machine.headerOf(turned)->resolution == platform::Size { 1080, 1920 });
    turned.rotation = Rotation::half;
    CHECK(machine.headerOf(turned)->resolution == platform::Size { 1920, 1080 });
    MovieContent shaped;
    shaped.width = 720;
    shaped.height = 576;
    shaped.pixelShape = PixelShape { 16, 15 };
    CHECK(machine.headerOf(shaped)->resolution == platform::Size { 768, 576 });
    MovieContent shown;
    shown.width = 1024.5;
    shown.height = 576;
    shown.storedWidth = 720;
    CHECK(machine.headerOf(shown)->resolution == platform::Size { 1024.5, 576 });
}

TEST_CASE("a movie of sound alone has no resolution")
{
    const MoviesOnDisk machine;
    MovieContent sound;
    sound.hasVideo = false;
    const auto header = machine.headerOf(sound);
    REQUIRE(header);
    CHECK_FALSE(header->resolution);
    CHECK(header->duration == 2);
}

TEST_CASE("what is no plain file or no movie has no header")
{
    const MoviesOnDisk machine;
    CHECK_FALSE(machine.movies.headerOfMovie(machine.disk.path("missing.mov")));
    CHECK_FALSE(machine.movies.headerOfMovie(machine.disk.folder("folder.mov")));
    CHECK_FALSE(machine.movies.headerOfMovie(machine.disk.pipe("pipe.mov")));
    CHECK_FALSE(machine.movies.headerOfMovie(machine.disk.file("text.mov", "this is no movie at all")));
    CHECK_FALSE(machine.movies.headerOfMovie(machine.disk.file("empty.mov")));
    const std::string whole = movieBytes(640, 480);
    CHECK_FALSE(machine.movies.headerOfMovie(machine.disk.file("cut.mov", whole.substr(0, whole.size() / 2))));
}

TEST_CASE("a movie is read through a link")
{
    const MoviesOnDisk machine;
    machine.disk.file("a.mov", movieBytes(640, 480));
    CHECK(machine.movies.headerOfMovie(machine.disk.link("link.mov", "a.mov")));
}
