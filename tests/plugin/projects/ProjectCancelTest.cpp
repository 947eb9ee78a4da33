#include "tests/plugin/support/RecordText.h"
#include "tests/plugin/support/SourceMachine.h"

#include "host/OBConstants.h"

#include <doctest/doctest.h>

using namespace tests;
using Lines = std::vector<std::string>;

namespace {

/// A machine whose source is cancelled while it lists the folder, or reads the movie, of which the path ends so.
struct CancelledMachine : SourceMachine {
    std::shared_ptr<OBMontaroPlugin> source = makeSource();

    ~CancelledMachine()
    {
        source = nullptr;
        waitForThreads();
    }

    void cancelWhenListing(const std::string& end)
    {
        files.whenListing = [this, end](std::string_view folder) {
            if (folder.ends_with(end))
                source->cancelLoad();
            return platform::FileProblem::none;
        };
    }
    void cancelWhenReading(const std::string& end)
    {
        movies.whenRead = [this, end](std::string_view path) {
            if (path.ends_with(end))
                source->cancelLoad();
        };
    }
};

/// The names of the movies whose thumbnails were produced, of the projects in `groups`.
Lines producedMovies(const OBMediaGroupList& groups)
{
    Lines names;
    for (const OBMediaGroupRef& group : groups) {
        group->ownMediaObjects().visit([&](const OBMediaObject& movie) {
            if (movie.hasProducedThumbnail())
                names.push_back(movie.name().string());
            return true;
        });
    }
    return names;
}

/// The movies that have got attributes from their headers, likewise.
Lines attributedMovies(const OBMediaGroupList& groups)
{
    Lines names;
    for (const OBMediaGroupRef& group : groups) {
        group->ownMediaObjects().visit([&](const OBMediaObject& movie) {
            if (!movie.attributeForKey(OBMediaObjectResolutionKey).isNull()
                || !movie.attributeForKey(OBMediaObjectDurationKey).isNull())
                names.push_back(movie.name().string());
            return true;
        });
    }
    return names;
}

} // namespace

TEST_CASE("a cancel lets the library at work be scanned to its end, without representatives, and reads no further one")
{
    CancelledMachine machine;
    machine.projects().project("A").movie("a.mov");
    machine.projects().project("F/Inner").movie("b.mov");
    machine.projects().folder("Z empty");
    machine.bootProjects().project("Boot");
    machine.dateEverything();
    machine.cancelWhenListing("/F");
    const OBLoadResult result = machine.load(*machine.source);
    CHECK(result.outcome == OBLoadOutcome::cancelled);
    CHECK(machine.text(result.rootMediaGroup) == R"(
Root Montaro ID=Montaro parent=- icon=smallAppIcon path=- undated {}
  * b 3/4 org.ombrix.OBMontaroPlugin path=PROJECTS/F/Inner/Shared Items/b.mov icon=projectIcon {Project Path=PROJECTS/F/Inner/Shared Items/b.mov}
  Project A ID=PROJECTS/A parent=PROJECTS icon=projectIcon path=PROJECTS/A dated {}
    * a 3/4 org.ombrix.OBMontaroPlugin path=PROJECTS/A/Shared Items/a.mov icon=projectIcon {Project Path=PROJECTS/A/Shared Items/a.mov}
  Folder F ID=PROJECTS/F parent=PROJECTS icon=projectIcon path=PROJECTS/F dated {}
    Project Inner ID=PROJECTS/F/Inner parent=PROJECTS/F icon=projectIcon path=PROJECTS/F/Inner dated {}
      * b 3/4 org.ombrix.OBMontaroPlugin path=PROJECTS/F/Inner/Shared Items/b.mov icon=projectIcon {Project Path=PROJECTS/F/Inner/Shared Items/b.mov}
  Folder Z empty ID=PROJECTS/Z empty parent=PROJECTS icon=projectIcon path=PROJECTS/Z empty dated {}
)");
    CHECK(machine.movies.pathsRead.take().empty());
    CHECK(machine.source->mediaGroups().size() == 3);
}

