#include "tests/plugin/support/RecordText.h"
#include "tests/plugin/support/SourceMachine.h"

#include "host/OBConstants.h"

#include <doctest/doctest.h>

using namespace tests;

namespace {

OBMediaGroupRef groupOfType(OBTypeIdentifierRef type, const char* name)
{
    OBMediaGroupRef group = OBMediaGroup::initWithTypeIdentifier(type);
    group->setName(name);
    return group;
}

OBMediaGroupRef project(const char* name)
{
    return groupOfType(OBMontaroProjectGroupTypeIdentifier, name);
}

OBMediaGroupRef events(const char* name)
{
    return groupOfType(OBMontaroEventLibraryGroupTypeIdentifier, name);
}

/// An event library with a clip somewhere below it.
OBMediaGroupRef eventsWithClip(const char* name)
{
    const OBMediaGroupRef event = groupOfType(OBMontaroEventGroupTypeIdentifier, "event");
    event->setMediaObjects(OBMediaObjectList({ OBMediaObject::initWithMediaType_name(OBMediaTypeMovie, "clip") }));
    const OBMediaGroupRef year = groupOfType(OBMontaroEventCalendarGroupTypeIdentifier, "2011");
    year->addChildGroup(event);
    OBMediaGroupRef library = events(name);
    library->addChildGroup(year);
    return library;
}

/// A source whose installed root has these children.
struct InstalledRoot {
    explicit InstalledRoot(std::vector<OBMediaGroupRef> children)
    {
        root->setChildGroups(OBMediaGroupList(std::move(children)));
        source->setRootMediaGroup(root);
    }
    std::string childrenAfter(const OBMediaGroupRef& library) const
    {
        source->finishReloadMontaroEvents(library);
        return childNames(*root);
    }

    SourceMachine machine {};
    const std::shared_ptr<OBMontaroPlugin> source = machine.makeSource();
    const OBMediaGroupRef root = groupOfType(OBMontaroRootGroupTypeIdentifier, "Montaro");
};

} // namespace

TEST_CASE("an events reload puts the new library in place of the old and sorts, keeping the very projects")
{
    const OBMediaGroupRef projectA = project("A");
    const InstalledRoot installed({ project("b"), events("old"), projectA });
    const OBMediaGroupRef library = eventsWithClip("new");
    CHECK(installed.childrenAfter(library) == "A b new");
    CHECK(installed.root->childGroups()[0] == projectA);
    CHECK(installed.root->childGroups()[2] == library);
}

TEST_CASE("an events reload without clips takes the old library out")
{
    CHECK(InstalledRoot({ project("A"), events("old"), project("B") }).childrenAfter(events("new")) == "A B");
}

TEST_CASE("an events reload without a library takes the old one out")
{
    CHECK(InstalledRoot({ project("A"), eventsWithClip("old") }).childrenAfter(nullptr) == "A");
}

TEST_CASE("an events reload adds the library where the root had none")
{
    CHECK(InstalledRoot({ project("b"), project("A") }).childrenAfter(eventsWithClip("new")) == "A b new");
    CHECK(InstalledRoot({}).childrenAfter(eventsWithClip("new")) == "new");
}

TEST_CASE("an events reload puts the library in the place of each old one")
{
    CHECK(InstalledRoot({ events("one"), project("A"), events("two") }).childrenAfter(eventsWithClip("new"))
        == "A new new");
}

TEST_CASE("an events reload keeps a group tagged with an equal text")
{
    static constexpr OBTypeIdentifier sameText("OBMontaroEventLibraryGroupTypeIdentifier");
    CHECK(InstalledRoot({ groupOfType(&sameText, "alike"), events("old") }).childrenAfter(events("new")) == "alike");
}

TEST_CASE("an events reload before the first load changes nothing")
{
    SourceMachine machine;
    const auto source = machine.makeSource();
    source->finishReloadMontaroEvents(eventsWithClip("new"));
    CHECK(source->rootMediaGroup() == nullptr);
}

TEST_CASE("a cancel that is pending when the new children have been sorted leaves the root as it was")
{
    SourceMachine machine;
    const auto source = machine.makeSource();
    machine.load(*source);
    const OBMediaGroupRef root = source->rootMediaGroup();
    root->setChildGroups(OBMediaGroupList({ project("b"), events("old"), project("A") }));
    const HeldLoad held(machine, *source);
    source->cancelLoad();
    source->finishReloadMontaroEvents(eventsWithClip("new"));
    CHECK(childNames(*root) == "b old A");
}

TEST_CASE("an events reload publishes the installed root with its objects rebuilt")
{
    SourceMachine machine;
    machine.projects().project("a").movie("a.mov");
    const auto source = machine.makeSource();
    const OBMediaGroupRef root = machine.load(*source).rootMediaGroup;
    root->setMediaObjects({});
    Trace published;
    OBManagerCallbacks callbacks;
    callbacks.rootPublished = [&](const OBMediaGroupRef& group) {
        published.add((group == root ? "same root: " : "another root: ") + childNames(*group) + " | "
            + objectNames(group->ownMediaObjects()));
    };
    const OBObservation observation
        = source->observe([](const std::function<void()>& call) { call(); }, std::move(callbacks));
    source->_reloadMontaroEvents();
    CHECK(published.take() == std::vector<std::string> { "same root: a | a" });
}
