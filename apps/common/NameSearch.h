#pragma once

#include "apps/common/NameQuery.h"
#include "host/OBMediaGroup.h"
#include "host/OBMediaObject.h"
#include "platform/Value.h"

#include <cstddef>
#include <cstdint>
#include <functional>
#include <optional>
#include <vector>

namespace apps {

/// What to look through.
enum class NameKinds { all, groups, objects };

/// A group of a tree that was laid flat, depth first.
struct FlatGroup {
    OBMediaGroupRef group;
    std::size_t parent = 0; ///< index of the group that holds it; its own for the first
    std::size_t depth = 0;
};

/// A group or media object whose name holds what was looked for.
struct NameHit {
    OBMediaObjectRef object {}; ///< null where a group was found
    std::size_t group = 0; ///< index of the group found, or of the innermost one that the object was set on
    std::uint32_t position = 0; ///< of the object among those set on the group, from 1 on; 0 where a group was found
    NameMatch match = NameMatch::inside;
};

/// What was found, best first, and the groups that it lies in.
struct FoundNames {
    std::vector<FlatGroup> groups {};
    std::vector<NameHit> hits {};
};

/// Looks through the names of `root`, which is not null, and of everything below it. Equal matches stand in tree order:
/// a group before its own objects, these before its child groups.
///
/// An object is found once, in the innermost group that it was set on: groups of groups repeat the objects below them.
/// A representative is never found; it stands for a movie that is found itself. Any thread.
FoundNames findNames(const OBMediaGroupRef& root, const NameQuery& query, NameKinds kinds = NameKinds::all);

/// Puts equal matches in the order of their dates, the newest first and those without a date last.
void orderNewestFirst(FoundNames& found, const std::function<std::optional<platform::Date>(const NameHit&)>& dateOf);

/// How many names `findNames` looks through, each object counted once.
std::size_t countOfNames(const OBMediaGroupRef& root, NameKinds kinds = NameKinds::all);

} // namespace apps
