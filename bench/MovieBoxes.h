#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <string_view>

namespace bench {

/// The bytes of a small valid movie (ISO base media file format): one video track of `width` by `height` pixels that
/// lasts `seconds`. `brand` is its four-letter major brand. The movie box stands after the media data where
/// `headerLast` is true, as a camera writes it, else before. Always between 1 and 2 KiB.
std::string smallMovie(
    std::string_view brand, std::uint16_t width, std::uint16_t height, std::uint32_t seconds, bool headerLast);

/// What the header boxes of a movie say; zeros where they are not there.
struct MovieFacts {
    double width = 0; ///< pixels, of the first video track
    double height = 0; ///< pixels, of the first video track
    double seconds = 0;
};

/// Reads the movie that is open at `descriptor` with as few calls as its layout allows, and of it only the boxes that
/// tell size and duration. `buffer` is where it reads to: one page is enough for a movie whose header lies at the
/// front.
///
/// For movies that smallMovie made, or like ones: it trusts what it reads no further than the buffer goes.
MovieFacts readMovieFacts(int descriptor, std::span<char> buffer);

} // namespace bench
