#pragma once

#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

namespace tests {

/// A fenced block of a document, and the language that it names.
struct FencedBlock {
    std::string language;
    std::string text;
};

inline std::vector<FencedBlock> fencedBlocks(const std::string& document)
{
    constexpr std::string_view fence = "```";
    std::vector<FencedBlock> blocks;
    for (std::size_t at = document.find(fence); at != std::string::npos; at = document.find(fence, at)) {
        const std::size_t start = document.find('\n', at) + 1;
        const std::size_t end = document.find("\n```\n", start) + 1;
        const std::size_t language = at + fence.size();
        blocks.push_back({ document.substr(language, start - 1 - language), document.substr(start, end - start) });
        at = end + fence.size();
    }
    return blocks;
}

} // namespace tests
