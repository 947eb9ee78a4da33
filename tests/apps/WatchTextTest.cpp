#include "apps/ombrix/WatchText.h"

#include "host/OBConstants.h"

#include <doctest/doctest.h>

#include <cstdlib>
#include <string>

namespace {

const apps::Style style { {} };

OBTreeChange change(OBTypeIdentifierRef type, const std::string& name, std::size_t before, std::size_t now)
{
    OBTreeChange made { OBMediaGroup::withFields({ .typeIdentifier = type, .name = name }), nullptr, name };
    made.objectsBefore = before;
    made.objectsNow = now;
    return made;
}

OBTreeChange object(const std::string& path)
{
    OBTreeChange made { nullptr, OBMediaObject::initWithMediaType_name(OBMediaTypeMovie, "x"), "x" };
    made.path = path;
    return made;
}

OBTreeChange event(const std::string& name, std::size_t before, std::size_t now)
{
    return change(OBMontaroEventGroupTypeIdentifier, name, before, now);
}

OBTreeChange project(const std::string& name, std::size_t before, std::size_t now)
{
    return change(OBMontaroProjectGroupTypeIdentifier, name, before, now);
}

OBTreeChange folder(const std::string& name)
{
    return change(OBMontaroFolderGroupTypeIdentifier, name, 0, 0);
}

std::string text(const OBTreeChanges& changes)
{
    return ombrix::changesText(changes, style);
}

} // namespace

TEST_CASE("what came or went is named where it is one, and counted where it is more")
{
    CHECK(text({ { event("Coast", 0, 12) }, {}, {} }) == "+ Coast (12 clips)");
    CHECK(text({ { event("a", 0, 30), event("b", 0, 1), object("/x") }, {}, {} }) == "+ 2 events, 31 clips");
    CHECK(text({ { project("a", 0, 1), project("b", 0, 0) }, {}, {} }) == "+ 2 projects, 1 movie");
    CHECK(text({ {}, { project("Draft", 0, 0) }, {} }) == "- Draft");
    CHECK(text({ { folder("Clients"), folder("Private") }, {}, {} }) == "+ 2 folders");
    CHECK(text({ { folder("Clients"), project("Draft", 0, 0) }, {}, {} }) == "+ Draft");
    CHECK(text({}) == "nothing changed");
}

TEST_CASE("what changed is told by what it holds")
{
    CHECK(text({ {}, {}, { project("Meyer", 1, 2) } }) == "~ Meyer: 1 → 2 movies");
    CHECK(text({ {}, { project("Draft", 0, 0) }, { project("Meyer", 2, 1), event("Coast", 3, 3) } })
        == "~ Meyer: 2 → 1 movie    ~ Coast    - Draft");
    CHECK(text({ {}, {}, { project("a", 1, 2), project("b", 1, 2), project("c", 1, 2) } }) == "~ 3 projects, 6 movies");
}

TEST_CASE("a publication is told with when it was heard of, how long it waited and how long it took")
{
    REQUIRE(::setenv("TZ", "UTC", 1) == 0);
    OBPublication publication;
    publication.part = "events";
    publication.cause = { "changed: /movies", { 50'546, 900'000'000 } };
    publication.beganAt = { 50'551, 850'000'000 };
    publication.duration = std::chrono::milliseconds(18);
    CHECK(ombrix::circumstancesText(publication, {}, {}, style)
        == "heard 14:02:26, waited 5.0 s, scanned in 18 ms (changed: /movies)");
    publication.cause = {};
    CHECK(ombrix::circumstancesText(publication, {}, {}, style) == "scanned in 18 ms");
}

TEST_CASE("volumes that came or went with media are called by their names")
{
    const ombrix::WatchedVolume stick { "/media/u/1", "Stick" };
    const ombrix::WatchedVolume card { "/media/u/2", "Card" };
    const OBTreeChanges came { { object("/Volumes/Stick/Montaro Events/a.mov") }, {}, {} };
    CHECK(ombrix::circumstancesText({}, came, { { stick, card }, {} }, style) == "Stick was mounted");
    const OBTreeChanges went { {}, { object("/media/u/1/a.mov"), object("/Volumes/Stick/b.mov"), object("/c.mov") },
        {} };
    CHECK(ombrix::circumstancesText({}, went, { {}, { stick, card } }, style) == "Stick went with 2 clips");
}

TEST_CASE("how much is followed is told, and what is only looked at now and then")
{
    CHECK(ombrix::followedText(8, { 1204, 0, 0 }) == "8 search folders, 1,204 folders (inotify)");
    CHECK(ombrix::followedText({}, { 1, 612, 0 }) == "1 folder (inotify), 612 folders looked at every 10 s");
    CHECK(ombrix::pollingText({ "/m", "the limit is used up", "raise it" })
        == "/m: looked at every 10 s only: the limit is used up; to mend it: raise it");
}
