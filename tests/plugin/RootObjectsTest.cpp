#include "tests/plugin/support/RecordText.h"
#include "tests/plugin/support/SourceMachine.h"

#include "host/OBConstants.h"

#include <doctest/doctest.h>

using namespace tests;
using platform::MovieHeader;
using platform::Size;

namespace {

OBMediaGroupRef groupOfType(OBTypeIdentifierRef type, const char* name)
{
    OBMediaGroupRef group = OBMediaGroup::initWithTypeIdentifier(type);
    group->setName(name);
    return group;
}

OBMediaObjectList objectsNamed(const std::vector<const char*>& names)
{
    std::vector<OBMediaObjectRef> objects;
    objects.reserve(names.size());
    for (const char* name : names)
        objects.push_back(OBMediaObject::initWithMediaType_name(OBMediaTypeMovie, name));
    return OBMediaObjectList(objects);
}

/// Which movie of a project with these, in this order, stands for it at the root; "-" for none.
std::string chosenOf(const std::vector<std::pair<const char*, std::optional<Size>>>& movies)
{
    SourceMachine machine;
    BundleBuilder project = machine.projects().project("P");
    for (const auto& [name, size] : movies) {
        project.movie(name);
        machine.movies.headers[name] = MovieHeader { size, 1.0 };
    }
    const auto source = machine.makeSource();
    const OBMediaObjectList objects = machine.load(*source).rootMediaGroup->mediaObjects();
    return objects.empty() ? "-" : machine.abbreviated(objects[0]->path().string());
}

} // namespace

TEST_CASE("the root shows one representative movie a project, with the format version")
{
    SourceMachine machine;
    machine.projects().project("Trip.v1").movie("a.mov", 1280, 720).movie("b.mov", 1920, 800);
    const auto source = machine.makeSource();
    const OBMediaGroupRef root = machine.load(*source).rootMediaGroup;
    CHECK(machine.text(root->ownMediaObjects()) == R"(
* Trip 3/4 org.ombrix.OBMontaroPlugin path=PROJECTS/Trip.v1/Shared Items/b.mov icon=thumbnail {Project Path=PROJECTS/Trip.v1, OBMediaObjectResolutionKey=1920x800, Project Format Version=6, Project Representative=true}
)");
}

TEST_CASE(
    "a representative's values have their types, its icon is its movie's thumbnail, and its properties the movie's")
{
    SourceMachine machine;
    machine.projects().project("Trip").movie("a.mov", 1280, 720);
    const auto source = machine.makeSource();
    const OBMediaGroupRef root = machine.load(*source).rootMediaGroup;
    const OBMediaObjectRef movie = root->childGroups()[0]->mediaObjects()[0];
    const OBMediaObjectRef representative = root->mediaObjects()[0];
    CHECK(representative != movie);
    CHECK(representative->attributeForKey("Project Representative") == platform::Value(true));
    CHECK(representative->attributeForKey("Project Format Version") == platform::Value("6"));
    CHECK(representative->attributeForKey(OBMediaObjectResolutionKey)
        == movie->attributeForKey(OBMediaObjectResolutionKey));
    CHECK(representative->attributeForKey(OBMediaObjectDurationKey).isNull());
    CHECK(representative->icon() != nullptr);
    CHECK(representative->icon() == movie->thumbnailImage());
    CHECK(representative->marvexProperties()->path() == movie->path());
}

TEST_CASE("of movies that are equally wide the first is chosen, though a later one is taller")
{
    CHECK(chosenOf({ { "a.mov", Size { 1280, 720 } }, { "b.mov", Size { 1280, 1088 } } })
        == "PROJECTS/P/Shared Items/a.mov");
}

TEST_CASE("a wider movie is chosen though it has fewer pixels")
{
    CHECK(chosenOf({ { "a.mov", Size { 1280, 1088 } }, { "b.mov", Size { 1920, 2 } } })
        == "PROJECTS/P/Shared Items/b.mov");
}

TEST_CASE("widths are compared to the last fraction and however large they are")
{
    CHECK(chosenOf({ { "a.mov", Size { 1920, 1 } }, { "b.mov", Size { 1920.00001, 1 } } })
        == "PROJECTS/P/Shared Items/b.mov");
    CHECK(chosenOf({ { "a.mov", Size { 4294967295.0, 1 } }, { "b.mov", Size { 1e300, 1 } },
              { "c.mov", Size { 65535.99, 9 } } })
        == "PROJECTS/P/Shared Items/b.mov");
    CHECK(chosenOf({ { "a.mov", Size { 0, 0 } }, { "b.mov", Size { 0, 5 } } }) == "PROJECTS/P/Shared Items/a.mov");
}

