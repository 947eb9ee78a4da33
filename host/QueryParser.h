#pragma once

#include "host/QueryExpression.h"

#include <optional>
#include <string>
#include <string_view>

/// An expression, or what is wrong with its text.
struct ParsedQuery {
    std::optional<QueryExpression> expression;
    std::string problem; ///< one line that begins with the column, counted in characters from 1; empty when all is well
};

ParsedQuery parseQuery(std::string_view text);
