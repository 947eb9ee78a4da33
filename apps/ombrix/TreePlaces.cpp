#include "apps/ombrix/TreePlaces.h"

#include <cstddef>
#include <functional>

namespace ombrix {
namespace {

    const std::vector<TreePlace> noPlaces;

    /// Walks a tree however deep it is, and knows the groups above the one at hand.
    class Walk {
    public:
        explicit Walk(const OBMediaGroupRef& root) { enter(root); }

        /// Null at the end.
        const OBMediaGroupRef* current() const { return _levels.empty() ? nullptr : &_levels.back().group; }
        std::vector<platform::Text> namesAbove() const
        {
            std::vector<platform::Text> names;
            for (std::size_t index = 0; index + 1 < _levels.size(); ++index)
                names.push_back(_levels[index].group->name());
            return names;
        }
        void advance()
        {
            while (!_levels.empty()) {
                Level& innermost = _levels.back();
                if (innermost.next < innermost.children.size()) {
                    enter(OBMediaGroupRef(innermost.children[innermost.next++]));
                    return;
                }
                _levels.pop_back();
            }
        }

    private:
        struct Level {
            OBMediaGroupRef group;
            OBMediaGroupList children;
            std::size_t next = 0;
        };
        void enter(const OBMediaGroupRef& group)
        {
            if (group)
                _levels.push_back({ group, group->childGroups(), 0 });
        }
        std::vector<Level> _levels {};
    };

    template <class Map, class Key> const std::vector<TreePlace>& placesIn(const Map& map, const Key& key)
    {
        const auto found = map.find(key);
        return found == map.end() ? noPlaces : found->second;
    }

} // namespace

TreePlaces::TreePlaces(const OBMediaGroupRef& root, const std::unordered_set<std::string>& paths,
    const std::unordered_set<const OBMediaObject*>& objects)
{
    std::string path;
    std::size_t order = 0;
    for (Walk walk(root); walk.current(); walk.advance()) {
        const OBMediaGroupRef& group = *walk.current();
        if (const platform::Text own = group->path(); own && paths.count(path = own.view()))
            _byPath[path].push_back({ group, nullptr, walk.namesAbove(), order });
        ++order;
        const OBMediaObjectList list = group->ownMediaObjects();
        std::size_t index = 0;
        list.visit([&](const OBMediaObject& object) {
            if (objects.count(&object))
                _byObject[&object].push_back({ group, list[index], walk.namesAbove(), order });
            if (const platform::Text own = object.path(); own && paths.count(path = own.view()))
                _byPath[path].push_back({ group, list[index], walk.namesAbove(), order });
            ++index;
            ++order;
            return true;
        });
    }
}

const std::vector<TreePlace>& TreePlaces::withPath(const std::string& path) const
{
    return placesIn(_byPath, path);
}

const std::vector<TreePlace>& TreePlaces::ofObject(const OBMediaObject* object) const
{
    return placesIn(_byObject, object);
}

} // namespace ombrix
