#include "platform/formats/MovieHeader.h"

#include "tests/platform/formats/Damage.h"
#include "tests/platform/formats/MemoryFile.h"
#include "tests/platform/formats/MovieBoxes.h"

#include <doctest/doctest.h>

using namespace platform;
using namespace movie;

namespace {

std::optional<MovieHeader> headerOf(const std::string& bytes)
{
    return readMovieHeader(MemoryFile(bytes));
}

std::optional<Size> resolutionOf(const std::string& track)
{
    const auto header = headerOf(ftyp() + moov(mvhd(600, 1200) + track));
    REQUIRE(header);
    return header->resolution;
}

std::optional<double> durationOf(const std::string& bytes)
{
    const auto header = headerOf(bytes);
    REQUIRE(header);
    return header->duration;
}

std::optional<Size> size(double width, double height)
{
    return Size { width, height };
}

const std::string wholeMovie = ftyp() + box("mdat", zeros(100))
    + moov(mvhd(600, 1500) + soundTrack() + videoTrack(1920, 1080, 1440, 1080, pasp(4, 3)));

} // namespace

TEST_CASE("a movie's header is found before and after the media data, in boxes of either size")
{
    const std::string movie = moov(mvhd(600, 1500) + videoTrack(640, 480, 640, 480));
    const std::string longMovie = longBox("moov", mvhd(600, 1500) + videoTrack(640, 480, 640, 480));
    const std::string lastMovie = lastBox("moov", mvhd(600, 1500) + videoTrack(640, 480, 640, 480));
    const std::string media = box("mdat", zeros(9000));
    const std::string longMedia = longBox("mdat", zeros(9000));
    for (const std::string& bytes : { joined({ ftyp(), movie, media }), joined({ ftyp(), media, movie }), movie,
             joined({ media, movie }), joined({ ftyp(), longMedia, movie }), joined({ ftyp(), media, longMovie }),
             joined({ ftyp(), media, lastMovie }), joined({ ftyp(), movie, lastBox("mdat", zeros(9000)) }),
             joined({ ftyp(), box("wide", ""), media, movie }) }) {
        const auto header = headerOf(bytes);
        REQUIRE(header);
        CHECK(header->resolution == size(640, 480));
        CHECK(header->duration == 2.5);
    }
}

