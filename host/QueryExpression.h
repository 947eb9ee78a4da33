#pragma once

#include "host/FileAttributes.h"
#include "host/TextPattern.h"
#include "platform/Value.h"

#include <cstdint>
#include <variant>
#include <vector>

enum class QueryOperator : std::uint8_t { equal, notEqual, less, lessOrEqual, greater, greaterOrEqual };

/// One attribute held against one value. A file that does not have the attribute is only ever not equal.
struct QueryComparison {
    const MetadataAttribute* attribute = nullptr;
    QueryOperator relation = QueryOperator::equal;
    std::variant<platform::Value, TextPattern> value; ///< a number or a date; a pattern of a text

    bool matches(FileAttributes& file) const;
};

/// A comparison, or several expressions of which all or any must match; what asks more of the disk stands later.
struct QueryExpression {
    enum class Kind : std::uint8_t { comparison, all, any };

    Kind kind = Kind::comparison;
    bool isNegated = false;
    QueryComparison comparison {}; ///< of a comparison
    std::vector<QueryExpression> parts {}; ///< of the others

    bool matches(FileAttributes& file) const;
    /// The dearest of the places that its attributes come from.
    MetadataOrigin origin() const;
    /// Puts the parts that ask less of the disk first, which changes no answer.
    void sortParts();
};
