#include "apps/ombrix/GroupSearch.h"

#include "apps/common/DidYouMean.h"
#include "host/OBGroupWalk.h"

#include <vector>

namespace ombrix {
namespace {

    constexpr std::size_t mostCandidates = 20'000;

    std::string suggested(const OBMediaGroupRef& root, std::string_view typed, bool alsoNames)
    {
        std::vector<platform::Text> texts;
        OBWalkGroups(root, [&](const OBMediaGroupRef& group, const OBGroupPlace&) {
            texts.push_back(group->ID());
            if (alsoNames)
                texts.push_back(group->name());
            return texts.size() < mostCandidates;
        });
        std::vector<std::string_view> candidates;
        for (const platform::Text& text : texts) {
            if (!text.empty())
                candidates.push_back(text);
        }
        return apps::didYouMean(typed, candidates);
    }

} // namespace

OBMediaGroupRef groupWithID(const OBMediaGroupRef& root, std::string_view identifier)
{
    OBMediaGroupRef found;
    OBWalkGroups(root, [&](const OBMediaGroupRef& group, const OBGroupPlace&) {
        const platform::Text own = group->ID();
        if (own && own.view() == identifier)
            found = group;
        return !found;
    });
    return found;
}

OBMediaGroupRef groupWithName(const OBMediaGroupRef& root, std::string_view name)
{
    OBMediaGroupRef found;
    OBWalkGroups(root, [&](const OBMediaGroupRef& group, const OBGroupPlace&) {
        const platform::Text own = group->name();
        if (own && own.view() == name)
            found = group;
        return !found;
    });
    return found;
}

std::string suggestedID(const OBMediaGroupRef& root, std::string_view typed)
{
    return suggested(root, typed, false);
}

std::string suggestedIDOrName(const OBMediaGroupRef& root, std::string_view typed)
{
    return suggested(root, typed, true);
}

} // namespace ombrix
