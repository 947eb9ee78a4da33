#pragma once

#include "apps/common/Output.h"
#include "host/OBMediaGroup.h"
#include "host/OBMediaObjectList.h"
#include "platform/Value.h"

namespace apps {

// One JSON document each, printed while the records are walked. Every key is always there; what is unset is null.

/// A group with everything below it, however deep.
void printGroup(Output& output, const OBMediaGroupRef& group);
/// A list of groups without what is below them.
void printGroups(Output& output, const OBMediaGroupList& groups);
void printObjects(Output& output, const OBMediaObjectList& objects);
void printValue(Output& output, const platform::Value& value);

} // namespace apps
