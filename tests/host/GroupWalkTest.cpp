#include "host/OBGroupWalk.h"

#include <doctest/doctest.h>

#include <string>
#include <vector>

namespace {

OBMediaGroupRef groupWith(const std::string& name, const std::vector<OBMediaGroupRef>& children)
{
    OBMediaGroupRef group = OBMediaGroup::withFields({ .name = name });
    group->setChildGroups(OBMediaGroupList(children));
    return group;
}

/// root holds one, which holds two and three, and four.
OBMediaGroupRef smallTree()
{
    const OBMediaGroupRef one = groupWith("one", { groupWith("two", {}), groupWith("three", {}) });
    return groupWith("root", { one, groupWith("four", {}) });
}

} // namespace

TEST_CASE("a walk over a tree comes to each group before its child groups, and tells where it stands")
{
    std::vector<std::string> seen;
    OBWalkGroups(smallTree(), [&](const OBMediaGroupRef& group, const OBGroupPlace& place) {
        CHECK(place.index == seen.size());
        const std::string parent = place.parent == OBGroupPlace::nowhere ? "none" : std::to_string(place.parent);
        seen.push_back(group->name().string() + " in " + parent + " at " + std::to_string(place.depth));
        return true;
    });
    CHECK(seen
        == std::vector<std::string> {
            "root in none at 0", "one in 0 at 1", "two in 1 at 2", "three in 1 at 2", "four in 0 at 1" });
}

TEST_CASE("a walk over a tree ends where it is told to, and over none it does not begin")
{
    int visits = 0;
    OBWalkGroups(smallTree(), [&](const OBMediaGroupRef& group, const OBGroupPlace&) {
        ++visits;
        return group->name().view() != "two";
    });
    CHECK(visits == 3);
    OBWalkGroups(smallTree(), [&](const OBMediaGroupRef&, const OBGroupPlace&) { return ++visits < 0; });
    CHECK(visits == 4);
    OBWalkGroups(nullptr, [&](const OBMediaGroupRef&, const OBGroupPlace&) { return ++visits > 0; });
    CHECK(visits == 4);
}

TEST_CASE("a walk over a tree shows the child groups that a group had when it was visited")
{
    const OBMediaGroupRef root = smallTree();
    std::vector<std::string> seen;
    OBWalkGroups(root, [&](const OBMediaGroupRef& group, const OBGroupPlace& place) {
        seen.push_back(group->name().string());
        if (place.depth == 1)
            root->setChildGroups({});
        if (group->name().view() == "four")
            group->setChildGroups(OBMediaGroupList({ groupWith("five", {}) }));
        return true;
    });
    CHECK(seen == std::vector<std::string> { "root", "one", "two", "three", "four", "five" });
}
