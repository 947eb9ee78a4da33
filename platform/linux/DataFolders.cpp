#include "platform/linux/DataFolders.h"

#include "platform/FileSystem.h"
#include "platform/PathText.h"
#include "platform/common/WholeFile.h"

#include <cstdlib>

namespace platform {

namespace {

    std::string_view environmentValue(const char* name, std::string_view whenEmpty)
    {
        const char* value = std::getenv(name);
        return value && *value ? std::string_view(value) : whenEmpty;
    }

    std::vector<std::string> absoluteFolders(std::string_view list)
    {
        std::vector<std::string> folders;
        while (!list.empty()) {
            const std::string_view folder = list.substr(0, list.find(':'));
            list.remove_prefix(std::min(list.size(), folder.size() + 1));
            if (!folder.empty() && folder.front() == '/')
                folders.emplace_back(pathWithoutTrailingSlashes(folder));
        }
        return folders;
    }

    // The folder that `variable` names, else the one called `name` in the home folder; then the system's.
    std::vector<std::string> baseFolders(
        const FileSystem& files, const char* variable, std::string_view name, std::string_view systemFolders)
    {
        std::vector<std::string> folders;
        const std::string_view own = environmentValue(variable, {});
        if (const auto home = files.homeFolder(); !own.empty() && own.front() == '/')
            folders.emplace_back(pathWithoutTrailingSlashes(own));
        else if (home)
            folders.push_back(pathJoined(*home, name));
        for (std::string& folder : absoluteFolders(systemFolders))
            folders.push_back(std::move(folder));
        return folders;
    }

} // namespace

std::vector<std::string> dataFolders(const FileSystem& files)
{
    const std::string_view system = environmentValue("XDG_DATA_DIRS", "/usr/local/share:/usr/share");
    return baseFolders(files, "XDG_DATA_HOME", ".local/share", system);
}

std::vector<std::string> settingsFolders(const FileSystem& files)
{
    return baseFolders(files, "XDG_CONFIG_HOME", ".config", environmentValue("XDG_CONFIG_DIRS", "/etc/xdg"));
}

std::vector<std::string> programFolders()
{
    return absoluteFolders(environmentValue("PATH", "/usr/local/bin:/usr/bin:/bin"));
}

std::optional<std::string> contentOfFile(const FileSystem& files, std::string_view path, std::size_t sizeAtMost)
{
    const OpenResult opened = files.openPlainFile(path);
    if (!opened.file)
        return std::nullopt;
    std::string bytes = readBytes(*opened.file, sizeAtMost + 1);
    if (bytes.size() > sizeAtMost)
        return std::nullopt;
    return bytes;
}

} // namespace platform