TEST_CASE("a movie without a resolution is never chosen")
{
    CHECK(chosenOf({ { "a.mov", std::nullopt }, { "b.mov", Size { 1, 1 } }, { "c.mov", std::nullopt } })
        == "PROJECTS/P/Shared Items/b.mov");
}

TEST_CASE("a project whose movies have no resolution has no representative")
{
    CHECK(chosenOf({ { "a.mov", std::nullopt }, { "b.mov", std::nullopt } }) == "-");
    CHECK(chosenOf({}) == "-");
}

TEST_CASE("damaged movies are never chosen")
{
    SourceMachine machine;
    machine.projects().project("P").damagedMovie("a.mov").movie("b.mov", 16, 16).movieWithBytes("c.mov", "no movie");
    const auto source = machine.makeSource();
    const OBMediaObjectList objects = machine.load(*source).rootMediaGroup->mediaObjects();
    CHECK(objects.size() == 1);
    CHECK(objects[0]->path().string() == machine.projects().path("P/Shared Items/b.mov"));
}

TEST_CASE("the root's objects follow its children: one a project, all of a folder's, none of a project library's")
{
    SourceMachine machine;
    const auto source = machine.makeSource();
    const OBMediaGroupRef root = groupOfType(OBMontaroRootGroupTypeIdentifier, "Montaro");
    root->setMediaObjects(objectsNamed({ "old" }));

    const OBMediaGroupRef folder = groupOfType(OBMontaroFolderGroupTypeIdentifier, "folder");
    folder->setMediaObjects(objectsNamed({ "f1", "f2" }));
    const OBMediaGroupRef library = groupOfType(OBMontaroProjectLibraryGroupTypeIdentifier, "library");
    library->setMediaObjects(objectsNamed({ "l1" }));
    const OBMediaGroupRef project = groupOfType(OBMontaroProjectGroupTypeIdentifier, "project");
    const OBMediaObjectList movies = objectsNamed({ "p1", "p2" });
    movies[1]->setAttribute_forKey(Size { 5, 5 }, OBMediaObjectResolutionKey);
    project->setMediaObjects(movies);
    const OBMediaGroupRef events = groupOfType(OBMontaroEventLibraryGroupTypeIdentifier, "events");
    const OBMediaGroupRef event = groupOfType(OBMontaroEventGroupTypeIdentifier, "event");
    event->setMediaObjects(objectsNamed({ "e1", "e2" }));
    events->addChildGroup(event);
    const OBMediaGroupRef untagged = groupOfType(nullptr, "untagged");
    untagged->setMediaObjects(objectsNamed({ "u1" }));
    root->setChildGroups(OBMediaGroupList({ folder, library, project, events, untagged }));

    source->_setMediaObjectsForRootMediaGroup(root);
    CHECK(objectNames(root->ownMediaObjects()) == "f1 f2 project e1 e2 u1");
}

TEST_CASE("a group tagged with an equal text is no project to the root")
{
    SourceMachine machine;
    const auto source = machine.makeSource();
    static constexpr OBTypeIdentifier sameText("OBMontaroProjectGroupTypeIdentifier");
    const OBMediaGroupRef root = groupOfType(OBMontaroRootGroupTypeIdentifier, "Montaro");
    const OBMediaGroupRef child = groupOfType(&sameText, "child");
    child->setMediaObjects(objectsNamed({ "1", "2" }));
    root->addChildGroup(child);
    source->_setMediaObjectsForRootMediaGroup(root);
    CHECK(objectNames(root->ownMediaObjects()) == "1 2");
}

TEST_CASE("a folder without representatives gives the root the movies that lie below it")
{
    SourceMachine machine;
    machine.projects().project("Folder/A").movieWithBytes("a.mov", "no movie").movieWithBytes("b.mov", "none either");
    const auto source = machine.makeSource();
    const OBMediaGroupRef root = machine.load(*source).rootMediaGroup;
    CHECK(root->childGroups()[0]->ownMediaObjects().empty());
    CHECK(objectNames(root->ownMediaObjects()) == "a b");
}

TEST_CASE("the representatives of projects directly below the root are made anew, those of folders are the folder's")
{
    SourceMachine machine;
    machine.projects().project("A").movie("a.mov");
    machine.projects().project("Folder/B").movie("b.mov");
    const auto source = machine.makeSource();
    const OBMediaGroupRef root = machine.load(*source).rootMediaGroup;
    const OBMediaObjectList objects = root->ownMediaObjects();
    CHECK(objectNames(objects) == "A B");
    CHECK_FALSE(objects[0]->attributeForKey("Project Format Version").isNull());
    CHECK(objects[1] == root->childGroups()[1]->ownMediaObjects()[0]);
    CHECK(objects[1]->attributeForKey("Project Format Version").isNull());
}
