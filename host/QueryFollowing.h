#pragma once

#include "platform/Value.h"

#include <functional>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

class FrameworkCore;
class OBMetadataQuery;

/// Follows the result of a query over the folders of `scope` until the answer is destroyed: `tell` is called with the
/// name of a notification once everything is followed, and whenever files may have come into the result or left it.
///
/// A query that asks only for what a path tells keeps no table: the change decides. `core` outlives the answer.
std::shared_ptr<void> followQuery(FrameworkCore& core, const std::shared_ptr<const OBMetadataQuery>& query,
    const std::vector<std::string>& scope, platform::Date since,
    const std::function<void(std::string_view name)>& tell);
