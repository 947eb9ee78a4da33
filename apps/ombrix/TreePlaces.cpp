#include "apps/ombrix/TreePlaces.h"

#include "host/OBGroupWalk.h"

#include <cstddef>
#include <functional>

namespace ombrix {
namespace {

    const std::vector<TreePlace> noPlaces;

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
    std::vector<platform::Text> namesAbove;
    OBWalkGroups(root, [&](const OBMediaGroupRef& group, const OBGroupPlace& place) {
        namesAbove.resize(place.depth);
        if (const platform::Text own = group->path(); own && paths.count(path = own.view()))
            _byPath[path].push_back({ group, nullptr, namesAbove, order });
        ++order;
        const OBMediaObjectList list = group->ownMediaObjects();
        std::size_t index = 0;
        list.visit([&](const OBMediaObject& object) {
            if (objects.count(&object))
                _byObject[&object].push_back({ group, list[index], namesAbove, order });
            if (const platform::Text own = object.path(); own && paths.count(path = own.view()))
                _byPath[path].push_back({ group, list[index], namesAbove, order });
            ++index;
            ++order;
            return true;
        });
        namesAbove.push_back(group->name());
        return true;
    });
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
