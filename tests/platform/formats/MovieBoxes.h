#pragma once

#include <cstdint>
#include <initializer_list>
#include <string>
#include <string_view>

/// Builders of the boxes of a movie, each answering the box's bytes.
namespace movie {

inline std::string joined(std::initializer_list<std::string_view> parts)
{
    std::string bytes;
    for (std::string_view part : parts)
        bytes += part;
    return bytes;
}

inline std::string number(std::uint64_t value, int size)
{
    std::string bytes;
    for (int index = size - 1; index >= 0; --index)
        bytes += static_cast<char>((value >> (8 * index)) & 0xFF);
    return bytes;
}

inline std::string zeros(std::size_t count)
{
    return std::string(count, '\0');
}

inline std::string box(std::string_view type, const std::string& content)
{
    return number(content.size() + 8, 4) + std::string(type) + content;
}

inline std::string longBox(std::string_view type, const std::string& content)
{
    return number(1, 4) + std::string(type) + number(content.size() + 16, 8) + content;
}

/// Reaches to the end of the file.
inline std::string lastBox(std::string_view type, const std::string& content)
{
    return number(0, 4) + std::string(type) + content;
}

inline std::string fixed(double value)
{
    return number(static_cast<std::uint32_t>(static_cast<std::int32_t>(value * 65536)), 4);
}

/// a b 0, c d 0, 0 0 1.
inline std::string matrix(double a, double b, double c, double d)
{
    return fixed(a) + fixed(b) + number(0, 4) + fixed(c) + fixed(d) + zeros(12) + number(0x40000000, 4);
}

inline const std::string upright = matrix(1, 0, 0, 1);

inline std::string mvhd(std::uint32_t timeScale, std::uint32_t duration, const std::string& turn = upright)
{
    return box("mvhd", zeros(12) + number(timeScale, 4) + number(duration, 4) + zeros(16) + turn + zeros(28));
}

inline std::string longMvhd(std::uint32_t timeScale, std::uint64_t duration)
{
    return box("mvhd",
        number(1, 1) + zeros(19) + number(timeScale, 4) + number(duration, 8) + zeros(16) + upright + zeros(28));
}

inline std::string tkhd(double width, double height, const std::string& turn = upright)
{
    return box("tkhd", zeros(40) + turn + fixed(width) + fixed(height));
}

inline std::string longTkhd(double width, double height, const std::string& turn = upright)
{
    return box("tkhd", number(1, 1) + zeros(51) + turn + fixed(width) + fixed(height));
}

inline std::string hdlr(std::string_view handler)
{
    return box("hdlr", zeros(8) + std::string(handler) + zeros(13));
}

inline std::string pasp(std::uint32_t horizontal, std::uint32_t vertical)
{
    return box("pasp", number(horizontal, 4) + number(vertical, 4));
}

inline std::string stsd(unsigned width, unsigned height, const std::string& extensions = {})
{
    const std::string entry = box("avc1",
        zeros(6) + number(1, 2) + zeros(16) + number(width, 2) + number(height, 2) + zeros(46) + number(24, 2)
            + number(0xFFFF, 2) + extensions);
    return box("stsd", number(0, 4) + number(1, 4) + entry);
}

inline std::string trak(const std::string& header, std::string_view handler, const std::string& description)
{
    const std::string table = box("stbl", description + box("stts", zeros(8)));
    return box("trak",
        header + box("mdia", box("mdhd", zeros(24)) + hdlr(handler) + box("minf", box("vmhd", zeros(12)) + table)));
}

inline std::string videoTrack(double width, double height, unsigned storedWidth, unsigned storedHeight,
    const std::string& extensions = {}, const std::string& turn = upright)
{
    return trak(tkhd(width, height, turn), "vide", stsd(storedWidth, storedHeight, extensions));
}

inline std::string soundTrack()
{
    return trak(tkhd(0, 0), "soun", box("stsd", number(0, 4) + number(1, 4) + box("mp4a", zeros(28))));
}

inline std::string ftyp()
{
    return box("ftyp", "isom" + zeros(4));
}

inline std::string moov(const std::string& content)
{
    return box("moov", content);
}

/// References of `size` bytes and `duration` units each.
inline std::string sidx(
    std::uint32_t stream, std::uint32_t timeScale, int count, std::uint32_t size, std::uint32_t duration)
{
    std::string content = zeros(4) + number(stream, 4) + number(timeScale, 4) + zeros(8) + zeros(2)
        + number(static_cast<std::uint64_t>(count), 2);
    for (int index = 0; index < count; ++index)
        content += number(size, 4) + number(duration, 4) + zeros(4);
    return box("sidx", content);
}

} // namespace movie
