#include "host/QueryExpression.h"

#include <algorithm>
#include <compare>

namespace {

using platform::Value;

double realOf(const Value& number)
{
    return number.integer() ? static_cast<double>(*number.integer()) : *number.real();
}

/// How two numbers, or two dates, stand to each other; not at all where one of them is missing.
std::partial_ordering compared(const Value& left, const Value& right)
{
    if (left.isNull())
        return std::partial_ordering::unordered;
    if (left.date() && right.date())
        return *left.date() <=> *right.date();
    if (left.integer() && right.integer())
        return *left.integer() <=> *right.integer();
    return realOf(left) <=> realOf(right);
}

bool holds(QueryOperator relation, std::partial_ordering order)
{
    switch (relation) {
    case QueryOperator::equal:
        return order == 0;
    case QueryOperator::notEqual:
        return order != 0;
    case QueryOperator::less:
        return order < 0;
    case QueryOperator::lessOrEqual:
        return order <= 0;
    case QueryOperator::greater:
        return order > 0;
    case QueryOperator::greaterOrEqual:
        break;
    }
    return order >= 0;
}

} // namespace

bool QueryComparison::matches(FileAttributes& file) const
{
    if (const Value* wanted = std::get_if<Value>(&value))
        return holds(relation, compared(file.fact(*attribute), *wanted));
    const std::optional<std::string_view> text = file.text(*attribute);
    const bool isEqual = text && std::get<TextPattern>(value).matches(*text);
    return isEqual == (relation == QueryOperator::equal);
}

bool QueryExpression::matches(FileAttributes& file) const
{
    const auto partMatches = [&file](const QueryExpression& part) { return part.matches(file); };
    bool isMatch = false;
    if (kind == Kind::comparison)
        isMatch = comparison.matches(file);
    else if (kind == Kind::all)
        isMatch = std::all_of(parts.begin(), parts.end(), partMatches);
    else
        isMatch = std::any_of(parts.begin(), parts.end(), partMatches);
    return isMatch != isNegated;
}

MetadataOrigin QueryExpression::origin() const
{
    if (kind == Kind::comparison)
        return comparison.attribute->origin;
    MetadataOrigin dearest = MetadataOrigin::path;
    for (const QueryExpression& part : parts)
        dearest = std::max(dearest, part.origin());
    return dearest;
}

void QueryExpression::sortParts()
{
    std::stable_sort(parts.begin(), parts.end(),
        [](const QueryExpression& left, const QueryExpression& right) { return left.origin() < right.origin(); });
}
