#include "host/OBMediaGroup.h"
#include "host/OBSnapshotList.h"

#include <doctest/doctest.h>

#include <atomic>
#include <cstddef>
#include <string>
#include <string_view>
#include <thread>
#include <utility>
#include <vector>

namespace {

/// Counts how often elements are copied or moved.
struct Counted {
    explicit Counted(int initial)
        : number(initial)
    {
    }
    Counted(const Counted& other)
        : number(other.number)
    {
        ++copies;
    }
    Counted(Counted&& other) noexcept
        : number(other.number)
    {
        ++copies;
    }
    Counted& operator=(const Counted&) = default;
    Counted& operator=(Counted&&) = default;
    ~Counted() = default;

    int number;
    static inline std::size_t copies = 0;
};

using Numbers = OBSnapshotList<int>;
using Vector = std::vector<int>;

OBMediaGroupRef chain(int levels)
{
    OBMediaGroupRef top;
    for (int level = 0; level < levels; ++level) {
        auto group = OBMediaGroup::initWithTypeIdentifier(OBMontaroFolderGroupTypeIdentifier);
        group->addChildGroup(std::move(top));
        top = std::move(group);
    }
    return top;
}

int levelsOf(OBMediaGroupRef group)
{
    int levels = 0;
    for (; group; ++levels) {
        const OBMediaGroupList children = group->childGroups();
        group = children.empty() ? nullptr : children[0];
    }
    return levels;
}

constexpr int deep = 200'000;

} // namespace

TEST_CASE("a list without elements is empty and has nothing to visit")
{
    const Numbers list;
    CHECK(list.empty());
    CHECK(list.begin() == list.end());
    CHECK(Numbers(Vector {}).elements().empty());
    CHECK_FALSE(list.isSoleOwner());
}

TEST_CASE("appending answers a longer list and leaves the shorter one as it is")
{
    const Numbers first = Numbers(Vector { 1, 2 });
    const Numbers second = first.appending(3);
    CHECK(first.elements() == Vector { 1, 2 });
    CHECK(second.elements() == Vector { 1, 2, 3 });
    CHECK(second[2] == 3);
    CHECK(first.appending(second).elements() == Vector { 1, 2, 1, 2, 3 });
    CHECK(Numbers().appending(first).elements() == Vector { 1, 2 });
    CHECK(first.appending(Numbers()).elements() == Vector { 1, 2 });
    CHECK(second.appending(second).elements() == Vector { 1, 2, 3, 1, 2, 3 });
}

TEST_CASE("two lists extended from the same prefix do not disturb one another")
{
    Numbers prefix;
    for (int number = 0; number < 5; ++number)
        prefix = prefix.appending(number);
    const Numbers left = prefix.appending(10).appending(11);
    const Numbers right = prefix.appending(20).appending(21);
    const Numbers again = left.appending(12);
    CHECK(prefix.elements() == Vector { 0, 1, 2, 3, 4 });
    CHECK(left.elements() == Vector { 0, 1, 2, 3, 4, 10, 11 });
    CHECK(right.elements() == Vector { 0, 1, 2, 3, 4, 20, 21 });
    CHECK(again.elements() == Vector { 0, 1, 2, 3, 4, 10, 11, 12 });
}

TEST_CASE("building a list element by element copies a number of elements in proportion to its length")
{
    constexpr std::size_t count = 100'000;
    OBSnapshotList<Counted> list;
    Counted::copies = 0;
    for (std::size_t index = 0; index < count; ++index)
        list = list.appending(Counted(static_cast<int>(index)));
    CHECK(list.size() == count);
    CHECK(list[count - 1].number == static_cast<int>(count) - 1);
    CHECK(Counted::copies < 8 * count);
}

TEST_CASE("many threads may extend one list at once, each getting its own continuation")
{
    constexpr int threadCount = 4;
    constexpr int rounds = 2000;
    Numbers prefix;
    for (int number = 0; number < 5; ++number)
        prefix = prefix.appending(number);
    std::vector<std::thread> threads;
    std::atomic<int> wrong { 0 };
    for (int mark = 100; mark < 100 + threadCount; ++mark) {
        threads.emplace_back([&wrong, prefix, mark] {
            for (int round = 0; round < rounds; ++round) {
                const Numbers mine = prefix.appending(mark).appending(mark);
                if (mine.elements() != Vector { 0, 1, 2, 3, 4, mark, mark })
                    ++wrong;
            }
        });
    }
    for (std::thread& thread : threads)
        thread.join();
    CHECK(wrong == 0);
}

