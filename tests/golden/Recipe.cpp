#include "tests/golden/Recipe.h"

#include "platform/PathText.h"
#include "tests/support/MovieWriter.h"
#include "tests/support/TemporaryFolder.h"

#include <algorithm>
#include <cstdlib>
#include <filesystem>

namespace tests {

namespace {

    constexpr platform::Date dateOfEverything { 1'299'146'400, 0 };

    /// Removes what stands before `separator` from `text` and answers it; all of it where there is no separator.
    std::string_view take(std::string_view& text, std::string_view separator)
    {
        const std::size_t end = text.find(separator);
        const std::string_view taken = text.substr(0, end);
        text.remove_prefix(end == std::string_view::npos ? text.size() : end + separator.size());
        return taken;
    }

    std::string withBytes(std::string_view text)
    {
        std::string bytes;
        for (std::size_t at = text.find("\\x"); at != std::string_view::npos; at = text.find("\\x")) {
            bytes += text.substr(0, at);
            bytes.push_back(static_cast<char>(std::strtol(std::string(text.substr(at + 2, 2)).c_str(), nullptr, 16)));
            text.remove_prefix(std::min(text.size(), at + 4));
        }
        return bytes += text;
    }

    std::string movieOfSize(std::string_view size)
    {
        const double width = std::strtod(std::string(take(size, "x")).c_str(), nullptr);
        return movieBytes(width, std::strtod(std::string(size).c_str(), nullptr));
    }

    bool makeItem(std::string_view kind, const std::string& path, std::string_view rest)
    {
        if (kind == "folder")
            makeFolder(path);
        else if (kind == "project")
            writeFile(path + "/CurrentVersion.mtrproject", {});
        else if (kind == "event")
            writeFile(path + "/CurrentVersion.mtrevent", {});
        else if (kind == "movie")
            writeFile(path, movieOfSize(rest));
        else if (kind == "file")
            writeFile(path, withBytes(rest));
        else if (kind == "link")
            makeLink(path, withBytes(rest));
        else
            return false;
        return true;
    }

} // namespace

std::string makeLibrary(std::string_view recipe, const std::string& root)
{
    while (!recipe.empty()) {
        const std::string_view line = take(recipe, "\n");
        std::string_view rest = line;
        const std::string_view kind = take(rest, " ");
        const std::string path = withBytes(take(rest, " | "));
        if (path.empty() || !makeItem(kind, platform::pathJoined(root, path), rest))
            return std::string(line);
    }
    for (const auto& entry : std::filesystem::recursive_directory_iterator(root))
        setModificationDate(entry.path().string(), dateOfEverything);
    return {};
}

} // namespace tests
