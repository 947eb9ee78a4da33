#include "plugin/SearchFolders.h"

#include "platform/FileSystem.h"
#include "platform/PathText.h"
#include "platform/Volumes.h"

#include <string>

using platform::Text;

namespace {

/// Not searched by display name: the boot volume has its own entry, and network volumes have none.
bool isSkipped(std::string_view volume)
{
    return volume == "/Network" || volume == "/";
}

} // namespace

std::vector<Text> foldersToSearch(
    const platform::Platform& platform, const Text& defaultFolder, std::string_view folderName)
{
    std::vector<Text> folders;
    if (defaultFolder)
        folders.push_back(defaultFolder);
    for (const std::string& volume : platform.volumes.localVolumes()) {
        if (!isSkipped(volume))
            folders.push_back(folderOnVolume(platform.volumes.displayName(volume), folderName));
    }
    folders.push_back(Text::joined("/", folderName));
    for (const std::string& medium : platform.volumes.removableMedia())
        folders.emplace_back(platform::pathJoined(medium, folderName));
    return folders;
}

Text folderOnVolume(std::string_view displayName, std::string_view folderName)
{
    return Text("/Volumes/" + std::string(displayName) + "/" + std::string(folderName));
}

Text folderInMovies(const platform::Platform& platform, std::string_view folderName)
{
    const auto home = platform.fileSystem.homeFolder();
    return home ? Text::joined(*home, "/Movies/", folderName) : Text();
}

std::vector<std::string> stringsOf(const std::vector<Text>& texts)
{
    std::vector<std::string> result;
    result.reserve(texts.size());
    for (const Text& text : texts)
        result.push_back(text.string());
    return result;
}
