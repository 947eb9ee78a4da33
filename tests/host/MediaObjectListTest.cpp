#include "host/OBMediaObjectList.h"

#include <doctest/doctest.h>

#include <algorithm>
#include <string>
#include <thread>
#include <vector>

namespace {

using Names = std::vector<std::string>;

OBMediaObjectRef objectNamed(const std::string& name)
{
    return OBMediaObject::initWithMediaType_name(3, name);
}

OBMediaObjectList listOf(const Names& names)
{
    OBMediaObjectList list;
    for (const std::string& name : names)
        list = list.appending(objectNamed(name));
    return list;
}

OBMediaObjectList filesOf(const Names& names)
{
    std::vector<OBFileOfFolder> files;
    for (const std::string& name : names)
        files.push_back({ name, true });
    return OBMediaObjectBatch::objects(std::make_shared<const OBMediaObjectKind>(), { "/folder", true }, files);
}

Names visited(const OBMediaObjectList& list)
{
    Names names;
    list.visit([&names](OBMediaObject& object) {
        names.push_back(object.name().string());
        return true;
    });
    return names;
}

Names indexed(const OBMediaObjectList& list)
{
    Names names;
    for (std::size_t index = 0; index < list.size(); ++index)
        names.push_back(list[index]->name().string());
    return names;
}

} // namespace

TEST_CASE("an empty list of objects visits nothing")
{
    const OBMediaObjectList list;
    CHECK(list.empty());
    CHECK(visited(list).empty());
    CHECK(list.objects().empty());
    CHECK(list.prefix(3).empty());
    CHECK(list.appending(list).empty());
    CHECK(filesOf({}).empty());
}

TEST_CASE("appending an object leaves the shorter list as it is")
{
    const OBMediaObjectList first = listOf({ "a", "b" });
    const OBMediaObjectList second = first.appending(objectNamed("c"));
    CHECK(visited(first) == Names { "a", "b" });
    CHECK(visited(second) == Names { "a", "b", "c" });
    CHECK(first[1] == second[1]);
}

TEST_CASE("two lists of objects extended from the same one do not disturb one another")
{
    const OBMediaObjectList prefix = listOf({ "a", "b", "c" });
    const OBMediaObjectList left = prefix.appending(objectNamed("left"));
    const OBMediaObjectList right = prefix.appending(objectNamed("right"));
    CHECK(visited(prefix) == Names { "a", "b", "c" });
    CHECK(visited(left) == Names { "a", "b", "c", "left" });
    CHECK(visited(right) == Names { "a", "b", "c", "right" });
}

TEST_CASE("lists may be made of lists, and index and visit run across all parts alike")
{
    const OBMediaObjectList inner = listOf({ "b" }).appending(filesOf({ "c.mov", "d.mov" }));
    const OBMediaObjectList outer = listOf({ "a" }).appending(inner).appending(objectNamed("e")).appending(inner);
    const Names expected { "a", "b", "c", "d", "e", "b", "c", "d" };
    CHECK(outer.size() == 8);
    CHECK(visited(outer) == expected);
    CHECK(indexed(outer) == expected);
    CHECK(outer.objects().size() == 8);
    CHECK(outer[1] == outer[5]);
}

TEST_CASE("a list made of lists shares their objects")
{
    const OBMediaObjectList part = filesOf({ "a.mov", "b.mov" });
    const OBMediaObjectList whole = listOf({ "x" }).appending(part);
    CHECK(whole[1] == part[0]);
    CHECK(whole[2] == part[1]);
    CHECK(OBMediaObjectList().appending(part)[0] == part[0]);
    CHECK(part.appending(OBMediaObjectList())[1] == part[1]);
}

TEST_CASE("an object keeps its folder's block alive after the list is gone")
{
    OBMediaObjectRef object;
    {
        const OBMediaObjectList list = filesOf({ "a.mov", "b.mov" });
        object = list[1];
    }
    CHECK(object->name() == "b");
    CHECK(object->path() == "/folder/b.mov");
}

TEST_CASE("a list keeps showing what it showed when one that it was appended to grows")
{
    OBMediaObjectList part = listOf({ "a" });
    const OBMediaObjectList whole = listOf({ "x" }).appending(part);
    part = part.appending(objectNamed("b"));
    CHECK(visited(whole) == Names { "x", "a" });
    CHECK(visited(whole.appending(part)) == Names { "x", "a", "a", "b" });
}

TEST_CASE("a prefix holds the first objects, wherever it cuts")
{
    const OBMediaObjectList list = listOf({ "a" }).appending(filesOf({ "b.mov", "c.mov" })).appending(listOf({ "d" }));
    const Names all { "a", "b", "c", "d" };
    for (std::size_t count = 0; count <= 5; ++count) {
        const OBMediaObjectList prefix = list.prefix(count);
        const Names expected(all.begin(), all.begin() + static_cast<std::ptrdiff_t>(std::min(count, all.size())));
        CHECK(visited(prefix) == expected);
        CHECK(indexed(prefix) == expected);
    }
}

