#include "tests/house/SourceTree.h"

#include <algorithm>
#include <filesystem>
#include <fstream>
#include <iterator>

namespace house {

namespace {

    namespace files = std::filesystem;

    // Where the repository is, in a check-out that shares that of another.
    constexpr std::string_view repositoryFile = ".git";

    // What is built, and hidden folders that tools leave in a check-out.
    bool isLeftOut(std::string_view path)
    {
        return path == "build" || (path.starts_with('.') && path != ".ci");
    }

    std::string contentOf(const files::path& file)
    {
        std::ifstream stream(file, std::ios::binary);
        return { std::istreambuf_iterator<char>(stream), std::istreambuf_iterator<char>() };
    }

} // namespace

std::vector<SourceFile> sourceFiles()
{
    const files::path root = OMBRIX_SOURCE_FOLDER;
    std::vector<SourceFile> found;
    for (auto item = files::recursive_directory_iterator(root); item != files::recursive_directory_iterator(); ++item) {
        const std::string path = item->path().lexically_relative(root).string();
        const bool isFolder = item->is_directory() && !item->is_symlink();
        if (isFolder && isLeftOut(path)) {
            item.disable_recursion_pending();
            continue;
        }
        if (isFolder || !item->is_regular_file() || path == repositoryFile)
            continue;
        std::string text = contentOf(item->path());
        if (text.find('\0') == std::string::npos)
            found.push_back({ path, std::move(text) });
    }
    std::sort(found.begin(), found.end(),
        [](const SourceFile& left, const SourceFile& right) { return left.path < right.path; });
    return found;
}

bool isCode(std::string_view path)
{
    return path.ends_with(".h") || path.ends_with(".cpp");
}

std::size_t lineNumberAt(std::string_view text, std::size_t offset)
{
    return 1
        + static_cast<std::size_t>(std::count(text.begin(), text.begin() + static_cast<std::ptrdiff_t>(offset), '\n'));
}

std::string joined(const std::vector<std::string>& lines)
{
    std::string text;
    for (const std::string& line : lines)
        text += "\n" + line;
    return text;
}

} // namespace house
