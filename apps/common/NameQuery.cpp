#include "apps/common/NameQuery.h"

#include "platform/formats/FoldedText.h"

#include <algorithm>

namespace apps {
namespace {

    /// Takes the next word off a folded text; empty at its end.
    std::string_view takeWord(std::string_view& folded)
    {
        folded.remove_prefix(std::min(folded.find_first_not_of(' '), folded.size()));
        const std::string_view word = folded.substr(0, folded.find(' '));
        folded.remove_prefix(word.size());
        return word;
    }

    bool consistsOf(std::string_view folded, const std::vector<std::string>& words)
    {
        const bool beginsAlike = std::all_of(
            words.begin(), words.end(), [&folded](const std::string& word) { return takeWord(folded) == word; });
        return beginsAlike && takeWord(folded).empty();
    }

    /// `inside` or better; absent when the word is not there.
    std::optional<NameMatch> matchOfWord(std::string_view folded, std::string_view word)
    {
        const std::size_t first = folded.find(word);
        if (first == std::string_view::npos)
            return std::nullopt;
        for (std::size_t at = first; at != std::string_view::npos; at = folded.find(word, at + 1)) {
            if (platform::wordMayBeginAt(folded, at))
                return NameMatch::wordBeginnings;
        }
        return NameMatch::inside;
    }

} // namespace

NameQuery::NameQuery(std::string_view text)
{
    const std::string folded = platform::foldedText(text);
    std::string_view rest = folded;
    for (std::string_view word = takeWord(rest); !word.empty(); word = takeWord(rest))
        _words.emplace_back(word);
}

std::string_view NameQuery::longestWord() const
{
    const auto isShorter = [](const std::string& left, const std::string& right) { return left.size() < right.size(); };
    const auto longest = std::max_element(_words.begin(), _words.end(), isShorter);
    return longest == _words.end() ? std::string_view() : std::string_view(*longest);
}

std::optional<NameMatch> NameQuery::matchOf(std::string_view foldedName) const
{
    NameMatch worst = NameMatch::wordBeginnings;
    for (const std::string& word : _words) {
        const std::optional<NameMatch> match = matchOfWord(foldedName, word);
        if (!match)
            return std::nullopt;
        worst = std::max(worst, *match);
    }
    return consistsOf(foldedName, _words) ? NameMatch::wholeName : worst;
}

} // namespace apps
