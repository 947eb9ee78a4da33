#include "tests/support/MovieWriter.h"

#include <array>
#include <cmath>

namespace tests {

namespace {

    void append16(std::string& bytes, std::uint16_t number)
    {
        bytes.push_back(static_cast<char>(number >> 8));
        bytes.push_back(static_cast<char>(number & 0xff));
    }

    void append32(std::string& bytes, std::uint32_t number)
    {
        append16(bytes, static_cast<std::uint16_t>(number >> 16));
        append16(bytes, static_cast<std::uint16_t>(number & 0xffff));
    }

    void append64(std::string& bytes, std::uint64_t number)
    {
        append32(bytes, static_cast<std::uint32_t>(number >> 32));
        append32(bytes, static_cast<std::uint32_t>(number & 0xffffffff));
    }

    void appendZeros(std::string& bytes, std::size_t count)
    {
        bytes.append(count, '\0');
    }

    std::string box(const char* type, const std::string& content, BoxSizes sizes = BoxSizes::small)
    {
        std::string bytes;
        const bool isLarge = sizes == BoxSizes::large;
        append32(bytes, isLarge ? 1 : static_cast<std::uint32_t>(8 + content.size()));
        bytes.append(type, 4);
        if (isLarge)
            append64(bytes, 16 + content.size());
        return bytes + content;
    }

    std::uint32_t inUnits(const MovieContent& content)
    {
        return static_cast<std::uint32_t>(std::lround(content.seconds.value_or(0) * content.timeScale));
    }

    void appendMatrix(std::string& bytes, Rotation rotation)
    {
        struct Turn {
            int a, b, c, d;
        };
        constexpr std::array<Turn, 4> turns { { { 1, 0, 0, 1 }, { 0, 1, -1, 0 }, { -1, 0, 0, -1 }, { 0, -1, 1, 0 } } };
        const Turn turn = turns[static_cast<std::size_t>(rotation)];
        const auto fixed = [](int number) { return static_cast<std::uint32_t>(number) << 16; };
        for (std::uint32_t number : { fixed(turn.a), fixed(turn.b), 0U, fixed(turn.c), fixed(turn.d), 0U, 0U, 0U })
            append32(bytes, number);
        append32(bytes, 0x40000000);
    }

    std::string movieHeader(const MovieContent& content)
    {
        std::string bytes;
        appendZeros(bytes, 12); // version, flags, two dates
        append32(bytes, content.timeScale);
        append32(bytes, inUnits(content));
        append32(bytes, 0x10000); // rate
        append16(bytes, 0x100); // volume
        appendZeros(bytes, 10);
        appendMatrix(bytes, Rotation::none);
        appendZeros(bytes, 24);
        append32(bytes, 2); // next track
        return box("mvhd", bytes, content.boxSizes);
    }

    std::string trackHeader(const MovieContent& content)
    {
        std::string bytes;
        append32(bytes, 3); // version 0, enabled and in the movie
        appendZeros(bytes, 8);
        append32(bytes, 1); // track
        appendZeros(bytes, 4);
        append32(bytes, inUnits(content));
        appendZeros(bytes, 16);
        appendMatrix(bytes, content.rotation);
        append32(bytes, content.hasVideo ? static_cast<std::uint32_t>(std::lround(content.width * 65536)) : 0);
        append32(bytes, content.hasVideo ? static_cast<std::uint32_t>(std::lround(content.height * 65536)) : 0);
        return box("tkhd", bytes, content.boxSizes);
    }

    std::string handler(const MovieContent& content)
    {
        std::string bytes;
        appendZeros(bytes, 8);
        bytes += content.hasVideo ? "vide" : "soun";
        appendZeros(bytes, 13);
        return box("hdlr", bytes, content.boxSizes);
    }

    std::string pictureEntry(const MovieContent& content)
    {
        std::string bytes;
        appendZeros(bytes, 6);
        append16(bytes, 1); // data reference
        appendZeros(bytes, 16);
        append16(bytes, content.storedWidth.value_or(static_cast<std::uint16_t>(std::lround(content.width))));
        append16(bytes, content.storedHeight.value_or(static_cast<std::uint16_t>(std::lround(content.height))));
        append32(bytes, 72U << 16);
        append32(bytes, 72U << 16);
        appendZeros(bytes, 4);
        append16(bytes, 1); // frames a sample
        appendZeros(bytes, 32);
        append16(bytes, 24); // depth
        append16(bytes, 0xffff); // no colour table
        if (content.pixelShape) {
            std::string shape;
            append32(shape, content.pixelShape->width);
            append32(shape, content.pixelShape->height);
            bytes += box("pasp", shape);
        }
        return box("avc1", bytes);
    }

    std::string soundEntry()
    {
        std::string bytes;
        appendZeros(bytes, 6);
        append16(bytes, 1);
        appendZeros(bytes, 8);
        append16(bytes, 2); // channels
        append16(bytes, 16); // bits
        appendZeros(bytes, 4);
        append32(bytes, 48000U << 16);
        return box("mp4a", bytes);
    }

    std::string media(const MovieContent& content)
    {
        std::string descriptions;
        appendZeros(descriptions, 4);
        append32(descriptions, 1);
        descriptions += content.hasVideo ? pictureEntry(content) : soundEntry();
        const std::string table = box("stbl", box("stsd", descriptions, content.boxSizes), content.boxSizes);
        std::string header;
        appendZeros(header, 12);
        append32(header, content.timeScale);
        append32(header, inUnits(content));
        appendZeros(header, 4);
        return box("mdia",
            box("mdhd", header, content.boxSizes) + handler(content) + box("minf", table, content.boxSizes),
            content.boxSizes);
    }

} // namespace

std::string movieBytes(const MovieContent& content)
{
    std::string type = "isom";
    append32(type, 512);
    type += "isommp42";
    const std::string track = box("trak", trackHeader(content) + media(content), content.boxSizes);
    const std::string header = box("moov", movieHeader(content) + track, content.boxSizes);
    const std::string data = box("mdat", std::string(content.mediaBytes, '\x5a'), content.boxSizes);
    const bool headerIsFirst = content.headerPlace == HeaderPlace::beforeMedia;
    return box("ftyp", type) + (headerIsFirst ? header + data : data + header);
}

std::string movieBytes(double width, double height)
{
    MovieContent content;
    content.width = width;
    content.height = height;
    return movieBytes(content);
}

} // namespace tests
