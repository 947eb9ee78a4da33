#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace apps {

/// How well a name holds the words that were looked for; the best first.
enum class NameMatch : std::uint8_t {
    wholeName, ///< the words, in their order, are the name
    wordBeginnings, ///< each word stands at the beginning of a word of the name
    inside, ///< each word stands somewhere in the name
};

/// Words to look for in names, in any order, regardless of case and accents. Immutable.
class NameQuery {
public:
    /// The words of `text` are what white space parts.
    explicit NameQuery(std::string_view text);

    /// Without a word nothing can be found.
    bool empty() const { return _words.empty(); }
    /// The word that the fewest names hold, as far as its length tells; empty without words.
    std::string_view longestWord() const;
    /// How a folded name holds the words; absent when it lacks one.
    std::optional<NameMatch> matchOf(std::string_view foldedName) const;

private:
    std::vector<std::string> _words; // folded
};

} // namespace apps
