#pragma once

#include <cstddef>
#include <optional>
#include <string_view>
#include <vector>

/// What a comparison of texts leaves out of account, and where it looks.
struct TextModifiers {
    bool ignoresCase = false; ///< Unicode simple case folding
    bool ignoresAccents = false;
    bool comparesWords = false; ///< the pattern stands for whole words of the text, not for all of it
};

/// A text with wildcards that other texts are held against. Characters are code points; a byte that is no UTF-8 equals
/// the same byte only. Immutable once it is made; any thread.
class TextPattern {
public:
    /// Stand among the characters of a pattern for wildcards: one character, and any number of them.
    static constexpr char32_t anyCharacter = 0x200000;
    static constexpr char32_t anyRun = 0x200001;

    TextPattern(const std::vector<char32_t>& elements, TextModifiers modifiers);

    bool matches(std::string_view text) const;

private:
    std::optional<char32_t> takeCompared(std::string_view& rest) const;
    bool mayEndBefore(std::string_view rest, std::string_view text) const;
    bool matchesFrom(std::string_view rest, std::string_view text) const;

    std::vector<char32_t> _elements;
    TextModifiers _modifiers;
};
