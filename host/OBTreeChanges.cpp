// The one surprise: a list of objects is compared by what it is made of. A folder's files are one block of memory,
// which groups of groups repeat, so the innermost group of a million objects is found by looking at the blocks alone.

#include "host/OBTreeChanges.h"

#include "host/OBGroupWalk.h"
#include "host/OBMediaObjectList.h"

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <unordered_map>
#include <utility>

using platform::Text;

namespace {

constexpr std::size_t nowhere = OBGroupPlace::nowhere;

/// A group's fields at one moment.
struct SeenGroup {
    OBMediaGroupRef group;
    OBTypeIdentifierRef type = nullptr;
    Text name {};
    Text identifier {};
    Text path {};
    std::optional<platform::Date> modificationDate {};
    platform::Value::Dictionary attributes {};
    OBMediaObjectList objects {};
    std::size_t parent = nowhere; ///< index; `nowhere` for the root
    std::size_t depth = 0;
};

std::vector<SeenGroup> laidFlat(const OBMediaGroupRef& root)
{
    std::vector<SeenGroup> groups;
    OBWalkGroups(root, [&groups](const OBMediaGroupRef& group, const OBGroupPlace& place) {
        groups.push_back({ group, group->typeIdentifier(), group->name(), group->ID(), group->path(),
            group->modificationDate(), group->attributes(), group->ownMediaObjects(), place.parent, place.depth });
        return true;
    });
    return groups;
}

/// For each block of objects, and each object by itself, the innermost group that shows it; of equally deep ones the
/// first.
class Places final : public OBMediaObjectRunVisitor {
public:
    void add(std::size_t group, std::size_t depth, const OBMediaObjectList& objects)
    {
        _group = group;
        _depth = depth;
        objects.visitRuns(*this);
    }
    void visitBatch(const OBMediaObjectBatch& batch, std::size_t count) override { place(&batch, count); }
    void visitObject(const OBMediaObjectRef& object) override { place(object.get(), 1); }

    /// Of the first `count` objects of a run of `group`, the first that counts there.
    std::size_t firstCounted(const void* run, std::size_t group, std::size_t count) const
    {
        const Place& place = _places.at(run);
        // A longer list of the same block may stand further out; then the rest of it counts there.
        return place.group == group ? 0 : std::min(count, place.count);
    }

private:
    struct Place {
        std::size_t group;
        std::size_t depth;
        std::size_t count;
    };

    void place(const void* run, std::size_t count)
    {
        const auto [known, isNew] = _places.try_emplace(run, Place { _group, _depth, count });
        if (!isNew && _depth > known->second.depth)
            known->second = { _group, _depth, count };
    }

    std::unordered_map<const void*, Place> _places;
    std::size_t _group = 0;
    std::size_t _depth = 0;
};

using Objects = std::vector<OBMediaObjectRef>;

/// Collects the objects of one group that count there.
class OwnObjects final : public OBMediaObjectRunVisitor {
public:
    OwnObjects(const Places& places, std::size_t group)
        : _places(places)
        , _group(group)
    {
    }
    void visitBatch(const OBMediaObjectBatch& batch, std::size_t count) override
    {
        for (std::size_t index = _places.firstCounted(&batch, _group, count); index < count; ++index)
            take(batch.objectAtIndex(index));
    }
    void visitObject(const OBMediaObjectRef& object) override
    {
        if (_places.firstCounted(object.get(), _group, 1) == 0)
            take(object);
    }
    Objects takeObjects() { return std::move(_objects); }

private:
    void take(OBMediaObjectRef object)
    {
        if (!object->isRepresentative())
            _objects.push_back(std::move(object));
    }

    const Places& _places;
    const std::size_t _group;
    Objects _objects;
};

/// What tells an object from the others of its group.
Text keyOf(const OBMediaObject& object)
{
    const Text path = object.path();
    return path ? path : object.name();
}

std::vector<Text> keysOf(const Objects& objects)
{
    std::vector<Text> keys;
    keys.reserve(objects.size());
    for (const OBMediaObjectRef& object : objects)
        keys.push_back(keyOf(*object));
    return keys;
}

std::string keyOf(const SeenGroup& group)
{
    const Text& first = group.identifier || group.path ? group.identifier : group.name;
    return std::string(first).append(1, '\0').append(group.path);
}

/// Those of `objects` that `others` has not, or not as often.
Objects without(const Objects& objects, const std::vector<Text>& keys, const std::vector<Text>& others)
{
    std::unordered_map<std::string_view, std::size_t> left;
    left.reserve(others.size());
    for (const Text& key : others)
        ++left[key];
    Objects rest;
    for (std::size_t index = 0; index < objects.size(); ++index) {
        const auto found = left.find(keys[index]);
        if (found == left.end() || found->second == 0)
            rest.push_back(objects[index]);
        else
            --found->second;
    }
    return rest;
}

bool haveSameFacts(const SeenGroup& left, const SeenGroup& right)
{
    return left.type == right.type && left.name == right.name && left.modificationDate == right.modificationDate
        && left.attributes == right.attributes;
}

} // namespace

struct OBTreeSnapshot::Tree {
    explicit Tree(const OBMediaGroupRef& root)
        : groups(laidFlat(root))
    {
        for (std::size_t group = 0; group < groups.size(); ++group)
            places.add(group, groups[group].depth, groups[group].objects);
    }

