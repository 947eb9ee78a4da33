// Events are put into years, and years into the order of their first events.
//
// The one surprise: an event without a year gets a group of its own, called 0, and none ever joins it.

#include "plugin/MontaroConstants.h"
#include "plugin/events/EventOrder.h"
#include "plugin/events/EventScan.h"

#include "host/OBConstants.h"

#include <cstdint>
#include <map>
#include <string>
#include <utility>

using platform::Text;
using platform::Value;

namespace {

OBMediaGroupRef makeYearGroup(const Value& year, const OBImageRef& icon)
{
    const Text name(std::to_string(year.integer() ? *year.integer() : 0));
    return OBMediaGroup::withFields({ .typeIdentifier = OBMontaroEventCalendarGroupTypeIdentifier,
        .name = name,
        .ID = name,
        .parentID = OBMontaro,
        .icon = icon });
}

void setYear(OBMediaGroup& group, const Value& year)
{
    Value::Dictionary attributes = group.attributes();
    if (!year.isNull())
        attributes.emplace_back(OBMontaroEventCreationYear, year);
    group.setAttributes(std::move(attributes));
}

} // namespace

void OBMontaroPlugin::groupEventsByYear(OBMediaGroup& library, const OBMediaGroupList& events, const EventScan& scan)
{
    std::map<std::int64_t, OBMediaGroupRef> groupsOfYears;
    for (const OBMediaGroupRef& event : eventsInOrder(events.elements(), _mostRecentEventFirst)) {
        if (isCancelLoadRequestPending())
            return;
        const Value year = event->attributeForKey(OBMontaroEventCreationYear);
        const auto known = year.integer() ? groupsOfYears.find(*year.integer()) : groupsOfYears.end();
        if (known != groupsOfYears.end()) {
            known->second->addChildGroup(event);
            continue;
        }
        const OBMediaGroupRef group = makeYearGroup(year, scan.calendarIcon);
        group->addChildGroup(event);
        setYear(*group, year);
        library.addChildGroup(group);
        if (year.integer())
            groupsOfYears.emplace(*year.integer(), group);
    }
}

/// The order is asked for again for each year: the editor's user may change it meanwhile.
void OBMontaroPlugin::sortEventsWithinYears(const OBMediaGroup& library)
{
    for (const OBMediaGroupRef& year : library.childGroups()) {
        if (isCancelLoadRequestPending())
            return;
        year->setChildGroups(OBMediaGroupList(eventsInOrder(year->childGroups().elements(), _mostRecentEventFirst)));
    }
}
