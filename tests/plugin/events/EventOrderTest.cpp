#include "plugin/events/MontaroSupport.h"

#include "plugin/MontaroConstants.h"
#include "plugin/Sorting.h"
#include "tests/plugin/support/EventMachine.h"
#include "tests/plugin/support/RecordText.h"

#include "host/OBConstants.h"

#include <doctest/doctest.h>

#include <algorithm>
#include <array>
#include <utility>
#include <vector>

using namespace tests;
using platform::Date;
using platform::Text;
using platform::Value;

namespace {

/// An event as its comparisons see it; what is not given is absent.
struct Given {
    Text name {};
    std::optional<int> year {};
    std::optional<Date> oldest {};
    std::optional<Date> newest {};
};

OBMediaGroupRef eventOf(const Given& given)
{
    OBMediaGroupRef event = OBMediaGroup::initWithTypeIdentifier(OBMontaroEventGroupTypeIdentifier);
    event->setName(given.name);
    Value::Dictionary attributes;
    if (given.year)
        attributes.emplace_back(OBMontaroEventCreationYear, *given.year);
    if (given.oldest)
        attributes.emplace_back(OBMontaroEventOldestClipDate, *given.oldest);
    if (given.newest)
        attributes.emplace_back(OBMontaroEventNewestClipDate, *given.newest);
    event->setAttributes(std::move(attributes));
    return event;
}

/// Receiver with other, and other with receiver.
using BothWays = std::array<int, 2>;
constexpr BothWays receiverFirst { -1, 1 };
constexpr BothWays otherFirst { 1, -1 };
constexpr BothWays same { 0, 0 };

template <class Comparison> BothWays bothWays(const Comparison& compare, const Given& receiver, const Given& other)
{
    const OBMediaGroupRef one = eventOf(receiver);
    const OBMediaGroupRef two = eventOf(other);
    return { compare(*one, *two), compare(*two, *one) };
}

BothWays oldestFirst(const Given& receiver, const Given& other)
{
    return bothWays(MontaroSupport::_eventComparisonByYearOldestFirst, receiver, other);
}

BothWays newestFirst(const Given& receiver, const Given& other)
{
    return bothWays(MontaroSupport::_eventComparisonByYearNewestFirst, receiver, other);
}

BothWays alphabetically(const Given& receiver, const Given& other)
{
    return bothWays(MontaroSupport::_eventComparisonAlphabetically, receiver, other);
}

std::vector<OBMediaGroupRef> inOrder(std::vector<OBMediaGroupRef> events, bool isNewestFirst)
{
    return sortedGroups(std::move(events),
        isNewestFirst ? MontaroSupport::_eventComparisonByYearNewestFirst
                      : MontaroSupport::_eventComparisonByYearOldestFirst);
}

/// The events year by year, as their years first occur; one without a year is on its own.
std::vector<OBMediaGroupRef> inYears(const std::vector<OBMediaGroupRef>& events, bool isNewestFirst)
{
    std::vector<OBMediaGroupRef> result;
    for (const OBMediaGroupRef& first : events) {
        if (std::find(result.begin(), result.end(), first) != result.end())
            continue;
        const Value year = first->attributeForKey(OBMontaroEventCreationYear);
        std::vector<OBMediaGroupRef> ofYear;
        for (const OBMediaGroupRef& event : events) {
            if (event == first || (year.integer() && event->attributeForKey(OBMontaroEventCreationYear) == year))
                ofYear.push_back(event);
        }
        for (OBMediaGroupRef& event : inOrder(std::move(ofYear), isNewestFirst))
            result.push_back(std::move(event));
    }
    return result;
}

/// Names of these events in the order that a sort gives them.
std::string sorted(const std::vector<Given>& events, bool isNewestFirst)
{
    std::vector<OBMediaGroupRef> groups;
    groups.reserve(events.size());
    for (const Given& event : events)
        groups.push_back(eventOf(event));
    const OBMediaGroupRef all = OBMediaGroup::initWithTypeIdentifier(OBMontaroRootGroupTypeIdentifier);
    all->setChildGroups(OBMediaGroupList(inOrder(std::move(groups), isNewestFirst)));
    return childNames(*all);
}

const Date march = noonOf(2010, 3);
const Date april = noonOf(2010, 4);
const Date may = noonOf(2010, 5);
const Date june = noonOf(2010, 6);

} // namespace

