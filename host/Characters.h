#pragma once

#include <cstddef>
#include <cstdint>
#include <span>
#include <string_view>

// Characters of texts that come from the disk: code points, and bytes that are no UTF-8, each of which counts as a
// character of its own beyond the last code point.

/// Characters `first` to `last`.
struct CharacterRange {
    std::uint32_t first;
    std::uint32_t last;
};

/// Whether `character` lies in one of `ranges`, which stand in order.
bool isInRanges(std::span<const CharacterRange> ranges, char32_t character);

/// Whether `character` stands for a byte that is no UTF-8.
bool isForeignByte(char32_t character);

/// The character at the start of `text`, which is not empty and is shortened by it.
char32_t takeCharacter(std::string_view& text);

/// `character` by Unicode simple case folding, in no locale.
char32_t withoutCase(char32_t character);

/// Whether `character` is a mark that people in a hurry leave out. One that makes another letter, such as the voicing
/// mark of Kana or the vowel signs of India, is none.
bool isAccent(char32_t character);

/// The letter that `character` is without its accents; `character` itself where it has none.
char32_t withoutAccents(char32_t character);

/// Whether words are made of `character`: letters, marks and numbers, and bytes that are no UTF-8, which most likely
/// are letters of an older encoding.
bool belongsToWord(char32_t character);
