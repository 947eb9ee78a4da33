#include "apps/common/NameSearch.h"
#include "host/OBConstants.h"
#include "host/OBMediaObjectList.h"

#include <doctest/doctest.h>

#include <memory>
#include <string>
#include <vector>

using namespace apps;

namespace {

OBMediaGroupRef makeGroup(const std::string& name)
{
    OBMediaGroupRef group = OBMediaGroup::initWithTypeIdentifier(OBMontaroFolderGroupTypeIdentifier);
    group->setName(name);
    group->setID(name);
    return group;
}

OBMediaObjectRef makeObject(const std::string& name)
{
    return OBMediaObject::initWithMediaType_name(OBMediaTypeMovie, name);
}

OBMediaObjectList makeBatch(const std::vector<std::string>& fileNames)
{
    std::vector<OBFileOfFolder> files;
    files.reserve(fileNames.size());
    for (const std::string& name : fileNames)
        files.push_back({ name, true });
    return OBMediaObjectBatch::objects(std::make_shared<OBMediaObjectKind>(), { "/folder", true }, files);
}

/// The hits as text: "group/" for a group, "group/object" for an object.
std::vector<std::string> texts(const FoundNames& found)
{
    std::vector<std::string> hits;
    for (const NameHit& hit : found.hits) {
        const std::string group = found.groups[hit.group].group->name().string() + "/";
        hits.push_back(hit.object ? group + hit.object->name().string() : group);
    }
    return hits;
}

std::vector<std::string> find(const OBMediaGroupRef& root, std::string_view text, NameKinds kinds = NameKinds::all)
{
    return texts(findNames(root, NameQuery(text), kinds));
}

using Texts = std::vector<std::string>;

/// How `name` holds the words of `text`: "whole", "beginnings", "inside", or "not".
std::string match(std::string_view text, const std::string& name)
{
    const FoundNames found = findNames(makeGroup(name), NameQuery(text));
    if (found.hits.empty())
        return "not";
    const NameMatch best = found.hits[0].match;
    return best == NameMatch::wholeName ? "whole" : best == NameMatch::wordBeginnings ? "beginnings" : "inside";
}

} // namespace

TEST_CASE("every word must stand in the name, in any order, whatever case and accents")
{
    CHECK(match("sun bea", "Beach sunset") == "beginnings");
    CHECK(match("SUN BEA", "Beäch sunset") == "beginnings");
    CHECK(match("sun bea", "Beach") == "not");
    CHECK(match("café", "CAFE\u0301") == "whole");
    CHECK(match("cafe", "Grand Café") == "beginnings");
    CHECK(match("\xfc", "Z\xfcrich") == "inside");
    CHECK(match("u", "Z\xfcrich") == "not");
}

TEST_CASE("a whole name is better than the beginnings of words, and these better than what stands inside")
{
    CHECK(match("beach sunset", "Beach  Sunset") == "whole");
    CHECK(match("  beach\tsunset ", "beach sunset") == "whole");
    CHECK(match("sunset beach", "beach sunset") == "beginnings");
    CHECK(match("beach sunset", "beach sunset 2") == "beginnings");
    CHECK(match("sun", "beach_sunset") == "beginnings");
    CHECK(match("each sun", "beach sunset") == "inside");
    CHECK(match("an", "banana an") == "beginnings");
    CHECK(match("夜", "東京の夜") == "inside");
}

TEST_CASE("hits are ordered by how well they match, then as they stand in the tree")
{
    const OBMediaGroupRef root = makeGroup("Root of a trip");
    const OBMediaGroupRef first = makeGroup("My trip");
    const OBMediaGroupRef inner = makeGroup("stripes");
    first->setMediaObjects(OBMediaObjectList({ makeObject("tripod"), makeObject("TRIP") }));
    first->addChildGroup(inner);
    inner->setMediaObjects(makeBatch({ "trip é.mov", "other.mov", "trip b.mov", "strip.mov" }));
    root->addChildGroup(first);
    root->addChildGroup(makeGroup("trip"));
    root->setMediaObjects(OBMediaObjectList({ makeObject("trip of the root") }));
    CHECK(find(root, "trip")
        == Texts { "My trip/TRIP", "trip/", "Root of a trip/", "Root of a trip/trip of the root", "My trip/",
            "My trip/tripod", "stripes/trip é", "stripes/trip b", "stripes/", "stripes/strip" });
    CHECK(find(root, "trip", NameKinds::groups) == Texts { "trip/", "Root of a trip/", "My trip/", "stripes/" });
    CHECK(find(root, "strip", NameKinds::objects) == Texts { "stripes/strip" });
}

TEST_CASE("neither extensions nor what stands across two names is found")
{
    const OBMediaGroupRef root = makeGroup("r");
    root->setMediaObjects(makeBatch({ "ab.mov", "cd.mov", "é.mov", "ab.mov", "mov", "x.mov.mov" }));
    CHECK(find(root, "mov") == Texts { "r/mov", "r/x.mov" });
    CHECK(find(root, "vc").empty());
    CHECK(find(root, "ab") == Texts { "r/ab", "r/ab" });
    CHECK(find(root, "e") == Texts { "r/é" });
    CHECK(find(root, "").empty());
}

