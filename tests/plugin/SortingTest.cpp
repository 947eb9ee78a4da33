#include "plugin/events/MontaroSupport.h"

#include "tests/plugin/support/RecordText.h"
#include "tests/plugin/support/SourceMachine.h"

#include "host/OBConstants.h"

#include <doctest/doctest.h>

using namespace tests;

namespace {

OBMediaGroupRef groupOfType(OBTypeIdentifierRef type, const platform::Text& name)
{
    OBMediaGroupRef group = OBMediaGroup::initWithTypeIdentifier(type);
    group->setName(name);
    return group;
}

int compared(const platform::Text& receiver, const platform::Text& other)
{
    return MontaroSupport::_MontaroRootGroupComparison(*groupOfType(OBMontaroProjectGroupTypeIdentifier, receiver),
        *groupOfType(OBMontaroFolderGroupTypeIdentifier, other));
}

/// The root's children after a reload that finds projects of these names, in this order; null is a group without a
/// name.
std::string sortedNames(const std::vector<const char*>& names)
{
    SourceMachine machine;
    const auto source = machine.makeSource();
    source->setRootMediaGroup(groupOfType(OBMontaroRootGroupTypeIdentifier, "Montaro"));
    const OBMediaGroupRef library = groupOfType(OBMontaroProjectGroupTypeIdentifier, "library");
    for (const char* name : names) {
        library->addChildGroup(
            groupOfType(OBMontaroProjectGroupTypeIdentifier, name ? platform::Text(name) : platform::Text()));
    }
    source->finishReloadMontaroProjects(library);
    return childNames(*source->rootMediaGroup());
}

} // namespace

TEST_CASE("groups below the root compare by name without regard to case")
{
    CHECK(compared("alpha", "Beta") == -1);
    CHECK(compared("Beta", "alpha") == 1);
    CHECK(compared("ALPHA", "alpha") == 0);
    CHECK(compared("a", "ab") == -1);
    CHECK(compared("", "a") == -1);
    CHECK(compared("", "") == 0);
}

TEST_CASE("names compare by code point after simple case folding, in no locale")
{
    CHECK(compared("ÉTÉ", "été") == 0);
    CHECK(compared("zebra", "Äpfel") == -1);
    CHECK(compared("Straße", "STRASSE") == 1);
    CHECK(compared("ſ", "S") == 0);
    CHECK(compared("10", "9") == -1);
    CHECK(compared("_", "A") == -1);
}

TEST_CASE("groups below the root of which one has no name compare as the same")
{
    CHECK(compared({}, "a") == 0);
    CHECK(compared("a", {}) == 0);
    CHECK(compared({}, {}) == 0);
}

TEST_CASE("an event library comes after every other group, with or without a name")
{
    const OBMediaGroupRef events = groupOfType(OBMontaroEventLibraryGroupTypeIdentifier, "A");
    for (const platform::Text& name : { platform::Text("z"), platform::Text() }) {
        const OBMediaGroupRef project = groupOfType(OBMontaroProjectGroupTypeIdentifier, name);
        CHECK(MontaroSupport::_MontaroRootGroupComparison(*events, *project) == 1);
        CHECK(MontaroSupport::_MontaroRootGroupComparison(*project, *events) == -1);
    }
}

TEST_CASE("of two event libraries each comes after the other")
{
    const OBMediaGroupRef one = groupOfType(OBMontaroEventLibraryGroupTypeIdentifier, "A");
    const OBMediaGroupRef other = groupOfType(OBMontaroEventLibraryGroupTypeIdentifier, "B");
    CHECK(MontaroSupport::_MontaroRootGroupComparison(*one, *other) == 1);
    CHECK(MontaroSupport::_MontaroRootGroupComparison(*other, *one) == 1);
}

TEST_CASE("a group tagged with an event library's text is none")
{
    static constexpr OBTypeIdentifier sameText("OBMontaroEventLibraryGroupTypeIdentifier");
    CHECK(MontaroSupport::_MontaroRootGroupComparison(
              *groupOfType(&sameText, "a"), *groupOfType(OBMontaroFolderGroupTypeIdentifier, "b"))
        == -1);
}

TEST_CASE("groups of equal names keep their order")
{
    CHECK(sortedNames({ "b", "A", "B", "a", "b" }) == "A a b B b");
}

// A group without a name equals every other, so the way of sorting shows in the result.
TEST_CASE("sorting merges from the top down, so an element that equals all others divides them")
{
    CHECK(sortedNames({ "c", nullptr, "b", "a" }) == "a b c -");
    CHECK(sortedNames({ "b", nullptr, "a" }) == "b - a");
    CHECK(sortedNames({ nullptr, "b", "a" }) == "- a b");
    CHECK(sortedNames({ "b", "a", nullptr }) == "a b -");
}

TEST_CASE("sorting cuts an odd number of elements after the smaller half")
{
    CHECK(sortedNames({ "c", "b", nullptr, "a", "d" }) == "b c - a d");
    CHECK(sortedNames({ "f", "e", "d", nullptr, "c", "b", "a" }) == "d e f - a b c");
}

TEST_CASE("several event libraries end in the reversed order, after everything else")
{
    SourceMachine machine;
    const auto source = machine.makeSource();
    const OBMediaGroupRef root = groupOfType(OBMontaroRootGroupTypeIdentifier, "Montaro");
    for (const char* name : { "E1", "E2", "E3" })
        root->addChildGroup(groupOfType(OBMontaroEventLibraryGroupTypeIdentifier, name));
    source->setRootMediaGroup(root);
    const OBMediaGroupRef library = groupOfType(OBMontaroProjectGroupTypeIdentifier, "library");
    library->addChildGroup(groupOfType(OBMontaroProjectGroupTypeIdentifier, "x"));
    source->finishReloadMontaroProjects(library);
    CHECK(childNames(*root) == "x E3 E2 E1");
}
