#include "apps/ombrix/TreeDifferences.h"

#include <algorithm>
#include <array>
#include <unordered_map>

namespace ombrix {
namespace {

    using Kind = TreeDifference::Kind;

    /// Which of the elements of two lists belong together: of several with one key the first to the first.
    struct Matching {
        std::vector<std::pair<std::size_t, std::size_t>> pairs {}; ///< in the order of the first list
        std::vector<std::size_t> onlyFirst {};
        std::vector<std::size_t> onlySecond {};

        bool isInOrder() const
        {
            return std::is_sorted(pairs.begin(), pairs.end(),
                [](const auto& left, const auto& right) { return left.second < right.second; });
        }
    };

    Matching matchingOf(const std::vector<std::string_view>& first, const std::vector<std::string_view>& second)
    {
        Matching matching;
        std::unordered_map<std::string_view, std::vector<std::size_t>> places;
        for (std::size_t index = second.size(); index-- > 0;)
            places[second[index]].push_back(index);
        for (std::size_t index = 0; index < first.size(); ++index) {
            const auto known = places.find(first[index]);
            if (known == places.end() || known->second.empty()) {
                matching.onlyFirst.push_back(index);
                continue;
            }
            matching.pairs.emplace_back(index, known->second.back());
            known->second.pop_back();
        }
        for (const auto& [key, left] : places)
            matching.onlySecond.insert(matching.onlySecond.end(), left.begin(), left.end());
        std::sort(matching.onlySecond.begin(), matching.onlySecond.end());
        return matching;
    }

    std::vector<std::string_view> pathsOf(const std::vector<std::string_view>& objects)
    {
        std::vector<std::string_view> paths;
        paths.reserve(objects.size());
        for (const std::string_view object : objects)
            paths.push_back(memberOf(object, "path"));
        return paths;
    }

    std::vector<std::string_view> identifiersOf(const TreeDocument& tree, const std::vector<std::size_t>& groups)
    {
        std::vector<std::string_view> identifiers;
        identifiers.reserve(groups.size());
        for (const std::size_t group : groups)
            identifiers.push_back(tree.groups[group].fact("ID"));
        return identifiers;
    }

    /// The first key of two objects whose values are not alike.
    std::string_view changedMember(std::string_view followed, std::string_view fresh)
    {
        constexpr std::array<std::string_view, 8> keys { "name", "path", "mediaType", "mediaSourceType",
            "sourcePluginIdentifier", "aliasResolvedPath", "attributes", "icon" };
        for (const std::string_view key : keys) {
            if (memberOf(followed, key) != memberOf(fresh, key))
                return key;
        }
        return {};
    }

    class Comparison {
    public:
        explicit Comparison(const ComparedTrees& trees)
            : _trees(trees)
        {
        }

        std::vector<TreeDifference> differences()
        {
            // A stack of our own: folders may be nested deeper than the thread's.
            _left.push_back({ 0, 0 });
            while (!_left.empty()) {
                const Pair pair = _left.back();
                _left.pop_back();
                compareFacts(pair);
                compareObjects(pair);
                compareChildren(pair);
            }
            return std::move(_differences);
        }

    private:
        struct Pair {
            std::size_t followed;
            std::size_t fresh;
        };

        TreeDifference& add(Kind kind, const Pair& pair)
        {
            TreeDifference& difference = _differences.emplace_back();
            difference.kind = kind;
            difference.followedGroup = pair.followed;
            difference.freshGroup = pair.fresh;
            return difference;
        }

        void compareFacts(const Pair& pair)
        {
            const DocumentGroup& fresh = _trees.fresh.groups[pair.fresh];
            for (const auto& [key, value] : _trees.followed.groups[pair.followed].facts) {
                if (fresh.fact(key) != value)
                    add(Kind::changed, pair).key = key;
            }
        }

