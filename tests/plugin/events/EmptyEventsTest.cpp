#include "tests/plugin/support/RecordText.h"
#include "tests/plugin/support/SourceMachine.h"

#include "host/OBConstants.h"

#include <doctest/doctest.h>

using namespace tests;
using Lines = std::vector<std::string>;

TEST_CASE("an event library without events bears the parent that it is given, and its localised name as ID")
{
    SourceMachine machine;
    const auto source = machine.makeSource();
    machine.load(*source);
    CHECK(machine.text(source->_reloadMontaroEvents_updateRootMediaGroup("some parent", false)) == R"(
EventLibrary Events ID=Events parent=some parent icon=eventIcon path=- undated {}
)");
}

TEST_CASE("an events scan that does not publish leaves the root alone")
{
    SourceMachine machine;
    const auto source = machine.makeSource();
    const OBMediaGroupRef root = machine.load(*source).rootMediaGroup;
    const OBMediaGroupRef library = root->childGroups()[0];
    CHECK(source->_reloadMontaroEvents_updateRootMediaGroup("Montaro", false) != library);
    CHECK(root->childGroups().elements() == std::vector<OBMediaGroupRef> { library });
}

TEST_CASE("an events reload takes the root's ID for the library's parent")
{
    SourceMachine machine;
    const auto source = machine.makeSource();
    machine.load(*source).rootMediaGroup->setID("another ID");
    CHECK(source->_reloadMontaroEvents()->parentID() == "another ID");
}

TEST_CASE("before the first load an events reload answers an empty library and publishes nothing")
{
    SourceMachine machine;
    const auto source = machine.makeSource();
    const OBMediaGroupRef library = source->_reloadMontaroEvents();
    REQUIRE(library);
    CHECK(library->parentID().isAbsent());
    CHECK(source->rootMediaGroup() == nullptr);
}

TEST_CASE("with a cancel pending an events scan answers nothing, watches nothing and leaves the root alone")
{
    SourceMachine machine;
    const auto source = machine.makeSource();
    const OBMediaGroupRef root = machine.load(*source).rootMediaGroup;
    machine.host->pathWatcher().removeObserver(source.get());
    const HeldLoad held(machine, *source);
    source->cancelLoad();
    CHECK(source->_reloadMontaroEvents() == nullptr);
    CHECK(machine.host->pathWatcher().pathsWatchedBy(source.get()).empty());
    CHECK(childNames(*root) == "Events");
}