TEST_CASE("events compare by year first, whatever else they have")
{
    CHECK(oldestFirst({ "b", 2009, june, june }, { "a", 2011, march, march }) == receiverFirst);
    CHECK(newestFirst({ "a", 2009, june, june }, { "b", 2011, march, march }) == otherFirst);
    CHECK(oldestFirst({ "b", -1, {}, {} }, { "a", 2011, {}, {} }) == receiverFirst);
    CHECK(newestFirst({ "a", -1, {}, {} }, { "b", 2011, {}, {} }) == otherFirst);
}

TEST_CASE("an event without a year compares as the same with every other")
{
    for (const auto compared : { oldestFirst, newestFirst }) {
        CHECK(compared({ "b", {}, june, june }, { "a", 2011, march, march }) == same);
        CHECK(compared({ "b", {}, june, june }, { "a", {}, march, march }) == same);
    }
}

TEST_CASE("within a year oldest first looks at the oldest clips and newest first at the newest")
{
    const Given one { "b", 2010, march, june };
    const Given other { "a", 2010, may, may };
    CHECK(oldestFirst(one, other) == receiverFirst);
    CHECK(newestFirst(one, other) == receiverFirst);
    CHECK(oldestFirst({ "a", 2010, may, april }, { "b", 2010, march, june }) == otherFirst);
    CHECK(newestFirst({ "a", 2010, may, april }, { "b", 2010, march, june }) == otherFirst);
}

TEST_CASE("dates compare with their fractions")
{
    const Date later { march.seconds, 1 };
    CHECK(oldestFirst({ "b", 2010, march, june }, { "a", 2010, later, june }) == receiverFirst);
    CHECK(newestFirst({ "b", 2010, march, later }, { "a", 2010, march, march }) == receiverFirst);
}

TEST_CASE("events of one year of which one has no oldest clip's date compare as the same in both orders")
{
    for (const auto compared : { oldestFirst, newestFirst }) {
        CHECK(compared({ "b", 2010, {}, june }, { "a", 2010, march, march }) == same);
        CHECK(compared({ "b", 2010, {}, june }, { "a", 2010, {}, march }) == same);
    }
}

TEST_CASE("newest first, an event without a newest clip's date compares by name")
{
    CHECK(newestFirst({ "b", 2010, march, {} }, { "a", 2010, may, {} }) == otherFirst);
    CHECK(MontaroSupport::_eventComparisonByYearNewestFirst(
              *eventOf({ "a", 2010, march, {} }), *eventOf({ "b", 2010, may, june }))
        == -1);
}

TEST_CASE("events of the same dates compare by name, A to Z in both orders, without regard to case")
{
    for (const auto compared : { oldestFirst, newestFirst }) {
        CHECK(compared({ "beta", 2010, march, june }, { "Alpha", 2010, march, june }) == otherFirst);
        CHECK(compared({ "ALPHA", 2010, march, june }, { "alpha", 2010, march, june }) == same);
        CHECK(compared({ {}, 2010, march, june }, { "a", 2010, march, june }) == same);
    }
    CHECK(oldestFirst({ "a", 2010, march, may }, { "b", 2010, march, june }) == receiverFirst);
    CHECK(newestFirst({ "a", 2010, march, june }, { "b", 2010, may, june }) == receiverFirst);
}