TEST_CASE("the library at which a cancel came is watched, those after it and the event folders are not")
{
    CancelledMachine machine;
    machine.volumes.local.store({ { "/Volumes/Data", "Data" } });
    machine.cancelWhenListing("/Data/Montaro Projects");
    machine.load(*machine.source);
    CHECK(machine.abbreviated(machine.host->pathWatcher().pathsWatchedBy(machine.source.get()))
        == Lines { "PROJECTS", "/Volumes/Data/Montaro Projects" });
}

TEST_CASE("a cancel before the first library gives a root without any children, and both queries all the same")
{
    CancelledMachine machine;
    machine.projects().project("A");
    machine.volumes.whenListed = [&] { machine.source->cancelLoad(); };
    const OBLoadResult result = machine.load(*machine.source);
    CHECK(result.outcome == OBLoadOutcome::cancelled);
    CHECK(result.rootMediaGroup == machine.source->rootMediaGroup());
    CHECK(result.rootMediaGroup->childGroups().empty());
    CHECK(machine.source->mediaGroups().empty());
    CHECK(machine.host->pathWatcher().queriesWatchedBy(machine.source.get()).size() == 2);
}

TEST_CASE("a project whose movies are being examined when a cancel comes is represented by those seen so far")
{
    CancelledMachine machine;
    machine.projects().project("F/A").movie("a1.mov", 640, 480).movie("a2.mov", 1920, 1080).movie("a3.mov", 4096, 2160);
    machine.projects().project("F/B").movie("b.mov");
    machine.projects().project("F/C sub/D").movieWithBytes("d.mov", "no movie");
    machine.cancelWhenReading("/a2.mov");
    const OBMediaGroupRef root = machine.load(*machine.source).rootMediaGroup;
    const OBMediaGroupRef folder = root->childGroups()[0];
    const OBMediaObjectList objects = folder->ownMediaObjects();
    CHECK(objectNames(objects) == "A");
    CHECK(objects[0]->path().string() == machine.projects().path("F/A/Shared Items/a2.mov"));
}

TEST_CASE("movies that a cancelled walk did not reach have neither thumbnail nor attributes")
{
    CancelledMachine machine;
    machine.projects().project("A").movie("a1.mov").movie("a2.mov").movie("a3.mov");
    machine.projects().project("B").movie("b.mov");
    machine.cancelWhenReading("/a2.mov");
    machine.load(*machine.source);
    const OBMediaGroupList groups = machine.source->mediaGroups();
    CHECK(producedMovies(groups) == Lines { "a1", "a2" });
    CHECK(attributedMovies(groups) == Lines { "a1", "a2" });
    CHECK(machine.movies.pathsRead.take().size() == 2);
}

TEST_CASE("after a cancel no further child of a folder is looked at, and what was appended stays")
{
    CancelledMachine machine;
    machine.projects().project("F/A").movie("a.mov");
    machine.projects().project("F/B").movie("b.mov");
    machine.projects().project("F/C").movie("c.mov");
    machine.cancelWhenReading("/b.mov");
    const OBMediaGroupRef root = machine.load(*machine.source).rootMediaGroup;
    CHECK(objectNames(root->childGroups()[0]->ownMediaObjects()) == "A B");
    CHECK(objectNames(root->ownMediaObjects()) == "A B");
}

TEST_CASE("a cancel in a subfolder keeps its representatives from the folders above it")
{
    CancelledMachine machine;
    machine.projects().project("F/Sub/A").movie("a.mov");
    machine.projects().project("F/Sub/B").movie("b.mov");
    machine.cancelWhenReading("/a.mov");
    const OBMediaGroupRef root = machine.load(*machine.source).rootMediaGroup;
    const OBMediaGroupRef folder = root->childGroups()[0];
    CHECK(objectNames(folder->childGroups()[0]->ownMediaObjects()) == "A");
    CHECK(folder->ownMediaObjects().empty());
}

TEST_CASE("with a cancel pending a folder is given no representative, neither a project's nor a subfolder's")
{
    SourceMachine machine;
    machine.projects().project("F/A").movie("a.mov");
    machine.projects().project("F/Sub/B").movie("b.mov");
    const auto source = machine.makeSource();
    const OBMediaGroupRef folder = machine.load(*source).rootMediaGroup->childGroups()[0];
    folder->setMediaObjects({});
    {
        const HeldLoad held(machine, *source);
        source->cancelLoad();
        source->_createMontaroProjectsFolderMediaObjects(folder);
        CHECK(folder->ownMediaObjects().empty());
    }
    source->_createMontaroProjectsFolderMediaObjects(folder);
    CHECK(objectNames(folder->ownMediaObjects()) == "A B");
}

