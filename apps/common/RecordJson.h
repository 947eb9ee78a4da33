#pragma once

#include "apps/common/NameSearch.h"
#include "apps/common/Output.h"
#include "host/OBMediaGroup.h"
#include "host/OBMediaObjectList.h"
#include "host/OBTreeChanges.h"
#include "platform/Value.h"

#include <cstddef>
#include <string_view>

namespace apps {

// One JSON document each, printed while the records are walked. Every key is always there; what is unset is null.

/// A group with everything below it, however deep.
void printGroup(Output& output, const OBMediaGroupRef& group);
/// A list of groups without what is below them.
void printGroups(Output& output, const OBMediaGroupList& groups);
void printObjects(Output& output, const OBMediaObjectList& objects);
/// The first `count` hits of a search.
void printHits(Output& output, const FoundNames& found, std::size_t count);
/// {"half", "added", "removed", "changed", "cause"}: what became of a tree, each part named like a hit of a search.
/// `half` and `cause` are null where they are empty.
void printChanges(Output& output, const OBTreeChanges& changes, std::string_view half, std::string_view cause);
void printValue(Output& output, const platform::Value& value);

} // namespace apps