TEST_CASE("a prefix that is extended does not show what came behind it")
{
    const OBMediaObjectList list = listOf({ "a", "b", "c" });
    const OBMediaObjectList extended = list.prefix(2).appending(objectNamed("z")).appending(objectNamed("y"));
    CHECK(visited(extended) == Names { "a", "b", "z", "y" });
    CHECK(indexed(extended) == Names { "a", "b", "z", "y" });
    CHECK(visited(list) == Names { "a", "b", "c" });
    CHECK(visited(list.prefix(2).appending(list.prefix(1))) == Names { "a", "b", "a" });
}

TEST_CASE("a visit ends where the visitor says so, in every kind of part")
{
    const OBMediaObjectList list
        = listOf({ "a" }).appending(filesOf({ "b.mov", "c.mov" })).appending(listOf({ "d", "e" }));
    const Names all { "a", "b", "c", "d", "e" };
    for (std::size_t stop = 1; stop <= all.size(); ++stop) {
        Names seen;
        list.visit([&](OBMediaObject& object) {
            seen.push_back(object.name().string());
            return seen.size() < stop;
        });
        CHECK(seen == Names(all.begin(), all.begin() + static_cast<std::ptrdiff_t>(stop)));
    }
}

TEST_CASE("a list made of a vector of objects holds them in order")
{
    const std::vector<OBMediaObjectRef> objects { objectNamed("a"), objectNamed("b"), objectNamed("a") };
    const OBMediaObjectList list(objects);
    CHECK(list.objects() == objects);
}

TEST_CASE("a list of a hundred thousand objects is built one by one in time for a test")
{
    constexpr std::size_t count = 100'000;
    OBMediaObjectList list;
    for (std::size_t index = 0; index < count; ++index)
        list = list.appending(objectNamed("movie"));
    std::size_t seen = 0;
    list.visit([&seen](OBMediaObject&) { return ++seen != 0; });
    CHECK(seen == count);
    CHECK(list[count / 2]->name() == "movie");
}

TEST_CASE("a list of objects may be read while another thread makes longer ones from it")
{
    constexpr int additions = 3000;
    const OBMediaObjectList start = listOf({ "a", "b", "c" });
    std::thread writer([start] {
        OBMediaObjectList mine = start;
        for (int index = 0; index < additions; ++index)
            mine = mine.appending(OBMediaObject::initWithMediaType_name(3, "more"));
        CHECK(mine.size() == 3 + additions);
    });
    int changed = 0;
    for (int round = 0; round < 1000; ++round)
        changed += visited(start) == Names { "a", "b", "c" } ? 0 : 1;
    writer.join();
    CHECK(changed == 0);
}

TEST_CASE("a list shows the batches and the objects that it is made of, in order")
{
    class Runs final : public OBMediaObjectRunVisitor {
    public:
        void visitBatch(const OBMediaObjectBatch& batch, std::size_t count) override
        {
            texts.emplace_back(batch.fileNames(count));
        }
        void visitObject(const OBMediaObjectRef& object) override { texts.push_back(object->name().string()); }
        std::vector<std::string> texts;
    };
    const std::vector<OBFileOfFolder> files { { "a.mov", true }, { "bc.mov", true }, { "d.mov", true } };
    const OBMediaObjectList batch
        = OBMediaObjectBatch::objects(std::make_shared<OBMediaObjectKind>(), { "/f", true }, files);
    const auto alone = objectNamed("alone");
    const OBMediaObjectList list = batch.prefix(2).appending(alone).appending(batch.appending(alone));
    Runs runs;
    list.visitRuns(runs);
    CHECK(runs.texts == std::vector<std::string> { "a.movbc.mov", "alone", "a.movbc.movd.mov", "alone" });
    Runs none;
    OBMediaObjectList().visitRuns(none);
    list.prefix(1).visitRuns(none);
    CHECK(none.texts == std::vector<std::string> { "a.mov" });
}

TEST_CASE("the object to which a byte of the file names belongs is found, however unequal they are")
{
    class Batch final : public OBMediaObjectRunVisitor {
    public:
        void visitBatch(const OBMediaObjectBatch& shown, std::size_t) override { batch = &shown; }
        void visitObject(const OBMediaObjectRef&) override { }
        const OBMediaObjectBatch* batch = nullptr;
    };
    std::vector<std::string> names;
    for (std::size_t index = 0; index < 200; ++index)
        names.emplace_back(index < 150 ? 1 : 60, 'n');
    std::vector<OBFileOfFolder> files;
    files.reserve(names.size());
    for (const std::string& name : names)
        files.push_back({ name, true });
    const OBMediaObjectList list
        = OBMediaObjectBatch::objects(std::make_shared<OBMediaObjectKind>(), { "/f", true }, files);
    Batch shown;
    list.visitRuns(shown);
    REQUIRE(shown.batch);
    std::size_t offset = 0;
    for (std::size_t index = 0; index < names.size(); ++index) {
        CHECK(shown.batch->indexOfFileNameAt(offset) == index);
        offset += names[index].size();
        CHECK(shown.batch->indexOfFileNameAt(offset - 1) == index);
    }
}