TEST_CASE(
    "a cancel while the root's representatives are chosen ends the walk of each project, not of the root's children")
{
    CancelledMachine machine;
    machine.projects().project("A").movie("a1.mov").movie("a2.mov", 4096, 2160);
    machine.projects().project("B").movie("b.mov");
    machine.projects().project("F/C").movie("c.mov");
    machine.load(*machine.source);
    const OBMediaGroupRef root = OBMediaGroup::initWithTypeIdentifier(OBMontaroRootGroupTypeIdentifier);
    for (const OBMediaGroupRef& child : machine.source->rootMediaGroup()->childGroups())
        root->addChildGroup(child);
    const HeldLoad held(machine, *machine.source);
    // Movies that were not seen yet, so that each is read again.
    machine.movies.pathsRead.take();
    const OBMediaGroupList fresh = machine.source->_reloadMontaroProjects(false);
    CHECK(machine.movies.pathsRead.take().size() == 4);
    for (std::size_t index = 0; index < 2; ++index) {
        std::vector<OBMediaObjectRef> copies;
        for (const OBMediaObjectRef& movie : fresh[index]->ownMediaObjects().objects()) {
            OBMediaObjectRef copy = OBMediaObject::initWithMediaType_name(OBMediaTypeMovie, movie->name());
            copy->setPath(movie->path());
            copies.push_back(std::move(copy));
        }
        root->childGroups()[index]->setMediaObjects(OBMediaObjectList(copies));
    }
    machine.cancelWhenReading("/a1.mov");
    machine.source->_setMediaObjectsForRootMediaGroup(root);
    CHECK(objectNames(root->ownMediaObjects()) == "A C");
    CHECK(root->ownMediaObjects()[0]->path().string() == machine.projects().path("A/Shared Items/a1.mov"));
    CHECK(machine.movies.pathsRead.take().size() == 1);
}

TEST_CASE("with a cancel pending a publishing scan reads nothing, empties the flat list and leaves the root alone")
{
    SourceMachine machine;
    machine.projects().project("A");
    const auto source = machine.makeSource();
    const OBMediaGroupRef root = machine.load(*source).rootMediaGroup;
    machine.projects().project("B");
    const HeldLoad held(machine, *source);
    source->cancelLoad();
    Trace listed;
    machine.files.whenListing = [&](std::string_view folder) {
        listed.add(std::string(folder));
        return platform::FileProblem::none;
    };
    CHECK(source->_reloadMontaroProjects(true).empty());
    CHECK(listed.take().empty());
    machine.files.whenListing = nullptr;
    CHECK(source->mediaGroups().empty());
    CHECK(source->rootMediaGroup() == root);
    CHECK(childNames(*root) == "A Events");
}

TEST_CASE("a cancel during the last library returns all that was scanned, once each, and leaves the root alone")
{
    CancelledMachine machine;
    machine.projects().project("A");
    machine.load(*machine.source);
    const OBMediaGroupRef root = machine.source->rootMediaGroup();
    machine.bootProjects().project("B");
    const HeldLoad held(machine, *machine.source);
    machine.cancelWhenListing("/Montaro Projects");
    machine.files.whenListing = [&](std::string_view folder) {
        if (folder == "/Montaro Projects")
            machine.source->cancelLoad();
        return platform::FileProblem::none;
    };
    CHECK(machine.source->_reloadMontaroProjects(true).size() == 2);
    CHECK(childNames(*root) == "A Events");
}

TEST_CASE("a cancelled load is installed, and the next request loads again")
{
    CancelledMachine machine;
    machine.projects().project("A").movie("a.mov");
    machine.cancelWhenReading("/a.mov");
    const OBLoadResult cancelled = machine.load(*machine.source);
    CHECK(cancelled.outcome == OBLoadOutcome::cancelled);
    CHECK(childNames(*cancelled.rootMediaGroup) == "A");
    machine.movies.whenRead = nullptr;
    const OBLoadResult again = machine.load(*machine.source);
    CHECK(again.outcome == OBLoadOutcome::loaded);
    CHECK(childNames(*again.rootMediaGroup) == "A Events");
}
