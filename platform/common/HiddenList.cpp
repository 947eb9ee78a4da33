#include "platform/common/HiddenList.h"

#include "platform/common/WholeFile.h"

#include <cstddef>

namespace platform {

namespace {

    constexpr std::size_t longestList = std::size_t { 16 } << 20;

} // namespace

std::unordered_set<std::string> readHiddenNames(const OpenFile& file)
{
    std::unordered_set<std::string> names;
    const std::string bytes = readBytes(file, longestList);
    std::string_view rest = bytes;
    // The line that the limit cuts through names nothing.
    if (bytes.size() == longestList)
        rest = rest.substr(0, rest.rfind('\n') + 1);
    while (!rest.empty()) {
        const std::size_t end = rest.find('\n');
        names.emplace(rest.substr(0, end));
        rest.remove_prefix(end == std::string_view::npos ? rest.size() : end + 1);
    }
    return names;
}

bool isInvisibleName(std::string_view name, const std::unordered_set<std::string>& hiddenNames)
{
    return (!name.empty() && name.front() == '.') || hiddenNames.count(std::string(name)) > 0;
}

} // namespace platform
