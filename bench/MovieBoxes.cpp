#include "bench/MovieBoxes.h"

#include <algorithm>
#include <optional>

#include <unistd.h>

// Boxes of the ISO base media file format: a size of four bytes, a type of four letters, then contents, which for some
// types are boxes again. Written here and read here, so that the floor parses exactly what the libraries hold.

namespace bench {

namespace {

    constexpr std::uint32_t timescale = 600;
    constexpr std::size_t boxHeaderSize = 8;
    constexpr std::size_t movieSize = 1536;

    void append16(std::string& bytes, std::uint32_t value)
    {
        bytes.push_back(static_cast<char>(value >> 8 & 0xff));
        bytes.push_back(static_cast<char>(value & 0xff));
    }

    void append32(std::string& bytes, std::uint32_t value)
    {
        append16(bytes, value >> 16);
        append16(bytes, value & 0xffff);
    }

    std::string box(std::string_view type, std::string_view contents)
    {
        std::string bytes;
        append32(bytes, static_cast<std::uint32_t>(boxHeaderSize + contents.size()));
        bytes.append(type).append(contents);
        return bytes;
    }

    std::string numbers(std::initializer_list<std::uint32_t> values)
    {
        std::string bytes;
        for (const std::uint32_t value : values)
            append32(bytes, value);
        return bytes;
    }

    std::string unitMatrix()
    {
        return numbers({ 0x10000, 0, 0, 0, 0x10000, 0, 0, 0, 0x40000000 });
    }

    std::string movieHeaderBox(std::uint32_t seconds)
    {
        return box("mvhd",
            numbers({ 0, 0, 0, timescale, timescale * seconds, 0x10000, 0x01000000, 0, 0 }) + unitMatrix()
                + numbers({ 0, 0, 0, 0, 0, 0, 2 }));
    }

    std::string trackHeaderBox(std::uint16_t width, std::uint16_t height, std::uint32_t seconds)
    {
        constexpr std::uint32_t enabledInMovie = 3;
        return box("tkhd",
            numbers({ enabledInMovie, 0, 0, 1, 0, timescale * seconds, 0, 0, 0, 0 }) + unitMatrix()
                + numbers({ std::uint32_t { width } << 16, std::uint32_t { height } << 16 }));
    }

    std::string sampleEntry(std::uint16_t width, std::uint16_t height)
    {
        std::string entry = numbers({ 0, 1, 0, 0, 0, 0 });
        append16(entry, width);
        append16(entry, height);
        entry += numbers({ 0x480000, 0x480000, 0 });
        append16(entry, 1);
        entry.append(32, '\0');
        append16(entry, 24);
        append16(entry, 0xffff);
        return box("apcn", entry);
    }

    std::string sampleTableBox(std::uint16_t width, std::uint16_t height, std::uint32_t seconds)
    {
        return box("stbl",
            box("stsd", numbers({ 0, 1 }) + sampleEntry(width, height))
                + box("stts", numbers({ 0, 1, 1, timescale * seconds })) + box("stsc", numbers({ 0, 1, 1, 1, 1 }))
                + box("stsz", numbers({ 0, 16, 1 })) + box("stco", numbers({ 0, 1, 32 })));
    }

    std::string mediaBox(std::uint16_t width, std::uint16_t height, std::uint32_t seconds)
    {
        constexpr std::uint32_t undeterminedLanguage = 0x55c40000;
        const std::string handler = numbers({ 0, 0 }) + "vide" + numbers({ 0, 0, 0 }) + std::string(1, '\0');
        const std::string reference = box("dref", numbers({ 0, 1 }) + box("url ", numbers({ 1 })));
        return box("mdia",
            box("mdhd", numbers({ 0, 0, 0, timescale, timescale * seconds, undeterminedLanguage }))
                + box("hdlr", handler)
                + box("minf",
                    box("vmhd", numbers({ 1, 0, 0 })) + box("dinf", reference)
                        + sampleTableBox(width, height, seconds)));
    }

    std::uint32_t read32(std::string_view bytes, std::size_t offset)
    {
        std::uint32_t value = 0;
        for (std::size_t index = offset; index < offset + 4; ++index)
            value = value << 8 | static_cast<unsigned char>(bytes[index]);
        return value;
    }

