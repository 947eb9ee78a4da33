// The top level of the file, the movie box, and the durations. The tracks are in MovieTrack.cpp.

#include "platform/formats/MovieHeader.h"

#include "platform/formats/MovieTrack.h"

#include <algorithm>
#include <array>
#include <limits>

namespace platform {
namespace {

    /// What the movie box tells.
    struct MovieFacts {
        bool hasHeader = false;
        MovieMatrix matrix;
        std::uint32_t timeScale = 0; // units a second
        std::uint64_t duration = 0; // 0 when unknown
        std::uint64_t fragmentDuration = 0;
        std::optional<MovieTrack> video; // the first
    };

    /// A number of four or eight bytes; 0 for all ones, which stand for "unknown" as 0 does.
    std::uint64_t knownDuration(const std::byte* bytes, bool isLong)
    {
        if (isLong) {
            const std::uint64_t duration = BoxReader::number64(bytes);
            return duration == std::numeric_limits<std::uint64_t>::max() ? 0 : duration;
        }
        const std::uint32_t duration = BoxReader::number32(bytes);
        return duration == std::numeric_limits<std::uint32_t>::max() ? 0 : duration;
    }

    /// The content of a box that comes in two versions, of which the second is longer; null when it is neither.
    const std::byte* versionedBox(
        BoxReader& reader, FileRange content, std::size_t size, std::size_t longSize, bool& isLong)
    {
        const std::byte* version = content.size() >= size ? reader.bytesAt(content.start, 1) : nullptr;
        if (!version || std::to_integer<unsigned>(*version) > 1)
            return nullptr;
        isLong = std::to_integer<unsigned>(*version) == 1;
        const std::size_t wanted = isLong ? longSize : size;
        return content.size() >= wanted ? reader.bytesAt(content.start, wanted) : nullptr;
    }

    bool readHeader(BoxReader& reader, FileRange content, MovieFacts& facts)
    {
        bool isLong = false;
        const std::byte* bytes = versionedBox(reader, content, 100, 112, isLong);
        if (!bytes || facts.hasHeader)
            return false;
        facts.hasHeader = true;
        facts.timeScale = BoxReader::number32(bytes + (isLong ? 20 : 12));
        facts.duration = knownDuration(bytes + (isLong ? 24 : 16), isLong);
        facts.matrix = MovieMatrix::fromBytes(bytes + (isLong ? 48 : 36));
        return true;
    }

    bool readFragmentsHeader(BoxReader& reader, FileRange content, MovieFacts& facts)
    {
        bool isLong = false;
        const std::byte* bytes = versionedBox(reader, content, 8, 12, isLong);
        if (!bytes)
            return false;
        facts.fragmentDuration = knownDuration(bytes + 4, isLong);
        return true;
    }

    bool readExtends(BoxReader& reader, FileRange extends, MovieFacts& facts)
    {
        Box box;
        while (true) {
            const BoxStep step = reader.next(extends, ZeroSize::endsList, box);
            if (step != BoxStep::box)
                return step == BoxStep::end;
            if (box.type == boxType("mehd") && !readFragmentsHeader(reader, box.content, facts))
                return false;
        }
    }

    bool readMovieBox(BoxReader& reader, FileRange movie, MovieFacts& facts)
    {
        Box box;
        while (true) {
            const BoxStep step = reader.next(movie, ZeroSize::endsList, box);
            if (step != BoxStep::box)
                return step == BoxStep::end && facts.hasHeader;
            bool isRight = true;
            if (box.type == boxType("mvhd")) {
                isRight = readHeader(reader, box.content, facts);
            } else if (box.type == boxType("mvex")) {
                isRight = readExtends(reader, box.content, facts);
            } else if (box.type == boxType("trak") && !facts.video) {
                const std::optional<MovieTrack> track = readMovieTrack(reader, box.content);
                isRight = track.has_value();
                if (isRight && track->isVideo)
                    facts.video = track;
            }
            if (!isRight)
                return false;
        }
    }

    /// Adds up segment indexes. Each stream has its own, and an index that another one of its stream refers to adds
    /// nothing.
    class IndexedDuration {
    public:
        /// Takes the content of a `sidx` box; false when it is broken.
        bool add(BoxReader& reader, FileRange content);
        /// Of the longest stream, in seconds; absent when no index told a duration.
        std::optional<double> seconds() const;
        bool isEmpty() const { return _count == 0; }

    private:
        struct Stream {
            std::uint32_t identifier = 0;
            std::uint32_t timeScale = 0;
            std::uint64_t duration = 0;
            std::uint64_t coveredEnd = 0; // offset up to which an index has told the duration
        };

        std::array<Stream, 16> _streams;
        std::size_t _count = 0;
    };