TEST_CASE("a reader keeps the list it has while another thread appends thousands")
{
    constexpr int additions = 5000;
    const auto parent = OBMediaGroup::initWithTypeIdentifier(OBMontaroFolderGroupTypeIdentifier);
    for (int index = 0; index < 3; ++index)
        parent->addChildGroup(OBMediaGroup::initWithTypeIdentifier(OBMontaroProjectGroupTypeIdentifier));
    const OBMediaGroupList kept = parent->childGroups();
    const std::vector<OBMediaGroupRef> before = kept.elements();
    std::atomic<bool> isDone { false };
    std::thread writer([&parent, &isDone] {
        for (int index = 0; index < additions; ++index) {
            auto group = OBMediaGroup::initWithTypeIdentifier(OBMontaroProjectGroupTypeIdentifier);
            group->setName(std::to_string(index));
            parent->addChildGroup(std::move(group));
        }
        isDone = true;
    });
    std::size_t shrunk = 0;
    std::size_t changed = 0;
    std::size_t seen = 0;
    do {
        const OBMediaGroupList now = parent->childGroups();
        shrunk += now.size() < seen ? 1 : 0;
        seen = now.size();
        changed += now[seen - 1]->typeIdentifier() == OBMontaroProjectGroupTypeIdentifier ? 0 : 1;
        changed += kept.elements() == before ? 0 : 1;
    } while (!isDone);
    writer.join();
    CHECK(shrunk == 0);
    CHECK(changed == 0);
    CHECK(kept.size() == 3);
    CHECK(parent->childGroups().size() == 3 + additions);
}

TEST_CASE("a reader sees each field of a group before or after a change")
{
    const auto group = OBMediaGroup::initWithTypeIdentifier(OBMontaroFolderGroupTypeIdentifier);
    const std::string first(100, 'a');
    const std::string second(200, 'b');
    group->setName(first);
    group->setAttributes({ { "key", platform::Value(platform::Text(first)) } });
    std::thread writer([&] {
        for (int round = 0; round < 3000; ++round) {
            const std::string& text = round % 2 == 0 ? second : first;
            group->setName(text);
            group->setPath(text);
            group->setAttributes({ { "key", platform::Value(platform::Text(text)) } });
        }
    });
    int mixed = 0;
    for (int round = 0; round < 3000; ++round) {
        const std::string name = group->name().string();
        mixed += name == first || name == second ? 0 : 1;
        const platform::Value value = group->attributeForKey("key");
        mixed += value == platform::Value(std::string_view(first)) || value == platform::Value(std::string_view(second))
            ? 0
            : 1;
    }
    writer.join();
    CHECK(mixed == 0);
}

TEST_CASE("a tree two hundred thousand levels deep is released")
{
    OBMediaGroupRef top = chain(deep);
    const std::weak_ptr<OBMediaGroup> watched = top->childGroups()[0];
    top = nullptr;
    CHECK(watched.expired());
}

TEST_CASE("a deep tree whose child list somebody else still holds is left whole")
{
    OBMediaGroupRef top = chain(deep);
    const OBMediaGroupList held = top->childGroups();
    top = nullptr;
    REQUIRE(held.size() == 1);
    CHECK(levelsOf(held[0]) == deep - 1);
}

TEST_CASE("a deep tree of which somebody else holds a group in the middle is left whole below that")
{
    OBMediaGroupRef top = chain(deep);
    OBMediaGroupRef middle = top;
    for (int level = 0; level < deep / 2; ++level)
        middle = OBMediaGroupRef(middle->childGroups()[0]);
    top = nullptr;
    CHECK(levelsOf(middle) == deep - deep / 2);
}

TEST_CASE("a deep tree is released when it is replaced in the list of its parent")
{
    const auto parent = OBMediaGroup::initWithTypeIdentifier(OBMontaroRootGroupTypeIdentifier);
    parent->addChildGroup(chain(deep));
    const std::weak_ptr<OBMediaGroup> watched = parent->childGroups()[0];
    parent->setChildGroups({});
    CHECK(watched.expired());
}

TEST_CASE("the media objects of a tree as deep as a path can be are answered and visited")
{
    constexpr std::size_t levels = 2000;
    OBMediaGroupRef top;
    for (std::size_t level = 0; level < levels; ++level) {
        const auto movies = OBMediaGroup::initWithTypeIdentifier(OBMontaroProjectGroupTypeIdentifier);
        const auto movie = OBMediaObject::initWithMediaType_name(OBMediaTypeMovie, "movie");
        movies->setMediaObjects(OBMediaObjectList().appending(movie));
        auto group = OBMediaGroup::initWithTypeIdentifier(OBMontaroFolderGroupTypeIdentifier);
        group->addChildGroup(movies);
        group->addChildGroup(std::move(top));
        top = std::move(group);
    }
    const OBMediaObjectList objects = top->mediaObjects();
    top = nullptr;
    CHECK(objects.size() == levels);
    CHECK(objects[levels - 1]->name() == "movie");
    std::size_t seen = 0;
    objects.visit([&seen](OBMediaObject&) { return ++seen != 0; });
    CHECK(seen == levels);
}