        void compareObjects(const Pair& pair)
        {
            const std::vector<std::string_view>& followed = _trees.followed.groups[pair.followed].objects;
            const std::vector<std::string_view>& fresh = _trees.fresh.groups[pair.fresh].objects;
            if (followed == fresh)
                return;
            const Matching matching = matchingOf(pathsOf(followed), pathsOf(fresh));
            for (const auto& [one, other] : matching.pairs) {
                if (followed[one] != fresh[other])
                    addObject(Kind::changed, pair, followed[one], fresh[other]);
            }
            for (const std::size_t index : matching.onlyFirst)
                addObject(Kind::surplus, pair, followed[index], {});
            for (const std::size_t index : matching.onlySecond)
                addObject(Kind::missing, pair, {}, fresh[index]);
            if (!matching.isInOrder())
                add(Kind::reordered, pair).isOfObjects = true;
        }

        void addObject(Kind kind, const Pair& pair, std::string_view followed, std::string_view fresh)
        {
            TreeDifference& difference = add(kind, pair);
            difference.isOfObjects = true;
            difference.followedObject = followed;
            difference.freshObject = fresh;
            if (kind == Kind::changed)
                difference.key = changedMember(followed, fresh);
        }

        void compareChildren(const Pair& pair)
        {
            const std::vector<std::size_t>& followed = _trees.followed.groups[pair.followed].children;
            const std::vector<std::size_t>& fresh = _trees.fresh.groups[pair.fresh].children;
            const Matching matching
                = matchingOf(identifiersOf(_trees.followed, followed), identifiersOf(_trees.fresh, fresh));
            for (const std::size_t index : matching.onlyFirst)
                add(Kind::surplus, { followed[index], pair.fresh }).freshGroup.reset();
            for (const std::size_t index : matching.onlySecond)
                add(Kind::missing, { pair.followed, fresh[index] }).followedGroup.reset();
            if (!matching.isInOrder())
                add(Kind::reordered, pair);
            for (const auto& [one, other] : matching.pairs)
                _left.push_back({ followed[one], fresh[other] });
        }

        const ComparedTrees& _trees;
        std::vector<Pair> _left {};
        std::vector<TreeDifference> _differences {};
    };

    std::string nameOfGroup(const TreeDocument& tree, std::size_t group)
    {
        return "the group " + textOfValue(tree.groups[group].fact("ID"));
    }

    std::string nameOfObject(std::string_view object)
    {
        return textOfValue(memberOf(object, "path"));
    }

} // namespace

std::vector<TreeDifference> differencesOf(const ComparedTrees& trees)
{
    return Comparison(trees).differences();
}

std::string textOf(const TreeDifference& difference, const ComparedTrees& trees)
{
    const bool isFresh = !difference.followedGroup || difference.followedObject.empty();
    const std::string group = difference.followedGroup ? nameOfGroup(trees.followed, *difference.followedGroup)
                                                       : nameOfGroup(trees.fresh, *difference.freshGroup);
    const std::string_view object = isFresh ? difference.freshObject : difference.followedObject;
    const std::string what = object.empty() ? group : nameOfObject(object) + " in " + group;
    switch (difference.kind) {
    case Kind::missing:
        return what + ": only a fresh load shows it";
    case Kind::surplus:
        return what + ": a fresh load does not show it";
    case Kind::reordered:
        return group + ": a fresh load shows its " + (difference.isOfObjects ? "movies" : "groups")
            + " in another order";
    case Kind::changed:
        break;
    }
    const auto value = [&](const TreeDocument& tree, std::size_t holder, std::string_view text) {
        return std::string(text.empty() ? tree.groups[holder].fact(difference.key) : memberOf(text, difference.key));
    };
    return what + ": " + std::string(difference.key) + " is "
        + value(trees.followed, *difference.followedGroup, difference.followedObject) + ", a fresh load finds "
        + value(trees.fresh, *difference.freshGroup, difference.freshObject);
}

} // namespace ombrix
