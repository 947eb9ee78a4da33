#include "platform/linux/IconTheme.h"

#include "platform/FileSystem.h"
#include "platform/PathText.h"
#include "platform/formats/DesktopFile.h"
#include "platform/linux/DataFolders.h"

#include <algorithm>
#include <array>
#include <charconv>
#include <cstdlib>
#include <limits>
#include <vector>

namespace platform {

namespace {

    constexpr int wantedSize = 16;
    constexpr std::size_t themesAtMost = 32; // that inherit from one another
    constexpr std::array<std::string_view, 3> extensions { "png", "svg", "xpm" };

    bool isFile(const FileSystem& files, const std::string& path)
    {
        const auto status = files.status(path);
        return status && status->kind == ItemKind::file;
    }

    std::optional<std::string> fileInFolder(const FileSystem& files, const std::string& folder, std::string_view name)
    {
        for (const std::string_view extension : extensions) {
            std::string path = pathJoined(folder, name).append(1, '.').append(extension);
            if (isFile(files, path))
                return path;
        }
        return std::nullopt;
    }

    // Entries that name a file of a theme, "montaro.png", mean the icon of that name.
    std::string_view withoutPictureExtension(std::string_view name)
    {
        const std::string_view extension = extensionOfName(name);
        const bool isPicture = std::find(extensions.begin(), extensions.end(), extension) != extensions.end();
        return isPicture ? nameWithoutExtension(name) : name;
    }

    bool isName(std::string_view name)
    {
        return !name.empty() && name != "." && name != ".." && name.find('/') == std::string_view::npos
            && name.find('\0') == std::string_view::npos;
    }

    int numberOf(const DesktopFile& index, const std::string& group, std::string_view key, int otherwise)
    {
        const std::string* text = index.value(group, key);
        if (!text)
            return otherwise;
        int number = 0;
        const auto [end, error] = std::from_chars(text->data(), text->data() + text->size(), number);
        (void)end;
        return error == std::errc() && number >= 0 ? number : otherwise;
    }

    // How far the pictures of one folder of a theme are from the size that is wanted.
    long long distanceOfFolder(const DesktopFile& index, const std::string& folder)
    {
        const long long size = numberOf(index, folder, "Size", 0);
        const long long scale = std::max(1, numberOf(index, folder, "Scale", 1));
        const std::string* type = index.value(folder, "Type");
        long long smallest = size;
        long long largest = size;
        if (type && *type == "Scalable") {
            smallest = numberOf(index, folder, "MinSize", static_cast<int>(size));
            largest = numberOf(index, folder, "MaxSize", static_cast<int>(size));
        } else if (!type || *type != "Fixed") {
            const long long threshold = numberOf(index, folder, "Threshold", 2);
            smallest = size - threshold;
            largest = size + threshold;
        }
        // Made for other densities of pixels: only where nothing else is there.
        const long long density = (scale - 1) * std::numeric_limits<int>::max();
        return density + std::max({ 0LL, smallest * scale - wantedSize, wantedSize - largest * scale });
    }

    class IconSearch {
    public:
        explicit IconSearch(const FileSystem& files)
            : _files(files)
            , _dataFolders(dataFolders(files))
        {
            if (const auto home = files.homeFolder())
                _iconFolders.push_back(pathJoined(*home, ".icons"));
            for (const std::string& folder : _dataFolders)
                _iconFolders.push_back(pathJoined(folder, "icons"));
        }

        std::optional<std::string> find(std::string_view name) const
        {
            std::vector<std::string> themes;
            if (const std::string theme = themeInSettings(); isName(theme))
                themes.push_back(theme);
            for (std::size_t index = 0; index < themes.size(); ++index) {
                const std::string theme = themes[index]; // the list grows meanwhile
                if (auto file = findInTheme(theme, name, &themes))
                    return file;
            }
            if (auto file = findInTheme("hicolor", name, nullptr))
                return file;
            for (const std::string& folder : _dataFolders) {
                if (auto file = fileInFolder(_files, pathJoined(folder, "pixmaps"), name))
                    return file;
            }
            return fileInFolder(_files, "/usr/share/pixmaps", name);
        }

    private:
        struct Setting {
            std::string_view file;
            std::string_view group;
            std::string_view key;
        };

        std::string themeInSettings() const
        {
            constexpr std::array<Setting, 3> settings { { { "gtk-4.0/settings.ini", "Settings", "gtk-icon-theme-name" },
                { "gtk-3.0/settings.ini", "Settings", "gtk-icon-theme-name" }, { "kdeglobals", "Icons", "Theme" } } };
            for (const std::string& folder : settingsFolders(_files)) {
                for (const Setting& setting : settings) {
                    const auto bytes
                        = contentOfFile(_files, pathJoined(folder, setting.file), DesktopFile::largestSize);
                    const auto theme = bytes ? DesktopFile(*bytes).text(setting.group, setting.key) : std::nullopt;
                    if (theme && !theme->empty())
                        return *theme;
                }
            }
            return {};
        }

        std::optional<std::string> findInTheme(
            const std::string& theme, std::string_view name, std::vector<std::string>* themes) const;
        std::optional<std::string> indexOfTheme(const std::string& theme) const
        {
            for (const std::string& folder : _iconFolders) {
                const std::string path = pathJoined(pathJoined(folder, theme), "index.theme");
                if (auto bytes = contentOfFile(_files, path, DesktopFile::largestSize))
                    return bytes;
            }
            return std::nullopt;
        }
        std::vector<std::string> foldersOfTheme(const std::string& theme) const
        {
            std::vector<std::string> folders;
            for (const std::string& iconFolder : _iconFolders) {
                std::string folder = pathJoined(iconFolder, theme);
                if (_files.exists(folder))
                    folders.push_back(std::move(folder));
            }
            return folders;
        }

        const FileSystem& _files;
        std::vector<std::string> _dataFolders;
        std::vector<std::string> _iconFolders {};
    };

    // Adds the themes that `theme` inherits from to `themes`, each once.
    std::optional<std::string> IconSearch::findInTheme(
        const std::string& theme, std::string_view name, std::vector<std::string>* themes) const
    {
        const auto bytes = indexOfTheme(theme);
        if (!bytes)
            return std::nullopt;
        const DesktopFile index(*bytes);
        for (std::string& parent : index.list("Icon Theme", "Inherits", ',')) {
            const bool isNew = themes && isName(parent) && parent != "hicolor" && themes->size() < themesAtMost
                && std::find(themes->begin(), themes->end(), parent) == themes->end();
            if (isNew)
                themes->push_back(std::move(parent));
        }
        std::vector<std::string> parts = index.list("Icon Theme", "Directories", ',');
        std::stable_sort(parts.begin(), parts.end(), [&](const std::string& left, const std::string& right) {
            return distanceOfFolder(index, left) < distanceOfFolder(index, right);
        });
        const std::vector<std::string> folders = foldersOfTheme(theme);
        for (const std::string& part : parts) {
            for (const std::string& folder : folders) {
                if (auto file = fileInFolder(_files, pathJoined(folder, part), name))
                    return file;
            }
        }
        return std::nullopt;
    }

} // namespace

std::optional<std::string> iconFile(const FileSystem& files, std::string_view name)
{
    if (!name.empty() && name.front() == '/') {
        std::string path(name);
        return isFile(files, path) ? std::optional(path) : std::nullopt;
    }
    name = withoutPictureExtension(name);
    return isName(name) ? IconSearch(files).find(name) : std::nullopt;
}

} // namespace platform
