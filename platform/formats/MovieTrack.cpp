// A track: its header (tkhd), what it holds (mdia/hdlr), and the description of its samples (mdia/minf/stbl/stsd).

#include "platform/formats/MovieTrack.h"

#include <cstdlib>

namespace platform {
namespace {

    /// Numbers as the file stores them; 0 where a box is missing.
    struct TrackFacts {
        bool isVideo = false;
        bool hasHeader = false;
        bool hasDescription = false;
        MovieMatrix matrix;
        std::uint32_t headerWidth = 0; // 16.16
        std::uint32_t headerHeight = 0;
        std::uint32_t storedWidth = 0;
        std::uint32_t storedHeight = 0;
        std::uint32_t pixelWidth = 0;
        std::uint32_t pixelHeight = 0;
    };

    /// Calls `visit(box)` for each box in `range` until one answers false; false as well when a box is broken.
    template <typename Visit> bool visitBoxes(BoxReader& reader, FileRange range, Visit visit)
    {
        Box box;
        while (true) {
            const BoxStep step = reader.next(range, ZeroSize::endsList, box);
            if (step != BoxStep::box)
                return step == BoxStep::end;
            if (!visit(box))
                return false;
        }
    }

    bool readHeader(BoxReader& reader, FileRange content, TrackFacts& facts)
    {
        const std::byte* version = content.size() >= 84 ? reader.bytesAt(content.start, 1) : nullptr;
        if (!version || facts.hasHeader)
            return false;
        const auto number = std::to_integer<unsigned>(*version);
        const std::size_t size = number == 1 ? 96 : 84;
        const std::byte* bytes = number <= 1 && content.size() >= size ? reader.bytesAt(content.start, size) : nullptr;
        if (!bytes)
            return false;
        facts.hasHeader = true;
        facts.matrix = MovieMatrix::fromBytes(bytes + size - 44);
        facts.headerWidth = BoxReader::number32(bytes + size - 8);
        facts.headerHeight = BoxReader::number32(bytes + size - 4);
        return true;
    }

    bool readHandler(BoxReader& reader, FileRange content, TrackFacts& facts)
    {
        const std::byte* bytes = content.size() >= 12 ? reader.bytesAt(content.start, 12) : nullptr;
        if (!bytes)
            return false;
        facts.isVideo = BoxReader::number32(bytes + 8) == boxType("vide");
        return true;
    }

    bool readPixelShape(BoxReader& reader, FileRange content, TrackFacts& facts)
    {
        const std::byte* bytes = content.size() >= 8 ? reader.bytesAt(content.start, 8) : nullptr;
        if (!bytes)
            return false;
        facts.pixelWidth = BoxReader::number32(bytes);
        facts.pixelHeight = BoxReader::number32(bytes + 4);
        return true;
    }

    /// The first entry of the sample description: what its samples are stored as.
    bool readDescription(BoxReader& reader, FileRange content, TrackFacts& facts)
    {
        constexpr std::size_t listHeader = 8;
        constexpr std::size_t visualEntry = 78;
        const std::byte* bytes = content.size() >= listHeader ? reader.bytesAt(content.start, listHeader) : nullptr;
        if (!bytes)
            return false;
        if (BoxReader::number32(bytes + 4) == 0)
            return true;
        FileRange entries { content.start + listHeader, content.end };
        Box entry;
        if (reader.next(entries, ZeroSize::endsList, entry) != BoxStep::box || entry.content.size() < visualEntry)
            return false;
        bytes = reader.bytesAt(entry.content.start, visualEntry);
        if (!bytes)
            return false;
        facts.hasDescription = true;
        facts.storedWidth = BoxReader::number16(bytes + 24);
        facts.storedHeight = BoxReader::number16(bytes + 26);
        // A colour table of its own stands where the boxes would begin (QuickTime file format, image description).
        const bool hasColourTable = BoxReader::number16(bytes + 76) == 0;
        if (hasColourTable)
            return true;
        const FileRange extensions { entry.content.start + visualEntry, entry.content.end };
        return visitBoxes(reader, extensions,
            [&](const Box& box) { return box.type != boxType("pasp") || readPixelShape(reader, box.content, facts); });
    }

    bool readSampleTable(BoxReader& reader, FileRange table, TrackFacts& facts)
    {
        return visitBoxes(reader, table, [&](const Box& box) {
            const bool isWanted = box.type == boxType("stsd") && !facts.hasDescription;
            return !isWanted || readDescription(reader, box.content, facts);
        });
    }

    bool readInformation(BoxReader& reader, FileRange information, TrackFacts& facts)
    {
        return visitBoxes(reader, information,
            [&](const Box& box) { return box.type != boxType("stbl") || readSampleTable(reader, box.content, facts); });
    }

    /// The handler may stand behind the sample description, which is read only once it is known to be one of pictures.
    bool readMedia(BoxReader& reader, FileRange media, TrackFacts& facts)
    {
        std::optional<FileRange> information;
        const bool isWhole = visitBoxes(reader, media, [&](const Box& box) {
            if (box.type == boxType("minf"))
                information = box.content;
            return box.type != boxType("hdlr") || readHandler(reader, box.content, facts);
        });
        return isWhole && (!facts.isVideo || !information || readInformation(reader, *information, facts));
    }

    std::optional<Size> shownSize(const TrackFacts& facts)
    {
        const bool hasShape = facts.pixelWidth != 0 && facts.pixelHeight != 0;
        const double shape = hasShape ? double(facts.pixelWidth) / double(facts.pixelHeight) : 1;
        const Size stored { facts.storedWidth * shape, double(facts.storedHeight) };
        const Size header { facts.headerWidth / 65536.0, facts.headerHeight / 65536.0 };
        const bool headerIsEmpty = facts.headerWidth == 0 || facts.headerHeight == 0;
        const bool headerRepeats
            = facts.headerWidth == facts.storedWidth << 16 && facts.headerHeight == facts.storedHeight << 16;
        Size size = headerIsEmpty || headerRepeats ? stored : header;
        if (size.width == 0 || size.height == 0)
            return {};
        return facts.matrix.turnsByQuarter ? Size { size.height, size.width } : size;
    }

} // namespace

MovieMatrix MovieMatrix::fromBytes(const std::byte* bytes) noexcept
{
    // Rows of three: a b u, c d v, x y w; a picture that is not turned has only a and d.
    const auto entry = [&](std::size_t index) {
        return std::abs(std::int64_t { static_cast<std::int32_t>(BoxReader::number32(bytes + 4 * index)) });
    };
    return { entry(1) > entry(0) && entry(3) > entry(4) };
}

std::optional<MovieTrack> readMovieTrack(BoxReader& reader, FileRange track)
{
    TrackFacts facts;
    const bool isWhole = visitBoxes(reader, track, [&](const Box& box) {
        if (box.type == boxType("tkhd"))
            return readHeader(reader, box.content, facts);
        return box.type != boxType("mdia") || readMedia(reader, box.content, facts);
    });
    if (!isWhole)
        return {};
    return MovieTrack { facts.isVideo, facts.isVideo ? shownSize(facts) : std::nullopt };
}

} // namespace platform