    Objects ownObjects(std::size_t group) const
    {
        OwnObjects own(places, group);
        groups[group].objects.visitRuns(own);
        return own.takeObjects();
    }
    OBTreeChange changeOf(std::size_t group) const
    {
        const SeenGroup& about = groups[group];
        const Text holder = about.parent == nowhere ? Text() : groups[about.parent].identifier;
        return { about.group, nullptr, about.name, about.path, about.identifier, holder };
    }
    void addObjects(std::vector<OBTreeChange>& changes, std::size_t group, const Objects& objects) const
    {
        const SeenGroup& holder = groups[group];
        for (const OBMediaObjectRef& object : objects)
            changes.push_back({ holder.group, object, object->name(), object->path(), {}, holder.identifier });
    }

    std::vector<SeenGroup> groups;
    Places places;
};

OBTreeSnapshot::OBTreeSnapshot(const OBMediaGroupRef& root)
    : _tree(root ? std::make_shared<const Tree>(root) : nullptr)
{
}

class OBTreeChanges::Comparison {
public:
    using Tree = OBTreeSnapshot::Tree;

    Comparison(const Tree& before, const Tree& now)
        : _before(before)
        , _now(now)
        , _beforeOf(now.groups.size(), nowhere)
        , _isStill(before.groups.size())
        , _lost(before.groups.size())
    {
        pairGroups();
    }

    OBTreeChanges changes()
    {
        for (std::size_t group = 0; group < _now.groups.size(); ++group) {
            if (_beforeOf[group] == nowhere)
                addGroup(_changes.added, _now, group, &OBTreeChange::objectsNow);
            else
                compare(_beforeOf[group], group);
        }
        for (std::size_t group = 0; group < _before.groups.size(); ++group) {
            if (_isStill[group])
                _before.addObjects(_changes.removed, group, _lost[group]);
            else
                addGroup(_changes.removed, _before, group, &OBTreeChange::objectsBefore);
        }
        return std::move(_changes);
    }

    static void addGroup(
        std::vector<OBTreeChange>& changes, const Tree& tree, std::size_t group, std::size_t OBTreeChange::*count)
    {
        const Objects objects = tree.ownObjects(group);
        changes.push_back(tree.changeOf(group));
        changes.back().*count = objects.size();
        tree.addObjects(changes, group, objects);
    }

private:
    /// Of groups that cannot be told apart, the first is the first, and so on.
    void pairGroups()
    {
        struct Alike {
            std::vector<std::size_t> groups;
            std::size_t paired = 0;
        };
        std::unordered_map<std::string, Alike> known;
        for (std::size_t group = 0; group < _before.groups.size(); ++group)
            known[keyOf(_before.groups[group])].groups.push_back(group);
        for (std::size_t group = 0; group < _now.groups.size(); ++group) {
            const auto found = known.find(keyOf(_now.groups[group]));
            if (found == known.end() || found->second.paired == found->second.groups.size())
                continue;
            _beforeOf[group] = found->second.groups[found->second.paired++];
            _isStill[_beforeOf[group]] = true;
        }
    }

    void compare(std::size_t before, std::size_t now)
    {
        const SeenGroup& was = _before.groups[before];
        const SeenGroup& is = _now.groups[now];
        const bool isMoved = (is.parent == nowhere ? nowhere : _beforeOf[is.parent]) != was.parent;
        const bool isFactChanged = isMoved || !haveSameFacts(was, is);
        const bool hasSameList = was.objects.isSameAs(is.objects);
        if (hasSameList && !isFactChanged)
            return;
        const Objects objectsBefore = _before.ownObjects(before);
        const Objects objectsNow = _now.ownObjects(now);
        const bool hasOthers = !hasSameList && compareObjects({ before, objectsBefore }, { now, objectsNow });
        if (!hasOthers && !isFactChanged)
            return;
        _changes.changed.push_back(_now.changeOf(now));
        _changes.changed.back().objectsBefore = objectsBefore.size();
        _changes.changed.back().objectsNow = objectsNow.size();
    }

    struct Holder {
        std::size_t group;
        const Objects& objects;
    };
    /// Whether the two differ.
    bool compareObjects(const Holder& before, const Holder& now)
    {
        const std::vector<Text> keysBefore = keysOf(before.objects);
        const std::vector<Text> keysNow = keysOf(now.objects);
        if (keysBefore == keysNow)
            return false;
        const Objects gained = without(now.objects, keysNow, keysBefore);
        _now.addObjects(_changes.added, now.group, gained);
        _lost[before.group] = without(before.objects, keysBefore, keysNow);
        return !gained.empty() || !_lost[before.group].empty();
    }

    const Tree& _before;
    const Tree& _now;
    std::vector<std::size_t> _beforeOf; // by the group's index now
    std::vector<bool> _isStill; // by the group's index before, like what follows
    std::vector<Objects> _lost;
    OBTreeChanges _changes {};
};

OBTreeChanges OBTreeChanges::between(const OBTreeSnapshot& before, const OBTreeSnapshot& now)
{
    if (before._tree && now._tree)
        return Comparison(*before._tree, *now._tree).changes();
    OBTreeChanges changes;
    const OBTreeSnapshot::Tree* const tree = now._tree ? now._tree.get() : before._tree.get();
    const auto count = now._tree ? &OBTreeChange::objectsNow : &OBTreeChange::objectsBefore;
    for (std::size_t group = 0; tree && group < tree->groups.size(); ++group)
        Comparison::addGroup(now._tree ? changes.added : changes.removed, *tree, group, count);
    return changes;
}