    bool IndexedDuration::add(BoxReader& reader, FileRange content)
    {
        bool isLong = false;
        const std::byte* bytes = versionedBox(reader, content, 24, 32, isLong);
        if (!bytes)
            return false;
        const std::uint32_t identifier = BoxReader::number32(bytes + 4);
        const std::uint32_t timeScale = BoxReader::number32(bytes + 8);
        const std::uint64_t firstOffset = isLong ? BoxReader::number64(bytes + 20) : BoxReader::number32(bytes + 16);
        const std::size_t header = isLong ? 32 : 24;
        const std::uint64_t count = BoxReader::number16(bytes + header - 2);
        if (timeScale == 0 || count * 12 > content.size() - header)
            return false;
        const auto isSame
            = [&](const Stream& stream) { return stream.identifier == identifier && stream.timeScale == timeScale; };
        Stream* stream = std::find_if(_streams.data(), _streams.data() + _count, isSame);
        if (stream == _streams.data() + _count) {
            if (_count == _streams.size())
                return false;
            _streams[_count++] = { identifier, timeScale, 0, 0 };
        }
        if (content.start < stream->coveredEnd)
            return true;
        std::uint64_t covered = 0;
        for (std::uint64_t index = 0; index < count; ++index) {
            const std::byte* reference = reader.bytesAt(content.start + header + 12 * index, 12);
            if (!reference)
                return false;
            covered += BoxReader::number32(reference) & 0x7FFFFFFF;
            stream->duration += BoxReader::number32(reference + 4);
        }
        const std::uint64_t limit = reader.wholeFile().end;
        stream->coveredEnd = content.end + std::min(firstOffset, limit) + std::min(covered, limit);
        return true;
    }

    std::optional<double> IndexedDuration::seconds() const
    {
        double longest = 0;
        for (std::size_t index = 0; index < _count; ++index)
            longest = std::max(longest, double(_streams[index].duration) / _streams[index].timeScale);
        return longest > 0 ? std::optional(longest) : std::nullopt;
    }

    std::optional<double> toldDuration(const MovieFacts& facts)
    {
        const std::uint64_t units = facts.duration != 0 ? facts.duration : facts.fragmentDuration;
        if (units == 0 || facts.timeScale == 0)
            return {};
        return double(units) / facts.timeScale;
    }

    std::optional<MovieHeader> movieHeader(const MovieFacts& facts)
    {
        MovieHeader header;
        header.duration = toldDuration(facts);
        if (facts.video)
            header.resolution = facts.video->size;
        if (header.resolution && facts.matrix.turnsByQuarter)
            std::swap(header.resolution->width, header.resolution->height);
        return header;
    }

    /// Media that the file says it holds, and does not: what a copy leaves that was broken off.
    bool isMedia(std::uint32_t type)
    {
        return type == boxType("mdat") || type == boxType("moof");
    }

    /// Walks the top level of a file: finds the movie box, and sees to the end that nothing was cut off.
    class MovieFile {
    public:
        explicit MovieFile(const OpenFile& file)
            : _reader(file)
        {
        }

        std::optional<MovieHeader> read();

    private:
        bool takeBox(const Box& box);
        bool isDone(std::uint32_t nextType) const;
        std::optional<MovieHeader> answer() const;

        BoxReader _reader;
        MovieFacts _facts;
        IndexedDuration _index;
        bool _indexIsBroken = false;
    };

    std::optional<MovieHeader> MovieFile::read()
    {
        FileRange rest = _reader.wholeFile();
        Box box;
        while (true) {
            const BoxStep step = _reader.next(rest, ZeroSize::reachesToEnd, box);
            if (step == BoxStep::broken && _facts.hasHeader && isMedia(box.type))
                return {};
            if (step != BoxStep::box || isDone(box.type)) {
                _indexIsBroken = _indexIsBroken || step == BoxStep::tooMuch;
                return answer();
            }
            if (!takeBox(box))
                return {};
        }
    }

    bool MovieFile::takeBox(const Box& box)
    {
        if (box.type == boxType("moov") && !_facts.hasHeader)
            return readMovieBox(_reader, box.content, _facts);
        if (box.type == boxType("sidx"))
            _indexIsBroken = !_index.add(_reader, box.content) || _indexIsBroken;
        return true;
    }

    /// Fragments are walked only to add up the indexes that stand before each of them, so not where the duration is
    /// known, nor where the first has none: a recording of hours has thousands, each at another place of the disk.
    bool MovieFile::isDone(std::uint32_t nextType) const
    {
        return _facts.hasHeader && nextType == boxType("moof") && (toldDuration(_facts) || _index.isEmpty());
    }

    std::optional<MovieHeader> MovieFile::answer() const
    {
        if (!_facts.hasHeader)
            return {};
        std::optional<MovieHeader> header = movieHeader(_facts);
        if (!header->duration && !_indexIsBroken)
            header->duration = _index.seconds();
        return header;
    }

} // namespace

std::optional<MovieHeader> readMovieHeader(const OpenFile& file)
{
    return MovieFile(file).read();
}

} // namespace platform
