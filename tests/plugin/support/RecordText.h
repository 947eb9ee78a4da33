#pragma once

#include "host/OBMediaGroup.h"
#include "host/OBMediaObjectList.h"

#include <string>

namespace tests {

/// The modification date that tests give to what lies on their disks; shown as "dated".
inline constexpr platform::Date dateOfEverything { 1'300'000'000, 0 };

/// A group, what was set on it and what lies below it, a line each and every field in it:
/// `TYPE NAME ID=… parent=… icon=… path=… DATE {attributes}`. What is absent is "-".
std::string textOfGroup(const OBMediaGroup& group, std::size_t depth = 0);

/// `* NAME TYPE/SOURCE IDENTIFIER path=… real=… icon=… {attributes}` for each; `real` only where it is not the path.
std::string textOfObjects(const OBMediaObjectList& objects, std::size_t depth = 0);

/// The names of the groups directly below, separated by blanks; a group without a name is "-".
std::string childNames(const OBMediaGroup& group);

/// The names of media objects, separated by blanks.
std::string objectNames(const OBMediaObjectList& objects);

} // namespace tests
