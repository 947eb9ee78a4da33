#include "apps/common/DidYouMean.h"

#include "platform/formats/Quoted.h"
#include "platform/formats/Suggestion.h"

namespace apps {

std::string didYouMean(std::string_view word, std::span<const std::string_view> candidates)
{
    const auto suggestion = platform::suggestionFor(word, candidates);
    return suggestion ? " (did you mean " + platform::quoted(*suggestion) + "?)" : std::string();
}

} // namespace apps
