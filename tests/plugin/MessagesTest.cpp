#include "tests/plugin/support/RecordText.h"
#include "tests/plugin/support/SourceMachine.h"

#include "host/OBConstants.h"

#include <doctest/doctest.h>

using namespace tests;

namespace {

constexpr const char* nothingFound = "No projects or events were found. They appear here once Montaro has made some.";
constexpr const char* notReady = "This project has no movies yet. Share it in Montaro, and its movies appear here.";

} // namespace

TEST_CASE("the root that a first load leaves with the empty event library shows no message")
{
    SourceMachine machine;
    const auto source = machine.makeSource();
    CHECK(source->defaultNoDataMessage(machine.load(*source).rootMediaGroup).isAbsent());
}

TEST_CASE("the root without any child group shows that nothing was found")
{
    SourceMachine machine;
    const auto source = machine.makeSource();
    const OBMediaGroupRef root = machine.load(*source).rootMediaGroup;
    source->_reloadMontaroEvents();
    REQUIRE(root->childGroups().empty());
    CHECK(source->defaultNoDataMessage(root) == nothingFound);
}

TEST_CASE("only the very root group shows that nothing was found, not another like it")
{
    SourceMachine machine;
    const auto source = machine.makeSource();
    const OBMediaGroupRef root = machine.load(*source).rootMediaGroup;
    root->setChildGroups({});
    CHECK(source->defaultNoDataMessage(root->copy()).isAbsent());
    machine.load(*source);
    CHECK(source->defaultNoDataMessage(root).isAbsent());
}

TEST_CASE("a project without children and movies shows that it is not ready, also before the first load")
{
    SourceMachine machine;
    const auto source = machine.makeSource();
    const OBMediaGroupRef project = OBMediaGroup::initWithTypeIdentifier(OBMontaroProjectGroupTypeIdentifier);
    CHECK(source->defaultNoDataMessage(project) == notReady);
    machine.projects().project("Trip");
    CHECK(source->defaultNoDataMessage(machine.load(*source).rootMediaGroup->childGroups()[0]) == notReady);
}

TEST_CASE("a project with any movie shows no message, though it may have no picture")
{
    SourceMachine machine;
    machine.projects().project("Trip").movieWithBytes("a.mov", "no movie");
    const auto source = machine.makeSource();
    CHECK(source->defaultNoDataMessage(machine.load(*source).rootMediaGroup->childGroups()[0]).isAbsent());
}

TEST_CASE("a project group with a child shows no message")
{
    SourceMachine machine;
    const auto source = machine.makeSource();
    const OBMediaGroupRef library = OBMediaGroup::initWithTypeIdentifier(OBMontaroProjectGroupTypeIdentifier);
    library->addChildGroup(OBMediaGroup::initWithTypeIdentifier(OBMontaroFolderGroupTypeIdentifier));
    CHECK(source->defaultNoDataMessage(library).isAbsent());
}

TEST_CASE("empty groups of other kinds, tags of equal text and no group at all show no message")
{
    SourceMachine machine;
    const auto source = machine.makeSource();
    static constexpr OBTypeIdentifier sameText("OBMontaroProjectGroupTypeIdentifier");
    for (const OBTypeIdentifierRef type :
        { OBMontaroFolderGroupTypeIdentifier, OBMontaroProjectLibraryGroupTypeIdentifier,
            OBMontaroEventLibraryGroupTypeIdentifier, OBMontaroEventGroupTypeIdentifier,
            OBMontaroEventCalendarGroupTypeIdentifier, &sameText, OBTypeIdentifierRef {} })
        CHECK(source->defaultNoDataMessage(OBMediaGroup::initWithTypeIdentifier(type)).isAbsent());
    CHECK(source->defaultNoDataMessage(nullptr).isAbsent());
}