TEST_CASE("files made together are found as objects made by themselves are, whatever letters their names have")
{
    const Texts names { "IMG_1", "é", "ñ", "Fête à Nice", "ñandú é", "Cafe\u0301 sunset", "x\u0301", "\u0301",
        "東京の夜", "sunset é", "Ωmega", "İé", "plain" };
    const Texts queries { "e", "n", "en", "ne", "x", "fete", "cafe sunset", "sunset", "é", "à nice", "夜", "の", "ⱥb",
        "b", "img", "mov", "i", "ωmega", "plain", "in" };
    // The further ones make that not all names can be folded at once.
    for (const Texts& further : { Texts {}, Texts { "Straße e" }, Texts { "ȺB sunset" }, Texts { "Z\xfcrich n" } }) {
        Texts fileNames;
        OBMediaObjectList single;
        Texts all = names;
        all.insert(all.end(), further.begin(), further.end());
        for (const std::string& name : all) {
            fileNames.push_back(name + ".mov");
            single = single.appending(makeObject(name));
        }
        const OBMediaGroupRef together = makeGroup("-");
        together->setMediaObjects(makeBatch(fileNames));
        const OBMediaGroupRef apart = makeGroup("-");
        apart->setMediaObjects(single);
        for (const std::string& query : queries) {
            CAPTURE(query);
            CHECK(find(together, query) == find(apart, query));
        }
    }
}

TEST_CASE("an object that several groups show is found once, in the innermost of them")
{
    const OBMediaGroupRef root = makeGroup("root");
    const OBMediaGroupRef folder = makeGroup("folder");
    const OBMediaGroupRef project = makeGroup("project");
    const OBMediaGroupRef other = makeGroup("other");
    root->addChildGroup(folder);
    root->addChildGroup(other);
    folder->addChildGroup(project);
    const OBMediaObjectList batch = makeBatch({ "clip 1.mov", "clip é.mov", "clip 3.mov" });
    const OBMediaObjectRef alone = makeObject("clip alone");
    project->setMediaObjects(batch.appending(alone));
    folder->setMediaObjects(project->mediaObjects().appending(batch));
    root->setMediaObjects(folder->mediaObjects().appending(alone));
    other->setMediaObjects(OBMediaObjectList({ alone, batch[2], makeObject("clip 1") }));
    CHECK(find(root, "clip")
        == Texts { "project/clip 1", "project/clip é", "project/clip 3", "project/clip alone", "other/clip 1" });
    CHECK(countOfNames(root) == 9);
    CHECK(countOfNames(root, NameKinds::groups) == 4);
    CHECK(countOfNames(root, NameKinds::objects) == 5);
}

TEST_CASE("of a batch of which an inner group shows only the first objects, the others are found outside")
{
    const OBMediaGroupRef root = makeGroup("root");
    const OBMediaGroupRef inner = makeGroup("inner");
    const OBMediaObjectList batch = makeBatch({ "clip 1.mov", "clip 2.mov", "clip 3.mov" });
    root->setMediaObjects(batch);
    root->addChildGroup(inner);
    inner->setMediaObjects(batch.prefix(2));
    CHECK(find(root, "clip") == Texts { "root/clip 3", "inner/clip 1", "inner/clip 2" });
}

TEST_CASE("a representative is never found")
{
    const OBMediaGroupRef root = makeGroup("root");
    const OBMediaObjectRef representative = makeObject("clip");
    representative->setAttribute_forKey(true, "Project Representative");
    const OBMediaObjectList batch = makeBatch({ "clip.mov", "clip.mp4" });
    batch[1]->setAttribute_forKey(true, "Project Representative");
    root->setMediaObjects(batch.appending(representative));
    CHECK(find(root, "clip") == Texts { "root/clip" });
    CHECK(countOfNames(root, NameKinds::objects) == 1);
}

TEST_CASE("names without number are looked through as few are")
{
    const OBMediaGroupRef root = makeGroup("root");
    Texts expected;
    for (int event = 0; event < 60; ++event) {
        const OBMediaGroupRef group = makeGroup("event " + std::to_string(event));
        std::vector<std::string> fileNames;
        for (int clip = 0; clip < 60; ++clip) {
            const std::string name = "clip " + std::string(static_cast<std::size_t>(clip), '.') + std::to_string(clip);
            fileNames.push_back((clip % 7 == 0 ? "É " : "") + name + ".mov");
            if (clip == 3 || (clip >= 30 && clip < 40))
                expected.push_back(group->name().string() + "/" + (clip % 7 == 0 ? "É " : "") + name);
        }
        group->setMediaObjects(makeBatch(fileNames));
        root->addChildGroup(group);
    }
    root->setMediaObjects(root->mediaObjects());
    CHECK(find(root, ".3", NameKinds::objects) == expected);
}

TEST_CASE("of equally good hits the newest stands first and one without a date last")
{
    const OBMediaGroupRef root = makeGroup("root");
    root->setMediaObjects(OBMediaObjectList({ makeObject("undated clip"), makeObject("3 clip"), makeObject("clip"),
        makeObject("9 clip"), makeObject("also undated clip"), makeObject("9 clip of that day") }));
    FoundNames found = findNames(root, NameQuery("clip"));
    orderNewestFirst(found, [](const NameHit& hit) {
        const platform::Text name = hit.object->name();
        const char first = name.view().front();
        return first < '0' || first > '9' ? std::nullopt : std::optional(platform::Date { first - '0', 0 });
    });
    CHECK(texts(found)
        == Texts { "root/clip", "root/9 clip", "root/9 clip of that day", "root/3 clip", "root/undated clip",
            "root/also undated clip" });
}

TEST_CASE("a tree of any depth is looked through")
{
    const OBMediaGroupRef root = makeGroup("root");
    OBMediaGroupRef innermost = root;
    for (int level = 0; level < 20'000; ++level) {
        const OBMediaGroupRef child = makeGroup("level");
        innermost->addChildGroup(child);
        innermost = child;
    }
    innermost->setName("bottom");
    CHECK(find(root, "bottom") == Texts { "bottom/" });
}
