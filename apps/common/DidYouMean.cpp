#include "apps/common/DidYouMean.h"

#include "platform/formats/Quoted.h"
#include "platform/formats/Suggestion.h"

#include <algorithm>
#include <vector>

namespace apps {
namespace {

    std::string suggestionText(std::string_view suggestion)
    {
        return " (did you mean " + platform::quoted(suggestion) + "?)";
    }

    std::string_view withoutHyphens(std::string_view option)
    {
        return option.substr(std::min(option.find_first_not_of('-'), option.size()));
    }

} // namespace

std::string didYouMean(std::string_view word, std::span<const std::string_view> candidates)
{
    const auto suggestion = platform::suggestionFor(word, candidates);
    return suggestion ? suggestionText(*suggestion) : std::string();
}

std::string didYouMeanOption(std::string_view word, std::span<const std::string_view> candidates)
{
    const std::string_view typed = withoutHyphens(word);
    std::vector<std::string_view> names;
    for (const std::string_view candidate : candidates)
        names.push_back(withoutHyphens(candidate));
    // With the wrong number of hyphens the name itself is right, which counts as no suggestion otherwise.
    const auto meant = std::find(names.begin(), names.end(), typed);
    const auto suggestion = meant != names.end() ? std::optional(*meant) : platform::suggestionFor(typed, names);
    if (!suggestion)
        return {};
    return suggestionText(
        candidates[static_cast<std::size_t>(std::find(names.begin(), names.end(), *suggestion) - names.begin())]);
}

} // namespace apps