TEST_CASE("events compare alphabetically by their names alone, and as the same where one has none")
{
    CHECK(alphabetically({ "beta", 2009, march, march }, { "Alpha", 2011, june, june }) == otherFirst);
    CHECK(alphabetically({ "É", {}, {}, {} }, { "é", {}, {}, {} }) == same);
    CHECK(alphabetically({ {}, 2009, {}, {} }, { "a", 2011, {}, {} }) == same);
    CHECK(alphabetically({ {}, 2009, {}, {} }, { {}, 2011, {}, {} }) == same);
}

TEST_CASE("newest first is not the reverse of oldest first")
{
    const std::vector<Given> events { { "a", 2010, march, june }, { "b", 2010, april, may }, { "c", 2010, may, may },
        { "d", 2009, march, march } };
    CHECK(sorted(events, false) == "d a b c");
    CHECK(sorted(events, true) == "a b c d");
}

TEST_CASE("a scan sorts events as their comparisons do, before they are put into years and within each")
{
    for (const bool isNewestFirst : { true, false }) {
        CAPTURE(isNewestFirst);
        EventMachine machine;
        machine.arrangeNewestFirst(isNewestFirst);
        for (int number = 0; number < 26; ++number) {
            const std::string name(1, static_cast<char>((number % 2 == 0 ? 'a' : 'A') + number));
            machine.undatedClip(name, "a.mov");
            if (number % 5 != 0)
                machine.clip(name, "b.mov", noonOf(2000 + number * 7 % 3, 1 + static_cast<unsigned>(number) % 4));
            if (number % 3 == 0)
                machine.clip(name, "c.mov", noonOf(2001, 12));
        }
        const auto source = machine.makeSource();
        const OBMediaGroupList years = machine.load(*source).rootMediaGroup->childGroups()[0]->childGroups();
        std::vector<OBMediaGroupRef> found;
        for (const OBMediaGroupRef& group : source->mediaGroups()) {
            if (group->typeIdentifier() == OBMontaroEventGroupTypeIdentifier)
                found.push_back(group);
        }
        REQUIRE(found.size() == 26);
        std::vector<OBMediaGroupRef> shown;
        for (const OBMediaGroupRef& year : years) {
            for (const OBMediaGroupRef& event : year->childGroups())
                shown.push_back(event);
        }
        CHECK(shown == inYears(inOrder(found, isNewestFirst), isNewestFirst));
    }
}

// An event without a year equals every other, so the way of sorting shows in the result.
TEST_CASE("an event without a year divides those that are sorted")
{
    const auto ofYear = [](const char* name, int year) { return Given { name, year, march, june }; };
    const Given without { "-", {}, {}, {} };
    CHECK(sorted({ ofYear("9", 2009), without, ofYear("11", 2011) }, true) == "9 - 11");
    CHECK(sorted({ without, ofYear("9", 2009), ofYear("11", 2011) }, true) == "- 11 9");
    CHECK(sorted({ ofYear("9", 2009), without, ofYear("10", 2010), ofYear("11", 2011) }, true) == "11 10 9 -");
    CHECK(sorted({ ofYear("11", 2011), ofYear("10", 2010), without, ofYear("9", 2009) }, false) == "10 11 - 9");
}

TEST_CASE("events that compare as the same keep the order in which they were found")
{
    EventMachine machine;
    machine.arrangeNewestFirst(false);
    machine.files.order = std::greater<>();
    for (const char* name : { "A", "c", "B" })
        machine.undatedClip(name, "a.mov");
    CHECK(machine.libraryOutline() == "-1: c(a) B(a) A(a)");
}

TEST_CASE("events of one year stand in the order of their dates and names")
{
    EventMachine machine;
    for (const char* name : { "beta", "Alpha" })
        machine.clip(name, "a.mov", noonOf(2010, 6));
    machine.clip("later", "b.mov", noonOf(2010, 7));
    machine.clip("earlier", "c.mov", noonOf(2010, 5));
    CHECK(machine.libraryOutline() == "2010: later(b) Alpha(a) beta(a) earlier(c)");
}
