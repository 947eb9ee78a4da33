#include "tests/support/GoldenText.h"

#include <fstream>
#include <iterator>

namespace tests {

std::string contentOf(const std::filesystem::path& path)
{
    std::ifstream file(path, std::ios::binary);
    return { std::istreambuf_iterator<char>(file), {} };
}

std::string replaced(std::string text, std::string_view from, std::string_view to)
{
    for (std::size_t at = text.find(from); at != std::string::npos; at = text.find(from, at + to.size()))
        text.replace(at, from.size(), to);
    return text;
}

std::string uniformLayout(std::string_view json)
{
    std::string text;
    bool isInString = false;
    for (std::size_t at = 0; at < json.size(); ++at) {
        const char letter = json[at];
        if (!isInString && (letter == ' ' || letter == '\n'))
            continue;
        if (letter == '"')
            isInString = !isInString;
        text.push_back(letter);
        if (isInString && letter == '\\' && at + 1 < json.size())
            text.push_back(json[++at]);
        if (!isInString && letter == ',')
            text.push_back('\n');
    }
    return text;
}

} // namespace tests
