// How events stand to one another.
//
// The one surprise: newest first is no mirror image of oldest first. It looks at the newest clips, it needs the oldest
// ones only to be there, and names ascend all the same.

#include "plugin/events/EventOrder.h"

#include "plugin/MontaroConstants.h"
#include "plugin/Sorting.h"
#include "plugin/events/MontaroSupport.h"

#include "host/OBTextComparison.h"

using platform::Value;

namespace {

template <class Content> int compareContents(const Content& receiver, const Content& other)
{
    return receiver < other ? -1 : other < receiver ? 1 : 0;
}

/// Of two numbers or two dates; 0 where one of them is absent.
int compareValues(const Value& receiver, const Value& other)
{
    if (receiver.integer() && other.integer())
        return compareContents(*receiver.integer(), *other.integer());
    if (receiver.date() && other.date())
        return compareContents(*receiver.date(), *other.date());
    return 0;
}

int compareNames(const platform::Text& receiver, const platform::Text& other)
{
    return receiver && other ? OBCaseInsensitiveCompare(receiver, other) : 0;
}

} // namespace

EventOrderKey::EventOrderKey(const OBMediaGroup& event)
    : year(event.attributeForKey(OBMontaroEventCreationYear))
    , oldestClip(event.attributeForKey(OBMontaroEventOldestClipDate))
    , newestClip(event.attributeForKey(OBMontaroEventNewestClipDate))
    , name(event.name())
{
}

int compareOldestFirst(const EventOrderKey& receiver, const EventOrderKey& other)
{
    if (receiver.year.isNull() || other.year.isNull())
        return 0;
    if (const int years = compareValues(receiver.year, other.year))
        return years;
    if (receiver.oldestClip.isNull() || other.oldestClip.isNull())
        return 0;
    if (const int dates = compareValues(receiver.oldestClip, other.oldestClip))
        return dates;
    return compareNames(receiver.name, other.name);
}

int compareNewestFirst(const EventOrderKey& receiver, const EventOrderKey& other)
{
    if (receiver.year.isNull() || other.year.isNull())
        return 0;
    if (const int years = compareValues(receiver.year, other.year))
        return -years;
    if (receiver.oldestClip.isNull() || other.oldestClip.isNull())
        return 0;
    if (const int dates = compareValues(receiver.newestClip, other.newestClip))
        return -dates;
    return compareNames(receiver.name, other.name);
}

std::vector<OBMediaGroupRef> eventsInOrder(const std::vector<OBMediaGroupRef>& events, bool newestFirst)
{
    std::vector<EventOrderKey> keyed;
    keyed.reserve(events.size());
    for (const OBMediaGroupRef& event : events)
        keyed.emplace_back(*event);
    std::vector<const EventOrderKey*> order;
    order.reserve(keyed.size());
    for (const EventOrderKey& key : keyed)
        order.push_back(&key);
    order = mergeSorted(std::move(order), [newestFirst](const EventOrderKey* receiver, const EventOrderKey* other) {
        return newestFirst ? compareNewestFirst(*receiver, *other) : compareOldestFirst(*receiver, *other);
    });
    std::vector<OBMediaGroupRef> sorted;
    sorted.reserve(order.size());
    for (const EventOrderKey* key : order)
        sorted.push_back(events[static_cast<std::size_t>(key - keyed.data())]);
    return sorted;
}

int MontaroSupport::_eventComparisonByYearOldestFirst(const OBMediaGroup& receiver, const OBMediaGroup& other)
{
    return compareOldestFirst(EventOrderKey(receiver), EventOrderKey(other));
}

int MontaroSupport::_eventComparisonByYearNewestFirst(const OBMediaGroup& receiver, const OBMediaGroup& other)
{
    return compareNewestFirst(EventOrderKey(receiver), EventOrderKey(other));
}

int MontaroSupport::_eventComparisonAlphabetically(const OBMediaGroup& receiver, const OBMediaGroup& other)
{
    return compareNames(receiver.name(), other.name());
}
