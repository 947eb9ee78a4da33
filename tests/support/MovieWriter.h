#pragma once

#include <cstdint>
#include <optional>
#include <string>

namespace tests {

/// How many quarters a movie's picture is turned, clockwise.
enum class Rotation : std::uint8_t { none, quarter, half, threeQuarters };

/// Where a movie's header stands.
enum class HeaderPlace : std::uint8_t { beforeMedia, afterMedia };

/// How a movie's boxes tell their sizes: in 32 bits or in 64.
enum class BoxSizes : std::uint8_t { small, large };

/// The shape of one pixel, width to height.
struct PixelShape {
    std::uint32_t width = 1;
    std::uint32_t height = 1;
};

/// What a movie is to hold.
struct MovieContent {
    double width = 1920; ///< of the track header, as shown before rotation
    double height = 1080;
    std::optional<std::uint16_t> storedWidth {}; ///< of the samples; the rounded width where absent
    std::optional<std::uint16_t> storedHeight {};
    std::optional<PixelShape> pixelShape {};
    bool hasVideo = true; ///< else one track of sound
    Rotation rotation = Rotation::none;
    std::optional<double> seconds = 2; ///< absent: the header knows none
    std::uint32_t timeScale = 600;
    HeaderPlace headerPlace = HeaderPlace::beforeMedia;
    BoxSizes boxSizes = BoxSizes::small;
    std::size_t mediaBytes = 64;
};

/// A movie file (ISO base media file format) that holds a header and bytes that stand for media.
std::string movieBytes(const MovieContent& content);

/// The same with a picture of that size.
std::string movieBytes(double width, double height);

} // namespace tests
