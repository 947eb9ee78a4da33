#include "apps/ombrix/GroupSearch.h"

#include "apps/common/DidYouMean.h"

#include <vector>

namespace ombrix {
namespace {

    constexpr std::size_t mostCandidates = 20'000;

    struct Level {
        OBMediaGroupList groups;
        std::size_t next = 0;
    };

    std::string suggested(const OBMediaGroupRef& root, std::string_view typed, bool alsoNames)
    {
        std::vector<platform::Text> texts;
        visitDepthFirst(root, [&](const OBMediaGroupRef& group) {
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

void visitDepthFirst(const OBMediaGroupRef& root, const std::function<bool(const OBMediaGroupRef&)>& visitor)
{
    if (!root || !visitor(root))
        return;
    std::vector<Level> levels { { root->childGroups(), 0 } };
    while (!levels.empty()) {
        Level& innermost = levels.back();
        if (innermost.next == innermost.groups.size()) {
            levels.pop_back();
            continue;
        }
        const OBMediaGroupRef group = innermost.groups[innermost.next++];
        if (!visitor(group))
            return;
        levels.push_back({ group->childGroups(), 0 });
    }
}

OBMediaGroupRef groupWithID(const OBMediaGroupRef& root, std::string_view identifier)
{
    OBMediaGroupRef found;
    visitDepthFirst(root, [&](const OBMediaGroupRef& group) {
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
    visitDepthFirst(root, [&](const OBMediaGroupRef& group) {
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
