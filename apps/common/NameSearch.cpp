// Groups of groups repeat the objects below them. A batch that several groups show is looked through once, for the
// innermost of them; what else is repeated is sorted out among the hits, of which there are few.

#include "apps/common/NameSearch.h"

#include "apps/common/NameBlock.h"
#include "host/OBGroupWalk.h"

#include <algorithm>
#include <cstdint>
#include <iterator>
#include <unordered_map>
#include <unordered_set>
#include <utility>

namespace apps {
namespace {

    std::vector<FlatGroup> laidFlat(const OBMediaGroupRef& root)
    {
        std::vector<FlatGroup> groups;
        OBWalkGroups(root, [&groups](const OBMediaGroupRef& group, const OBGroupPlace& place) {
            groups.push_back({ group, place.depth == 0 ? 0 : place.parent, place.depth });
            return true;
        });
        return groups;
    }

    /// For each batch the innermost group that shows it; of equally deep ones the first.
    class BatchPlaces final : public OBMediaObjectRunVisitor {
    public:
        struct Place {
            std::size_t group;
            std::size_t depth;
            std::size_t count;
            bool isLookedThrough = false;
        };

        void add(std::size_t group, std::size_t depth, const OBMediaObjectList& objects)
        {
            _group = group;
            _depth = depth;
            objects.visitRuns(*this);
        }
        void visitBatch(const OBMediaObjectBatch& batch, std::size_t count) override
        {
            const auto [place, isNew] = _places.try_emplace(&batch, Place { _group, _depth, count });
            if (!isNew && _depth > place->second.depth)
                place->second = { _group, _depth, count };
        }
        void visitObject(const OBMediaObjectRef&) override { }

        Place& of(const OBMediaObjectBatch& batch) { return _places.at(&batch); }

    private:
        std::unordered_map<const OBMediaObjectBatch*, Place> _places;
        std::size_t _group = 0;
        std::size_t _depth = 0;
    };

    /// Looks through the objects of one group after the other. The lists outlive it.
    class ObjectSearch final : public OBMediaObjectRunVisitor {
    public:
        ObjectSearch(BatchPlaces& places, NameBlock& names, NameBlock& strays)
            : _places(places)
            , _names(names)
            , _strays(strays)
        {
        }

        void add(std::size_t group, const OBMediaObjectList& objects)
        {
            _owner = { group, 1 };
            objects.visitRuns(*this);
        }
        void visitBatch(const OBMediaObjectBatch& batch, std::size_t count) override
        {
            BatchPlaces::Place& place = _places.of(batch);
            const bool isItsPlace = place.group == _owner.group && !place.isLookedThrough;
            if (isItsPlace || place.count < count) {
                place.isLookedThrough |= isItsPlace;
                _owner.batch = &batch;
                _owner.isOnlyHere = isItsPlace;
                _names.addRun(_owner, count, _strays);
                _owner.batch = nullptr;
            }
            _owner.position += static_cast<std::uint32_t>(count);
        }
        void visitObject(const OBMediaObjectRef& object) override
        {
            _owner.object = object;
            _owner.isOnlyHere = false;
            _names.addName(_owner, object->name());
            _owner.object = nullptr;
            ++_owner.position;
        }

    private:
        BatchPlaces& _places;
        NameBlock& _names;
        NameBlock& _strays;
        NameBlock::Owner _owner;
    };

    /// Leaves each object where it lies deepest; among equals, where it comes first.
    void leaveInnermost(FoundNames& found)
    {
        std::vector<NameHit>& hits = found.hits;
        std::vector<std::size_t> ofObjects;
        for (std::size_t index = 0; index < hits.size(); ++index) {
            if (hits[index].object)
                ofObjects.push_back(index);
        }
        const auto depthOf = [&](std::size_t index) { return found.groups[hits[index].group].depth; };
        std::sort(ofObjects.begin(), ofObjects.end(), [&](std::size_t left, std::size_t right) {
            const OBMediaObject* leftObject = hits[left].object.get();
            const OBMediaObject* rightObject = hits[right].object.get();
            if (leftObject != rightObject)
                return std::less<>()(leftObject, rightObject);
            return depthOf(left) != depthOf(right) ? depthOf(left) > depthOf(right) : left < right;
        });
        std::vector<bool> isRepeated(hits.size());
        for (std::size_t next = 1; next < ofObjects.size(); ++next)
            isRepeated[ofObjects[next]] = hits[ofObjects[next]].object == hits[ofObjects[next - 1]].object;
        std::size_t left = 0;
        for (std::size_t index = 0; index < hits.size(); ++index) {
            if (!isRepeated[index])
                std::swap(hits[left++], hits[index]);
        }
        hits.resize(left);
    }

