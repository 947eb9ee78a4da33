#include "host/OBMetadataQuery.h"

#include "host/FileAttributes.h"
#include "host/QueryExpression.h"
#include "host/QueryGathering.h"
#include "host/QueryParser.h"

#include <utility>

OBMetadataQuery::ParseResult OBMetadataQuery::parse(std::string_view text)
{
    ParsedQuery parsed = parseQuery(text);
    if (!parsed.expression)
        return { nullptr, std::move(parsed.problem) };
    auto expression = std::make_unique<const QueryExpression>(*std::move(parsed.expression));
    return { std::make_shared<const OBMetadataQuery>(std::move(expression)), {} };
}

OBMetadataQuery::OBMetadataQuery(std::unique_ptr<const QueryExpression> expression)
    : _expression(std::move(expression))
    , _asksOnlyPath(_expression->origin() == MetadataOrigin::path)
{
}

OBMetadataQuery::~OBMetadataQuery() = default;

bool OBMetadataQuery::matchesByPath(std::string_view path) const
{
    FileAttributes file(path);
    return _asksOnlyPath && _expression->matches(file);
}

bool OBMetadataQuery::matches(const platform::Platform& platform, std::string_view path) const
{
    const std::optional<platform::ItemStatus> status = platform.fileSystem.linkStatus(path);
    if (!status || status->kind != platform::ItemKind::file)
        return false;
    FileAttributes file(path, platform, status);
    return _expression->matches(file);
}

bool OBMetadataQuery::gather(const platform::Platform& platform, std::string_view scope,
    const std::function<void(std::string_view path)>& take, const std::function<bool()>& isCancelled,
    const OBGatherObserver& observer) const
{
    return QueryGathering(*_expression, platform, scope, { take, isCancelled, observer }).run();
}