TEST_CASE("a movie costs one read when its header comes first, and two when it comes last")
{
    const std::string movie = moov(mvhd(600, 1500) + videoTrack(640, 480, 640, 480));
    const MemoryFile first(ftyp() + movie + box("mdat", zeros(100'000)));
    CHECK(readMovieHeader(first));
    CHECK(first.reads() == 1);
    const MemoryFile last(ftyp() + box("mdat", zeros(100'000)) + movie);
    CHECK(readMovieHeader(last));
    CHECK(last.reads() == 2);
}

TEST_CASE("the first video track counts, whichever place it has")
{
    CHECK(
        resolutionOf(soundTrack() + videoTrack(320, 240, 320, 240) + videoTrack(640, 480, 640, 480)) == size(320, 240));
    CHECK(resolutionOf(soundTrack()) == std::nullopt);
    CHECK(resolutionOf("") == std::nullopt);
    CHECK(resolutionOf(trak(tkhd(100, 50), "text", stsd(100, 50)) + videoTrack(320, 240, 320, 240)) == size(320, 240));
}

TEST_CASE("the size in the track header counts, with its fractions")
{
    CHECK(resolutionOf(videoTrack(853.5, 480.25, 720, 480)) == size(853.5, 480.25));
    CHECK(resolutionOf(videoTrack(853.5, 480, 720, 480, pasp(32, 27))) == size(853.5, 480));
    CHECK(resolutionOf(trak(longTkhd(320, 240), "vide", stsd(640, 480))) == size(320, 240));
}

TEST_CASE("a track header that repeats the stored size, or has none, yields to the shape of the pixels")
{
    CHECK(resolutionOf(videoTrack(1440, 1080, 1440, 1080, pasp(4, 3))) == size(1920, 1080));
    CHECK(resolutionOf(videoTrack(720, 480, 720, 480, box("avcC", zeros(9)) + pasp(8, 9))) == size(640, 480));
    CHECK(resolutionOf(videoTrack(720, 480, 720, 480, pasp(32, 27))) == size(720 * (32.0 / 27), 480));
    CHECK(resolutionOf(videoTrack(720, 480, 720, 480, pasp(0, 1))) == size(720, 480));
    CHECK(resolutionOf(videoTrack(0, 0, 1440, 1080, pasp(4, 3))) == size(1920, 1080));
    CHECK(resolutionOf(videoTrack(0, 0, 0, 0)) == std::nullopt);
    CHECK(resolutionOf(trak("", "vide", stsd(640, 480))) == size(640, 480));
    CHECK(resolutionOf(trak(tkhd(640, 480), "vide", "")) == size(640, 480));
}

TEST_CASE("a quarter turn swaps width and height, after the shape of the pixels")
{
    CHECK(resolutionOf(videoTrack(1920, 1080, 1920, 1080, "", matrix(0, 1, -1, 0))) == size(1080, 1920));
    CHECK(resolutionOf(videoTrack(1920, 1080, 1920, 1080, "", matrix(0, -1, 1, 0))) == size(1080, 1920));
    CHECK(resolutionOf(videoTrack(1920, 1080, 1920, 1080, "", matrix(-1, 0, 0, -1))) == size(1920, 1080));
    CHECK(resolutionOf(videoTrack(1440, 1080, 1440, 1080, pasp(4, 3), matrix(0, 1, -1, 0))) == size(1080, 1920));
    CHECK(resolutionOf(trak(longTkhd(640, 480, matrix(0, 1, -1, 0)), "vide", stsd(640, 480))) == size(480, 640));
    const auto header = headerOf(moov(mvhd(600, 1, matrix(0, 1, -1, 0)) + videoTrack(640, 480, 640, 480)));
    REQUIRE(header);
    CHECK(header->resolution == size(480, 640));
}

TEST_CASE("a colour table in a sample description is no box")
{
    std::string description = stsd(320, 240, std::string(2048 + 8, '\x7F'));
    description.replace(8 + 8 + 8 + 76, 2, zeros(2));
    CHECK(resolutionOf(trak(tkhd(320, 240), "vide", description)) == size(320, 240));
}

TEST_CASE("the duration is the movie header's, else the fragments' header's, else the segment indexes' sum")
{
    const std::string extends = box("mvex", box("mehd", zeros(4) + number(3000, 4)));
    const std::string longExtends = box("mvex", box("mehd", number(1, 1) + zeros(3) + number(3000, 8)));
    CHECK(durationOf(moov(mvhd(600, 1500))) == 2.5);
    CHECK(durationOf(moov(longMvhd(600, 6'000'000'000))) == 1e7);
    CHECK(durationOf(moov(mvhd(600, 1500) + extends)) == 2.5);
    for (const std::string& header : { mvhd(600, 0), mvhd(600, 0xFFFFFFFF), longMvhd(600, ~std::uint64_t { 0 }) }) {
        CHECK(durationOf(moov(header)) == std::nullopt);
        CHECK(durationOf(moov(header + extends)) == 5.0);
        CHECK(durationOf(moov(header + longExtends)) == 5.0);
        CHECK(durationOf(moov(header + extends) + sidx(1, 1000, 2, 10, 700)) == 5.0);
        CHECK(durationOf(moov(header) + sidx(1, 1000, 2, 10, 700)) == 1.4);
        CHECK(durationOf(sidx(1, 1000, 2, 10, 700) + moov(header)) == 1.4);
    }
    CHECK(durationOf(moov(mvhd(0, 1500))) == std::nullopt);
}

TEST_CASE("segment indexes before each fragment add up, each stream for itself, and none counts what another told")
{
    const std::string fragment = box("moof", zeros(40)) + box("mdat", zeros(52));
    const std::string movie = ftyp() + moov(mvhd(600, 0));
    CHECK(durationOf(movie + sidx(1, 1000, 1, 100, 700) + fragment + sidx(1, 1000, 1, 100, 800) + fragment) == 1.5);
    CHECK(durationOf(movie + sidx(1, 1000, 1, 144, 700) + sidx(2, 500, 1, 100, 400) + fragment) == 0.8);
    const std::string inner = sidx(1, 1000, 1, 108, 700);
    CHECK(durationOf(movie + sidx(1, 1000, 1, static_cast<std::uint32_t>(inner.size()) + 108, 700) + inner + fragment)
        == 0.7);
    CHECK(durationOf(movie + sidx(1, 0, 1, 100, 700)) == std::nullopt);
    std::string lying = sidx(1, 1000, 1, 100, 700);
    lying[31] = '\x09';
    CHECK(durationOf(movie + lying) == std::nullopt);
}

TEST_CASE("what is no movie has no header")
{
    for (const std::string& bytes :
        { std::string(), std::string("abc"), std::string("plain text that is no movie at all"), zeros(5000), ftyp(),
            ftyp() + box("mdat", zeros(50)), box("moov", ""), moov(videoTrack(640, 480, 640, 480)),
            moov(box("cmov", zeros(20))), std::string(5000, '\xFF'), ftyp() + lastBox("mdat", moov(mvhd(600, 1))) })
        CHECK_FALSE(headerOf(bytes));
}

TEST_CASE("a movie whose boxes lie about their sizes has no header")
{
    const std::string track = videoTrack(640, 480, 640, 480);
    const auto withSize = [](std::string bytes, std::uint64_t size) { return bytes.replace(0, 4, number(size, 4)); };
    const std::string movie = moov(mvhd(600, 1) + track);
    for (std::uint64_t lie :
        { std::uint64_t { 2 }, std::uint64_t { 7 }, std::uint64_t { movie.size() + 1 }, std::uint64_t { 0xFFFFFFFF } })
        CHECK_FALSE(headerOf(withSize(movie, lie)));
    for (std::uint64_t lie : { std::uint64_t { 5 }, std::uint64_t { track.size() + 1 }, std::uint64_t { 0x7FFFFFFF } })
        CHECK_FALSE(headerOf(moov(mvhd(600, 1) + withSize(track, lie))));
    std::string huge = longBox("moov", mvhd(600, 1) + track);
    CHECK_FALSE(headerOf(huge.replace(8, 8, number(~std::uint64_t { 0 }, 8))));
    CHECK_FALSE(headerOf(huge.replace(8, 8, number(15, 8))));
    CHECK_FALSE(headerOf(moov(number(4, 4) + mvhd(600, 1) + track)));
    CHECK_FALSE(headerOf(moov(box("mvhd", zeros(20)) + track)));
    CHECK_FALSE(headerOf(moov(mvhd(600, 1) + trak(box("tkhd", zeros(30)), "vide", stsd(640, 480)))));
    CHECK_FALSE(headerOf(moov(mvhd(600, 1) + videoTrack(640, 480, 640, 480, withSize(pasp(1, 1), 99)))));
}

TEST_CASE("media data cut short leaves no header, junk behind the last box does no harm")
{
    const std::string movie = ftyp() + moov(mvhd(600, 600) + videoTrack(640, 480, 640, 480));
    const std::string media = box("mdat", zeros(10'000));
    CHECK(headerOf(movie + media));
    CHECK_FALSE(headerOf(movie + media.substr(0, 9'999)));
    CHECK_FALSE(headerOf(movie + media.substr(0, 8)));
    CHECK(headerOf(movie + media + "junk that is no box"));
    CHECK(headerOf(movie + media + zeros(3)));
    CHECK(headerOf(movie + media + zeros(300)));
}

TEST_CASE("a movie cut short anywhere before its end has no header")
{
    REQUIRE(headerOf(wholeMovie));
    CHECK(headerOf(wholeMovie)->resolution == size(1920, 1080));
    for (std::size_t length = 0; length < wholeMovie.size(); ++length)
        CHECK_FALSE(headerOf(wholeMovie.substr(0, length)));
}

TEST_CASE("a damaged movie is read or refused, in few reads")
{
    const std::string fragmented = ftyp()
        + moov(mvhd(600, 0) + videoTrack(640, 480, 640, 480, pasp(1, 1)) + box("mvex", box("mehd", zeros(8))))
        + sidx(1, 1000, 3, 100, 500) + box("moof", zeros(10)) + lastBox("mdat", zeros(20));
    for (const std::string& bytes : { wholeMovie, fragmented }) {
        forEachDamage(bytes, [](const std::string& damaged) {
            const MemoryFile file(damaged);
            const auto header = readMovieHeader(file);
            if (header && header->resolution)
                CHECK(header->resolution->width > 0);
            CHECK(file.reads() <= 4);
        });
    }
}

TEST_CASE("a file of nothing but boxes costs bounded time")
{
    std::string boxes;
    for (int index = 0; index < 200'000; ++index)
        boxes += box("free", "");
    const MemoryFile file(boxes + wholeMovie);
    CHECK_FALSE(readMovieHeader(file));
    CHECK(file.reads() < 100);
    std::string tracks;
    for (int index = 0; index < 20'000; ++index)
        tracks += box("trak", "");
    CHECK_FALSE(headerOf(moov(mvhd(600, 1) + tracks)));
}

TEST_CASE("tables of samples are stepped over, however long")
{
    const std::string table = box("stbl", stsd(640, 480) + box("stsz", zeros(3'000'000)));
    const std::string track = box("trak", tkhd(640, 480) + box("mdia", hdlr("vide") + box("minf", table)));
    const MemoryFile file(ftyp() + box("mdat", zeros(9000)) + moov(mvhd(600, 600) + track + soundTrack()));
    const auto header = readMovieHeader(file);
    REQUIRE(header);
    CHECK(header->resolution == size(640, 480));
    CHECK(file.reads() == 3);
}

TEST_CASE("the fragments of a recording without an index are not walked")
{
    std::string movie = ftyp() + moov(mvhd(600, 0) + videoTrack(640, 480, 640, 480));
    for (int index = 0; index < 100; ++index)
        movie += box("moof", zeros(5000)) + box("mdat", zeros(5000));
    const MemoryFile file(movie);
    const auto header = readMovieHeader(file);
    REQUIRE(header);
    CHECK(header->resolution == size(640, 480));
    CHECK(header->duration == std::nullopt);
    CHECK(file.reads() == 1);
}
