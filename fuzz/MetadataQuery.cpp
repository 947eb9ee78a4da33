#include "host/OBMetadataQuery.h"

#include "fuzz/FuzzTarget.h"

// The first line is the query, the rest a path that it is held against.
int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    const std::string_view input = fuzz::text(data, size);
    const std::size_t end = input.find('\n');
    const OBMetadataQuery::ParseResult result = OBMetadataQuery::parse(input.substr(0, end));
    fuzz::expectOneLine(result.problem);
    fuzz::expect((result.query == nullptr) != result.problem.empty());
    fuzz::expect(result.query || result.problem.starts_with("column "));
    if (!result.query)
        return 0;
    constexpr std::size_t longestPath = 300;
    const std::string_view path = end == std::string_view::npos ? "/a.mov" : input.substr(end + 1, longestPath);
    const bool isMatch = result.query->matchesByPath(path);
    fuzz::expect(result.query->asksOnlyForNamePathOrType() || !isMatch);
    return 0;
}