    std::vector<NameHit> merged(std::vector<NameHit> left, std::vector<NameHit> right)
    {
        if (right.empty())
            return left;
        const auto isBefore = [](const NameHit& first, const NameHit& second) {
            return first.group != second.group ? first.group < second.group : first.position < second.position;
        };
        std::vector<NameHit> both;
        both.reserve(left.size() + right.size());
        std::merge(std::make_move_iterator(left.begin()), std::make_move_iterator(left.end()),
            std::make_move_iterator(right.begin()), std::make_move_iterator(right.end()), std::back_inserter(both),
            isBefore);
        return both;
    }

    void putBestFirst(std::vector<NameHit>& hits)
    {
        std::vector<NameHit> ordered;
        ordered.reserve(hits.size());
        for (const NameMatch match : { NameMatch::wholeName, NameMatch::wordBeginnings, NameMatch::inside }) {
            for (NameHit& hit : hits) {
                if (hit.match == match)
                    ordered.push_back(std::move(hit));
            }
        }
        hits = std::move(ordered);
    }

} // namespace

FoundNames findNames(const OBMediaGroupRef& root, const NameQuery& query, NameKinds kinds)
{
    FoundNames found;
    if (query.empty())
        return found;
    found.groups = laidFlat(root);
    // The lists as they are now: others may take their places while they are looked through.
    std::vector<OBMediaObjectList> objects(found.groups.size());
    BatchPlaces places;
    for (std::size_t group = 0; group < objects.size() && kinds != NameKinds::groups; ++group) {
        objects[group] = found.groups[group].group->ownMediaObjects();
        places.add(group, found.groups[group].depth, objects[group]);
    }
    NameBlock names(query);
    NameBlock strays(query);
    ObjectSearch search(places, names, strays);
    for (std::size_t group = 0; group < objects.size(); ++group) {
        if (kinds != NameKinds::objects)
            names.addName({ group }, found.groups[group].group->name());
        search.add(group, objects[group]);
    }
    found.hits = merged(names.takeHits(), strays.takeHits());
    if (names.mayRepeat() || strays.mayRepeat())
        leaveInnermost(found);
    putBestFirst(found.hits);
    return found;
}

void orderNewestFirst(FoundNames& found, const std::function<std::optional<platform::Date>(const NameHit&)>& dateOf)
{
    struct DatedHit {
        NameHit hit;
        std::optional<platform::Date> date;
    };
    std::vector<DatedHit> dated;
    dated.reserve(found.hits.size());
    for (NameHit& hit : found.hits) {
        const std::optional<platform::Date> date = dateOf(hit);
        dated.push_back({ std::move(hit), date });
    }
    // No date is less than any date.
    std::stable_sort(dated.begin(), dated.end(), [](const DatedHit& left, const DatedHit& right) {
        return left.hit.match != right.hit.match ? left.hit.match < right.hit.match : left.date > right.date;
    });
    for (std::size_t index = 0; index < dated.size(); ++index)
        found.hits[index] = std::move(dated[index].hit);
}

std::size_t countOfNames(const OBMediaGroupRef& root, NameKinds kinds)
{
    std::size_t groups = 0;
    std::unordered_set<const OBMediaObject*> objects;
    for (const FlatGroup& flat : laidFlat(root)) {
        groups += kinds != NameKinds::objects;
        if (kinds == NameKinds::groups)
            continue;
        flat.group->ownMediaObjects().visit([&objects](OBMediaObject& object) {
            if (!object.isRepresentative())
                objects.insert(&object);
            return true;
        });
    }
    return groups + objects.size();
}

} // namespace apps