    struct Box {
        std::string_view type;
        std::string_view contents;
    };

    /// Takes the first box off `bytes`; none where no whole box is left.
    std::optional<Box> takeBox(std::string_view& bytes)
    {
        if (bytes.size() < boxHeaderSize)
            return std::nullopt;
        const std::size_t size = read32(bytes, 0);
        if (size < boxHeaderSize || size > bytes.size())
            return std::nullopt;
        const Box taken { bytes.substr(4, 4), bytes.substr(boxHeaderSize, size - boxHeaderSize) };
        bytes.remove_prefix(size);
        return taken;
    }

    std::string_view childBox(std::string_view bytes, std::string_view type)
    {
        while (const auto child = takeBox(bytes)) {
            if (child->type == type)
                return child->contents;
        }
        return {};
    }

    bool isVideoTrack(std::string_view media)
    {
        const std::string_view handler = childBox(media, "hdlr");
        return handler.size() >= 12 && handler.substr(8, 4) == "vide";
    }

    void readTrack(std::string_view track, MovieFacts& facts)
    {
        constexpr std::size_t widthOffset = 76;
        constexpr double fixedPointOne = 65536.0;
        const std::string_view header = childBox(track, "tkhd");
        const std::string_view media = childBox(track, "mdia");
        if (header.size() < widthOffset + 8 || !isVideoTrack(media))
            return;
        facts.width = read32(header, widthOffset) / fixedPointOne;
        facts.height = read32(header, widthOffset + 4) / fixedPointOne;
        const std::string_view samples = childBox(childBox(childBox(media, "minf"), "stbl"), "stsd");
        // The stored size stands here, and with it whether the shape of the pixels has to be asked for at all.
        if (samples.size() < boxHeaderSize || childBox(samples.substr(boxHeaderSize), "apcn").size() < 28)
            facts = {};
    }

    MovieFacts factsOfMovieBox(std::string_view movie)
    {
        MovieFacts facts;
        while (const auto child = takeBox(movie)) {
            if (child->type == "mvhd" && child->contents.size() >= 20 && read32(child->contents, 12) != 0)
                facts.seconds = double(read32(child->contents, 16)) / read32(child->contents, 12);
            else if (child->type == "trak" && facts.width == 0)
                readTrack(child->contents, facts);
        }
        return facts;
    }

} // namespace

std::string smallMovie(
    std::string_view brand, std::uint16_t width, std::uint16_t height, std::uint32_t seconds, bool headerLast)
{
    const std::string front = box("ftyp", std::string(brand) + numbers({ 0 }) + std::string(brand));
    const std::string movie = box("moov",
        movieHeaderBox(seconds)
            + box("trak", trackHeaderBox(width, height, seconds) + mediaBox(width, height, seconds)));
    const std::size_t taken = front.size() + movie.size() + boxHeaderSize;
    const std::string data = box("mdat", std::string(std::max(movieSize, taken + 16) - taken, '\0'));
    return headerLast ? front + data + movie : front + movie + data;
}

MovieFacts readMovieFacts(int descriptor, std::span<char> buffer)
{
    std::uint64_t start = 0;
    while (true) {
        const ssize_t count = ::pread(descriptor, buffer.data(), buffer.size(), static_cast<off_t>(start));
        if (count < static_cast<ssize_t>(boxHeaderSize))
            return {};
        const std::string_view bytes(buffer.data(), static_cast<std::size_t>(count));
        std::size_t offset = 0;
        while (offset + boxHeaderSize <= bytes.size()) {
            const std::size_t size = std::max<std::size_t>(read32(bytes, offset), boxHeaderSize);
            if (bytes.substr(offset + 4, 4) == "moov" && (offset == 0 || size <= bytes.size() - offset)) {
                const std::size_t contents = offset + boxHeaderSize;
                return factsOfMovieBox(bytes.substr(contents, size - boxHeaderSize));
            }
            // A movie box that reaches beyond what was read is read again from its own beginning.
            if (bytes.substr(offset + 4, 4) == "moov")
                break;
            offset += size;
        }
        start += offset;
    }
}

} // namespace bench
