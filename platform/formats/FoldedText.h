#pragma once

#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

namespace platform {

/// `text` as a search compares it: without case and accents, every white space a blank.
///
/// The Unicode Standard: canonical decomposition, then full case folding, no locale ("ß" is "ss"; "ø" stays, for it is
/// no "o" with an accent). A mark that makes another letter is no accent and stays: the voicing mark of Kana, the vowel
/// signs of India. Each byte that is no UTF-8 stays itself, behind a byte that begins no character, so that
/// it is found by itself alone and never inside a character.
std::string foldedText(std::string_view text);

/// Appends `text`, folded, to `folded`.
void appendFolded(std::string& folded, std::string_view text);

/// Appends `text` to `folded` byte for byte, of which those that are ASCII are folded; answers whether all are.
bool appendFoldedAscii(std::string& folded, std::string_view text);

/// A character that is not ASCII, in a text and in what was folded from it.
struct FoldedCharacter {
    std::size_t end = 0; ///< where it ends in the text
    std::size_t foldedEnd = 0; ///< where what became of it ends
};

/// Appends `text`, folded, and to `others` its characters that are not ASCII; `foldedEnd` counts from the beginning of
/// `folded`. Answers false, with nothing appended, where what becomes of one depends on those beside it, is several, or
/// takes more room than there is: whoever folds several texts as one then has to fold each by itself.
bool appendFoldedOneByOne(std::string& folded, std::string_view text, std::vector<FoldedCharacter>& others);

/// Whether a word may begin at `position` of a folded text: nothing stands before it, or neither letter nor digit.
bool wordMayBeginAt(std::string_view folded, std::size_t position) noexcept;

} // namespace platform
